#include "slideshow/container_backup.h"

#include <algorithm>

#include "slideshow/container_format.h"
#include "slideshow/container_session.h"
#include "slideshow/subfile_table.h"

namespace pelo::slideshow {

bool ContainerBackup::take(SlideShow& show, int64_t overwritten) {
  ContainerSession session(show, "rb");
  length_ = session.seek_end();
  const int64_t end = data_end(show);
  if (!session.good() || length_ < end) return false;
  header_ = vss_bytes(kHeaderSize);
  if (!header_) return false;
  session.seek(show.musicSize);
  session.read(header_.get(), kHeaderSize);
  tailSize_ = std::min(length_ - end, overwritten);
  if (tailSize_ > 0) {
    tail_ = vss_bytes(tailSize_);
    if (!tail_) return false;
    session.seek(end);
    session.read(tail_.get(), tailSize_);
  }
  return session.close();
}

void ContainerBackup::restore(SlideShow& show) const {
  ContainerSession session(show, "r+b");
  session.seek(show.musicSize);
  session.write(header_.get(), kHeaderSize);
  if (tailSize_ > 0) {
    session.seek(data_end(show));
    session.write(tail_.get(), tailSize_);
  }
  if (session.close()) (void)truncate_file(show.pathName, length_);
}

}  // namespace pelo::slideshow

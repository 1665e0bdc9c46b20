#include "slideshow/container_undo.h"

#include <algorithm>

#include "slideshow/container_format.h"
#include "slideshow/container_session.h"
#include "slideshow/subfile_table.h"

namespace pelo::slideshow {

void ContainerUndo::add(int64_t offset, int64_t size) {
  if (size < 1) return;
  pieces_[pieceCount_++] = {offset, size};
  byteCount_ += size;
}

bool ContainerUndo::remember(ContainerSession& session, const SlideShow& show, bool withSubfileHeaders,
                             int64_t tail) {
  length_ = session.seek_end();
  if (length_ < data_end(show)) return false;  // cut short by someone else
  add(show.musicSize, kHeaderSize);
  for (int i = 0; withSubfileHeaders && i < show.subfileCount; ++i) {
    add(show.subfiles[i].offset, kSubfileHeaderSize);
  }
  add(data_end(show), std::min(length_ - data_end(show), tail));

  bytes_ = vss_bytes(byteCount_);
  if (bytes_ == nullptr) return false;
  uint8_t* destination = bytes_.get();
  for (int i = 0; i < pieceCount_; ++i) {
    session.seek(pieces_[i].offset);
    session.read(destination, pieces_[i].size);
    destination += pieces_[i].size;
  }
  return session.good();
}

// The stream is closed before the file is cut: what it may still hold must not lengthen the file again.
void ContainerUndo::put_back(ContainerSession& session, const SlideShow& show) const {
  const uint8_t* source = bytes_.get();
  for (int i = 0; i < pieceCount_; ++i) {
    (void)persist(session, [&] {
      session.seek(pieces_[i].offset);
      session.write(source, pieces_[i].size);
      return session.flush();
    });
    source += pieces_[i].size;
  }
  (void)session.close();
  (void)persist([&] { return truncate_file(show.pathName, length_); });
}

}  // namespace pelo::slideshow

#include "slideshow/container_edit.h"

#include "slideshow/container_format.h"

namespace pelo::slideshow {

// A close that fails does not say which write was lost, so all of the headers are written again. The
// data need no second time: each piece was flushed when it was moved.
bool ContainerEdit::finish(int64_t end) {
  const bool written = persist(session_, [&] {
    return write_header(session_, show_) && write_subfile_headers(session_, show_) &&
           session_.seek(end) && write_end_mark(session_, show_.musicSize) && session_.close();
  });
  return written && persist([&] { return truncate_file(show_.pathName, end + kEndMarkSize); });
}

// The data first: their moves have overwritten each other, the headers' copies do not care.
void ContainerEdit::roll_back() {
  shift_.back(session_);
  undo_.put_back(session_, show_);
}

}  // namespace pelo::slideshow

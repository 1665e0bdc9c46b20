#include "slideshow/edit_end.h"

#include "slideshow/container_format.h"
#include "slideshow/container_session.h"
#include "slideshow/persist.h"
#include "slideshow/vss_wrappers.h"

namespace pelo::slideshow {
namespace {

bool write_end_mark_at(SlideShow& show, int64_t end) {
  ContainerSession session(show, "r+b");
  session.seek(end);
  write_end_mark(session, show.musicSize);
  return session.close();
}

}  // namespace

bool finish_file(SlideShow& show, int64_t end) {
  return persist([&] { return show.writeVssHeader("r+b") == 1; }) &&
         persist([&] { return show.writeSubfileHeader() == 1; }) &&
         persist([&] { return write_end_mark_at(show, end); }) &&
         persist([&] { return truncate_file(show.pathName, end + kEndMarkSize); });
}

}  // namespace pelo::slideshow

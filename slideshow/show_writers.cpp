// The writers of a container's parts; each opens the file, writes in place and closes it.
#include "slideshow/SlideShow.h"
#include "slideshow/container_format.h"
#include "slideshow/container_session.h"
#include "slideshow/subfile_table.h"

using namespace pelo::slideshow;

int SlideShow::writeVssHeader(const char* openMode) {
  ContainerSession session(*this, openMode);
  // A stream opened for appending writes at the file's end whatever the seek says: only an empty file
  // will do.
  if (session.good() && openMode[0] == 'a' && session.seek_end() != 0) session.fail();
  write_header(session, *this);
  return session.close() ? 1 : 0;
}

int SlideShow::writeSubfileHeader() {
  ContainerSession session(*this, "r+b");
  write_subfile_headers(session, *this);
  return session.close() ? 1 : 0;
}

int SlideShow::writeSubfile(int index, const void* data) {
  if (!valid_index(*this, index) || data == nullptr) return 0;
  const subfileInfo& entry = subfiles[index];
  if (entry.size <= kSubfileHeaderSize) return 0;
  ContainerSession session(*this, "r+b");
  write_subfile(session, entry, data);
  return session.close() ? 1 : 0;
}

int SlideShow::writeEndMark() {
  ContainerSession session(*this, "r+b");
  session.seek_end();
  write_end_mark(session, musicSize);
  return session.close() ? 1 : 0;
}

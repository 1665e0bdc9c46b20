// A show's container as a whole: opening it, where every number is checked against the file before
// anything relies on it, and the writers of its parts, of which each opens the file, writes in place and
// closes it.
#include <algorithm>
#include <cstdint>

#include "slideshow/SlideShow.h"
#include "slideshow/container_format.h"
#include "slideshow/container_session.h"
#include "slideshow/subfile_table.h"

using namespace pelo::slideshow;

namespace {

constexpr int kLoaded = 2;  // subfileInfo.state of a picture read from a file

// Walks the picture headers, each behind the data of its predecessor. The offsets recorded in the file
// are not trusted: the walked ones take their place.
bool read_subfiles(ContainerSession& session, SlideShow& show, int64_t end) {
  int64_t offset = int64_t{show.musicSize} + kHeaderSize;
  for (int i = 0; i < show.subfileCount; ++i) {
    subfileInfo& entry = show.subfiles[i];
    read_subfile_header(session, entry);
    if (!session.good() || entry.size < kSubfileHeaderSize || offset + entry.size > end) return false;
    if (!session.skip(entry.size - kSubfileHeaderSize)) return false;
    entry.state = kLoaded;
    entry.offset = show.subfileOffsets[i] = static_cast<int>(offset);
    offset += entry.size;
  }
  std::fill(show.subfileOffsets + show.subfileCount, std::end(show.subfileOffsets), 0);
  return true;
}

}  // namespace

int SlideShow::OpenShow(const char* path, int showWidth, int showHeight) {
  const bool usable = showWidth > 0 && showHeight > 0 && usable_path(path);
  char ownPath[kTextSize] = {};  // `path` may lie in this object
  if (usable) set_text(ownPath, path);
  reset();
  if (!usable) return kGeneralFailure;

  set_text(pathName, ownPath);
  width = showWidth;
  height = showHeight;
  mode = kFileMode;
  const int result = allocateEntries(kMaxFileSubfiles) ? readContainer() : kGeneralFailure;
  if (result != 1) reset();
  return result;
}

int SlideShow::readContainer() {
  ContainerSession session(*this, "r+b");
  const int64_t end = session.seek_end() - kEndMarkSize;  // of the data
  session.seek(end);
  const EndMark mark = read_end_mark(session);
  if (!session.good()) return kGeneralFailure;
  if (!mark.magic) return kNotContainer;
  if (mark.version != kVersion) return kWrongVersion;
  if (mark.musicSize < 0 || int64_t{mark.musicSize} + kHeaderSize > end) return kGeneralFailure;

  // The header's own path takes the place of the one given: the session has its stream already.
  session.seek(mark.musicSize);
  read_header(session, *this);
  const bool sound = session.good() && musicSize == mark.musicSize && subfileCount >= 0 &&
                     subfileCount <= kMaxFileSubfiles && read_subfiles(session, *this, end);
  return session.close() && sound ? 1 : kGeneralFailure;
}

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

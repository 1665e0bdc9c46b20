// The records of a container file: what each field is and where it stands (docs/container.md).
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

#include "slideshow/SlideShow.h"
#include "slideshow/container_session.h"
#include "slideshow/vss_wrappers.h"

namespace pelo::slideshow {

constexpr int kHeaderSize = 628;         // bytes; at offset musicSize
constexpr int kSubfileHeaderSize = 540;  // bytes in front of each picture's JPEG data
constexpr int kEndMarkSize = 12;         // bytes; the last ones of the file
constexpr int32_t kVersion = 10000;

struct EndMark {
  bool magic;  // the four bytes "vssf" are there
  int version;
  int musicSize;  // bytes: the header's offset
};

// Each reads one record at the session's position, field by field in file order; 32-bit numbers are
// little-endian, text fields are terminated. Whether it worked is the session's good(); values are as
// found and still to be checked.
void read_header(ContainerSession& session, SlideShow& show);
void read_subfile_header(ContainerSession& session, subfileInfo& entry);
EndMark read_end_mark(ContainerSession& session);

// Each writes one part of the container at the place that the show gives it, and answers the session's
// good(): the bytes may still wait in the stream.
bool write_header(ContainerSession& session, const SlideShow& show);
bool write_subfile_headers(ContainerSession& session, const SlideShow& show);
bool write_subfile(ContainerSession& session, const subfileInfo& entry, const void* jpeg);

// At the session's position: an end mark stands wherever the file ends.
bool write_end_mark(ContainerSession& session, int musicSize);

// ---- text fields: at most 255 bytes of text, always terminated ----

constexpr size_t kTextSize = 256;  // bytes of a field, terminator included

// Length of the text in a field, or of a caller's string as far as it matters: kTextSize means too long.
inline size_t text_length(const char* text) {
  return strnlen(text, kTextSize);
}

// A path that a field can hold: not null, 1 to 255 bytes.
inline bool usable_path(const char* path) {
  if (path == nullptr) return false;
  const size_t length = text_length(path);
  return length > 0 && length < kTextSize;
}

// Stores the text, cut at 255 bytes, and zeroes the rest so that no older text reaches a file. `text`
// may lie in the field itself.
inline void set_text(char (&field)[kTextSize], const char* text) {
  const size_t whole = text_length(text);
  const size_t length = whole < kTextSize ? whole : kTextSize - 1;
  std::memmove(field, text, length);
  vss_memset(field + length, 0, kTextSize - length);
}

// Copies the field's text and a terminator; returns the length without it.
inline int copy_text(char* destination, const char (&field)[kTextSize]) {
  const size_t whole = text_length(field);
  const size_t length = whole < kTextSize ? whole : kTextSize - 1;
  vss_memcpy(destination, field, length);
  destination[length] = '\0';
  return static_cast<int>(length);
}

}  // namespace pelo::slideshow

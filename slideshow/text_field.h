// The 256-byte text fields of shows and containers: at most 255 bytes of text, always terminated.
#pragma once

#include <cstddef>
#include <cstring>

#include "slideshow/vss_wrappers.h"

namespace pelo::slideshow {

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

// Writing EXIF: a small little-endian TIFF structure, and the APP1 segment around it.
#pragma once

#include <cstdint>

#include "tavirpelo/api.h"
#include "tavirpelo/decinfo.h"
#include "tavirpelo/encode.h"

// What is written. Absent strings leave entries of no length.
typedef struct ELO_EXIFCONTENT {
  const char* make;  // terminated strings, or null
  const char* model;
  uint32_t orientation;  // the low 16 bits
  const char* dateTime;
  uint32_t thumbnailLength;  // bytes
  const uint8_t* thumbnail;  // a JPEG; null: none
} ELO_EXIFCONTENT;

namespace pelo::jpeg {

// Store 4 or 2 bytes, least significant first.
void write_le32(uint8_t* dst, uint32_t value);
void write_le16(uint8_t* dst, uint32_t value);
// Copies a text with its terminator; returns the bytes written.
uint32_t write_text(uint8_t* dst, const char* text);

// Each writes the twelve bytes of an entry and returns where the next one goes. Values that the entry
// has no room for go to base + *position, which advances. Nothing is checked: the caller provides the
// space.
uint8_t* write_short_tag(uint8_t* entry, uint16_t tag, uint32_t value);
uint8_t* write_long_tag(uint8_t* entry, uint16_t tag, uint32_t value);
uint8_t* write_rational_tag(uint8_t* entry, uint8_t* base, uint32_t* position, uint16_t tag,
                            uint32_t numerator, uint32_t denominator);
// The text goes to the value area even when it is short, although TIFF has values of up to four bytes in
// the entry: readers understand texts from four characters on. A null text: count 0, offset 0.
uint8_t* write_ascii_tag(uint8_t* entry, uint8_t* base, uint32_t* position, uint16_t tag,
                         const char* text);

// Writes IFD0, and IFD1 for a thumbnail, into `tiff`, which has room for them; returns the bytes
// written. 0, and nothing written, for more than the 65,527 that a segment carries.
uint32_t create_exif(uint8_t* tiff, const ELO_EXIFCONTENT* content);

}  // namespace pelo::jpeg

// Bytes of the segment that make_app1 writes.
enum { PELO_APP1_SIZE = 136 };

namespace pelo::jpeg {

// Writes an APP1 segment that carries the orientation of the source's EXIF to app1->data, which holds at
// least PELO_APP1_SIZE writable bytes, and its length to app1->length. 1, or 0 when the source has no
// readable EXIF. The source is left anywhere.
int make_app1(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_APP1* app1);

// Writes a complete APP1 segment; returns its bytes, 0 when they exceed `capacity` or a segment's
// 65,535.
uint32_t write_exif_segment(uint8_t* segment, const ELO_EXIFCONTENT& content, uint32_t capacity);

}  // namespace pelo::jpeg

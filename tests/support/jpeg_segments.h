// Marker segments and the structures inside them, for tests that build JPEG headers by hand.
#pragma once

#include "tests/support/jpeg_samples.h"

namespace tests {

inline Bytes segment(uint8_t code, const Bytes& payload) {
  return ByteWriter().u8(0xFF).u8(code).u16(static_cast<uint32_t>(payload.size() + 2)).block(payload);
}

// Where the segment of a marker starts, from `from` on; the stream's size when there is none before the
// scan.
inline size_t find_marker(const Bytes& jpeg, int marker, size_t from = 2) {
  for (size_t at = from; at + 4 <= jpeg.size() && jpeg[at] == 0xFF;
       at += 2u + (size_t{jpeg[at + 2]} << 8 | jpeg[at + 3])) {
    if (jpeg[at + 1] == marker) return at;
    if (jpeg[at + 1] == 0xDA) break;
  }
  return jpeg.size();
}

// A grey frame of any size, precision 8.
inline Bytes frame(uint32_t width, uint32_t height, uint8_t code = 0xC0) {
  return segment(code, ByteWriter().u8(8).u16(height).u16(width).u8(1).u8(1).u8(0x11).u8(0));
}

// SOI, the segments, the head of a scan and some data: enough for every header scan.
inline Bytes header_of(std::initializer_list<Bytes> segments) {
  ByteWriter jpeg;
  jpeg.u16(0xFFD8);
  for (const Bytes& s : segments) jpeg.block(s);
  return jpeg.block(segment(0xDA, {1, 1, 0, 0, 63, 0})).block(Bytes(16, 0x55)).u16(0xFFD9);
}

}  // namespace tests

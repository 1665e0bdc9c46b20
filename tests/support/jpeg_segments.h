// Marker segments and the structures inside them, for tests that build JPEG headers by hand.
#pragma once

#include <cstdint>
#include <initializer_list>
#include <string_view>

#include "tests/support/jpeg_samples.h"

namespace tests {

// Appends integers in either byte order, text, and other blocks.
class ByteWriter {
 public:
  explicit ByteWriter(bool big = true) : big_(big) {}
  ByteWriter& u8(uint32_t v) { return put(v, 1); }
  ByteWriter& u16(uint32_t v) { return put(v, 2); }
  ByteWriter& u32(uint32_t v) { return put(v, 4); }
  ByteWriter& text(std::string_view t) {
    for (const char c : t) bytes_.push_back(static_cast<uint8_t>(c));
    return *this;
  }
  ByteWriter& block(const Bytes& b) {
    for (const uint8_t byte : b) bytes_.push_back(byte);
    return *this;
  }
  size_t size() const { return bytes_.size(); }
  operator Bytes() const { return bytes_; }

 private:
  ByteWriter& put(uint32_t v, int count) {
    for (int i = 0; i < count; ++i) {
      const int place = big_ ? count - 1 - i : i;
      bytes_.push_back(static_cast<uint8_t>(v >> 8 * place));
    }
    return *this;
  }

  bool big_;
  Bytes bytes_;
};

inline Bytes segment(uint8_t code, const Bytes& payload) {
  return ByteWriter().u8(0xFF).u8(code).u16(static_cast<uint32_t>(payload.size() + 2)).block(payload);
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

struct TiffEntry {
  uint16_t tag;
  uint16_t type;
  uint32_t value;
};

// An EXIF payload: IFD0 with one entry, IFD1 with the given ones, then `data`. Data starts at offset
// 32 + 12 x entries from the TIFF header.
inline Bytes exif_payload(bool big, std::initializer_list<TiffEntry> entries, const Bytes& data = {}) {
  ByteWriter w(big);
  w.text(big ? "MM" : "II").u16(42).u32(8);
  w.u16(1).u16(0x0112).u16(3).u32(1).u16(1).u16(0).u32(26);
  w.u16(static_cast<uint32_t>(entries.size()));
  for (const TiffEntry& e : entries) {
    w.u16(e.tag).u16(e.type).u32(1);
    if (e.type == 3) {
      w.u16(e.value).u16(0);
    } else {
      w.u32(e.value);
    }
  }
  w.u32(0).block(data);
  return ByteWriter().text({"Exif\0\0", 6}).block(w);
}

}  // namespace tests

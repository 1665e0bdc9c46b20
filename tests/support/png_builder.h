// PNG files built piece by piece: chunks, DEFLATE blocks, filters and passes, each under the test's
// control.
#pragma once

#include <functional>
#include <string>

#include "tests/support/pixels.h"

namespace tests {

// An image as its packed samples, row after row.
struct PngImage {
  uint32_t width = 1, height = 1;
  uint8_t depth = 8, type = 2;
  bool interlaced = false;
  Bytes palette;  // R, G, B
  bool hasTrns = false;
  Bytes trns;                     // the chunk's data
  std::vector<uint16_t> samples;  // one a channel, of `depth` bits

  int channels() const;
  uint16_t sample(uint32_t x, uint32_t y, int channel) const;
  // The pixel as four bytes, by the rules of this codec.
  Rgba rgba(int x, int y) const;
};

// Random samples; indices stay within a palette of 2^depth entries (at most 200), which is made too.
PngImage random_png_image(uint32_t seed, uint8_t type, uint8_t depth, uint32_t width, uint32_t height,
                          bool interlaced, bool trns);

// The scanlines with their filters; filter(row) chooses the type of the row-th scanline.
Bytes png_scanlines(const PngImage& image, const std::function<int(size_t)>& filter);

Bytes png_chunk(const std::string& type, const Bytes& data);
Bytes png_header(const PngImage& image);  // signature and IHDR

// The chunks of a file, as they stand behind the signature.
struct PngChunk {
  std::string type;
  Bytes data;
};
std::vector<PngChunk> png_chunks(const Bytes& file);
Bytes join_png(const std::vector<PngChunk>& chunks);

// The file, its compressed data in IDAT chunks of at most idatSize bytes.
Bytes build_png(const PngImage& image, const Bytes& zlib, size_t idatSize = SIZE_MAX);
Bytes build_png(const PngImage& image);  // every filter in turn, fixed codes

// ---- DEFLATE ----

class DeflateWriter {
 public:
  void bits(uint32_t value, int count);  // lowest bit first
  void code(uint32_t code, int length);  // a prefix code: highest bit first
  void align();
  void byte(uint8_t value) { bits(value, 8); }

  void zlib_header() { byte(0x78), byte(0x01); }
  void block(bool last, int type) { bits(last, 1), bits(static_cast<uint32_t>(type), 2); }
  void stored(bool last, const Bytes& data);  // at most 65535 bytes
  void fixed_symbol(uint32_t symbol);
  void fixed_match(uint32_t length, uint32_t distance);
  Bytes take() { return align(), std::move(bytes_); }

 private:
  Bytes bytes_;
  uint32_t pending_ = 0;
  int count_ = 0;
};

// A zlib stream: stored blocks, or fixed codes with matches of what stands up to 1024 bytes before.
Bytes zlib_stored(const Bytes& data, size_t blockSize = 65535);
Bytes zlib_fixed(const Bytes& data, size_t blockSize = SIZE_MAX);

}  // namespace tests

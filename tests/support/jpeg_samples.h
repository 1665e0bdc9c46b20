// JPEG pictures for tests: made by the library's own encoder, or by libjpeg where a test needs what that
// one never writes.
#pragma once

#include "tavirpelo/tavirpelo.h"
#include "tests/support/bytes.h"

namespace tests {

// R, G, B rows of a picture with gradients, edges and some noise.
Bytes sample_pixels(int width, int height);

inline TAVIRPELO_RAWINFO raw_image(const Bytes& pixels, int width, int height, uint32_t format) {
  return {static_cast<uint32_t>(width), static_cast<uint32_t>(height),
          const_cast<uint8_t*>(pixels.data()), format};
}

// Pixels through the library's encoder into a buffer of that capacity at first; empty when it fails,
// which must leave no buffer.
Bytes encode_pixels(const Bytes& pixels, int width, int height, uint32_t format,
                    const TAVIRPELO_ENCOPTION& options, int capacity = 1024);

// The sample picture from the library's encoder: 4:2:0 or grey.
Bytes encode_own(int width, int height, int quality, bool grey = false);

// The same picture from whichever encoder the build has.
Bytes sample_jpeg(int width, int height, bool grey = false);

#ifdef TAVIR_HAVE_LIBJPEG
// How a sequential picture's components come.
enum class JpegScans { kInterleaved, kSeparate, kLumaThenChroma, kChromaFirst };

struct JpegStyle {
  int quality = 90;
  int components = 3;       // 1: grey
  int h = 2, v = 2;         // luma sampling factors; chroma 1 x 1
  int restartInterval = 0;  // MCUs
  bool rgb = false;         // colour space RGB instead of YCbCr
  JpegScans scans = JpegScans::kInterleaved;
  bool optimise = false;
  bool progressive = false;
};
Bytes encode_libjpeg(int width, int height, const JpegStyle& style);

// What libjpeg makes of a JPEG at numerator/8, R G B or grey rows.
struct Decoded {
  int width, height, components;
  Bytes pixels;
};
Decoded decode_libjpeg(const Bytes& jpeg, int numerator);

// The picture's quantised coefficients (natural order) and layout.
struct Plane {
  int h, v, blocksWide, blocksHigh;
  std::vector<uint16_t> quant;  // natural order
  std::vector<int16_t> coefficients;
};
std::vector<Plane> read_coefficients(const Bytes& jpeg);
#endif

// Peak signal-to-noise ratio of two equally long byte rows, in dB.
double psnr(const Bytes& a, const Bytes& b);

}  // namespace tests

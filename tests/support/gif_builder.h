// GIF files for tests, written without the library: any structure the format has, and its mistakes.
#pragma once

#include <optional>
#include <string>
#include <utility>

#include "tests/support/bytes.h"
#include "tests/support/pixels.h"

namespace tests {

// How an image's indices are coded.
struct LzwStyle {
  int minimumCodeSize = 8;  // bits
  bool deferClear = false;  // a full table stays; otherwise a clear code follows it
  int clearEvery = 0;       // a clear code after so many codes; 0: none
  bool endCode = true;
  int blockBytes = 255;  // of a data sub-block
};

struct GifControl {
  int disposal = 0;
  int delay = 0;         // hundredths of a second
  int transparent = -1;  // index; -1: none
};

struct GifImage {
  int left = 0, top = 0, width = 0, height = 0;
  Bytes indices = {};  // rows from top to bottom
  Bytes palette = {};  // R, G, B triples, a power of two of them; empty: the global one counts
  bool interlaced = false;
  std::optional<GifControl> control = {};
  LzwStyle lzw = {};
  std::optional<Bytes> data = {};  // what follows the descriptor, instead of the coded indices
};

struct GifFile {
  int width = 0, height = 0;
  Bytes palette = {};
  std::vector<GifImage> images = {};
  int background = 0;
  std::string version = "89a";
  bool loops = false;  // with the extension that repeats an animation, and a comment

  Bytes bytes() const;
  // A pixel of the screen by the first image; zeros where that is transparent.
  Rgba pixel(int x, int y) const;
};

// Codes and their widths, packed least significant bit first.
using GifCodes = std::vector<std::pair<int, int>>;
Bytes pack_codes(const GifCodes& codes);

// Data in sub-blocks behind their minimum code size, with the empty one.
Bytes image_data(int minimumCodeSize, const Bytes& packed, int blockBytes = 255);

// Indices below `colours`: runs, repeats and noise.
Bytes sample_indices(int width, int height, int colours, uint32_t seed = 1);

// `colours` R, G, B triples, all different in R.
Bytes sample_palette(int colours, uint32_t seed = 1);

// A file of one image that fills the screen, with a palette of 2^bits colours.
GifFile sample_gif(int width, int height, int bits = 8, bool interlaced = false);

// 23 x 19 pixels with something of everything: two images, extensions, a local palette, interlace,
// transparency.
GifFile animated_gif(bool interlaced = false);

}  // namespace tests

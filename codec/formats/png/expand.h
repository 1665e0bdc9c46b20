// Scanlines of every colour type and depth into R, G, B, A bytes.
#pragma once

#include <array>
#include <cstdint>

#include "codec/formats/png/png_info.h"

namespace pelo::png {

// What an image's samples mean.
struct SampleMeaning {
  std::array<std::array<uint8_t, 4>, 256> colours;  // of palette indices and grey samples
  std::array<uint16_t, 3> key;                      // truecolour: the transparent colour, or none
};

// Expands `count` pixels of a row: pixel begin + i, or with a column map pixel columns[begin + i].
using ExpandRow = void (*)(const SampleMeaning& meaning, const uint8_t* row, const uint32_t* columns,
                           uint32_t begin, int count, uint8_t* rgba);

struct Expander {
  ExpandRow consecutive;
  ExpandRow mapped;
};

SampleMeaning meaning_of(const PELOI_PNGINFO& info);
Expander expander_of(const PELOI_PNGINFO& info);

// True when some pixel may have an alpha below 255.
bool has_transparency(const PELOI_PNGINFO& info);

}  // namespace pelo::png

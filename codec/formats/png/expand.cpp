// Scanlines of every colour type and depth into R, G, B, A bytes.
#include <cstring>

#include "codec/formats/png/png_context.h"
#include "codec/pixel/packed_samples.h"

namespace pelo::png {
namespace {

// Sample sources. Each stores pixel x of a row as four bytes. Of 16-bit samples the high byte counts.

// Palette indices and grey samples, looked up.
template <int Depth>
struct Indexed {
  static void pixel(const SampleMeaning& meaning, const uint8_t* row, size_t x, uint8_t* rgba) {
    std::memcpy(rgba, meaning.colours[packed_sample<Depth>(row, x)].data(), 4);
  }
};

template <int Bytes>
struct Truecolour {
  static void pixel(const SampleMeaning&, const uint8_t* row, size_t x, uint8_t* rgba) {
    const uint8_t* p = row + x * 3 * Bytes;
    rgba[0] = p[0];
    rgba[1] = p[Bytes];
    rgba[2] = p[2 * Bytes];
    rgba[3] = 255;
  }
};

template <int Bytes>
struct KeyedTruecolour {
  static void pixel(const SampleMeaning& meaning, const uint8_t* row, size_t x, uint8_t* rgba) {
    Truecolour<Bytes>::pixel(meaning, row, x, rgba);
    const auto& key = meaning.key;
    const bool transparent =
        (rgba[0] ^ key[0]) == 0 && (rgba[1] ^ key[1]) == 0 && (rgba[2] ^ key[2]) == 0;
    rgba[3] = transparent ? 0 : 255;
  }
};

template <int Bytes>
struct GreyWithAlpha {
  static void pixel(const SampleMeaning&, const uint8_t* row, size_t x, uint8_t* rgba) {
    const uint8_t* p = row + x * 2 * Bytes;
    rgba[0] = rgba[1] = rgba[2] = p[0];
    rgba[3] = p[Bytes];
  }
};

template <int Bytes>
struct TruecolourWithAlpha {
  static void pixel(const SampleMeaning&, const uint8_t* row, size_t x, uint8_t* rgba) {
    const uint8_t* p = row + x * 4 * Bytes;
    for (int c = 0; c < 4; ++c) rgba[c] = p[c * Bytes];
  }
};

template <class Source>
void expand_consecutive(const SampleMeaning& meaning, const uint8_t* __restrict row, const uint32_t*,
                        uint32_t begin, int count, uint8_t* __restrict rgba) {
  for (int i = 0; i < count; ++i)
    Source::pixel(meaning, row, begin + static_cast<size_t>(i), rgba + 4 * i);
}

template <class Source>
void expand_mapped(const SampleMeaning& meaning, const uint8_t* __restrict row,
                   const uint32_t* __restrict columns, uint32_t begin, int count,
                   uint8_t* __restrict rgba) {
  for (int i = 0; i < count; ++i)
    Source::pixel(meaning, row, columns[begin + static_cast<uint32_t>(i)], rgba + 4 * i);
}

template <class Source>
constexpr Expander kExpander{expand_consecutive<Source>, expand_mapped<Source>};

template <template <int> class Source>
Expander by_sample_bytes(const PELOI_PNGINFO& info) {
  return info.bitDepth == 16 ? kExpander<Source<2>> : kExpander<Source<1>>;
}

Expander indexed(const PELOI_PNGINFO& info) {
  switch (info.bitDepth) {
    case 1:
      return kExpander<Indexed<1>>;
    case 2:
      return kExpander<Indexed<2>>;
    case 4:
      return kExpander<Indexed<4>>;
    case 16:
      return kExpander<Indexed<16>>;
    default:
      return kExpander<Indexed<8>>;
  }
}

bool keyed(const PELOI_PNGINFO& info) {
  return (info.ancillaryFlags & kTrnsRead) != 0;
}

// Grey samples of few bits are widened by ones, except single bits, which are black or white.
uint8_t widen_grey(size_t value, uint8_t depth) {
  switch (depth) {
    case 1:
      return value != 0 ? 255 : 0;
    case 2:
      return static_cast<uint8_t>(value << 6 | 0x3F);
    case 4:
      return static_cast<uint8_t>(value << 4 | 0x0F);
    default:
      return static_cast<uint8_t>(value);
  }
}

std::array<uint8_t, 4> grey_colour(const PELOI_PNGINFO& info, size_t value) {
  const uint8_t grey = widen_grey(value, info.bitDepth);
  const bool transparent = keyed(info) && grey == info.colourKey[0];
  return {grey, grey, grey, static_cast<uint8_t>(transparent ? 0 : 255)};
}

std::array<uint8_t, 4> palette_colour(const PELOI_PNGINFO& info, size_t index) {
  const uint8_t* rgb = info.palette.data() + 3 * index;
  const auto alpha = static_cast<uint8_t>(keyed(info) ? info.paletteAlpha[index] : 255);
  return {rgb[0], rgb[1], rgb[2], alpha};
}

}  // namespace

SampleMeaning meaning_of(const PELOI_PNGINFO& info) {
  SampleMeaning meaning;
  for (size_t i = 0; i < 256; ++i) {
    meaning.colours[i] = info.colourType == kPalette ? palette_colour(info, i) : grey_colour(info, i);
  }
  meaning.key = info.colourKey;
  return meaning;
}

Expander expander_of(const PELOI_PNGINFO& info) {
  switch (info.colourType) {
    case kTruecolour:
      return keyed(info) ? by_sample_bytes<KeyedTruecolour>(info) : by_sample_bytes<Truecolour>(info);
    case kGreyAlpha:
      return by_sample_bytes<GreyWithAlpha>(info);
    case kTruecolourAlpha:
      return by_sample_bytes<TruecolourWithAlpha>(info);
    default:
      return indexed(info);
  }
}

bool has_transparency(const PELOI_PNGINFO& info) {
  return info.hasAlpha != 0 || keyed(info);
}

}  // namespace pelo::png

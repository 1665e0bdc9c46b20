// Undoing the filters of scanlines.
#include <algorithm>
#include <cstdlib>

#include "codec/formats/png/png_context.h"

namespace pelo::png {
namespace {

// The neighbour nearest to left + above - corner, in this order where two are equally near. The
// distances are taken without the sum: |p - left| = |above - corner| and so on.
inline int paeth(int left, int above, int corner) {
  const int toLeft = above - corner;
  const int toAbove = left - corner;
  const int pa = std::abs(toLeft);
  const int pb = std::abs(toAbove);
  const int pc = std::abs(toLeft + toAbove);
  const int other = pb <= pc ? above : corner;
  return pa <= pb && pa <= pc ? left : other;
}

// The channels of a pixel are chains of their own, side by side, that live in registers.
template <size_t Bpp>
struct Filters {
  static void sub(uint8_t* row, const uint8_t*, size_t size) {
    uint8_t left[Bpp] = {};
    for (size_t i = 0; i < size; i += Bpp) {
      for (size_t c = 0; c < Bpp; ++c) row[i + c] = left[c] = static_cast<uint8_t>(row[i + c] + left[c]);
    }
  }
  static void up(uint8_t* __restrict row, const uint8_t* __restrict above, size_t size) {
    for (size_t i = 0; i < size; ++i) row[i] = static_cast<uint8_t>(row[i] + above[i]);
  }
  static void average(uint8_t* row, const uint8_t* above, size_t size) {
    uint8_t left[Bpp] = {};
    for (size_t i = 0; i < size; i += Bpp) {
      for (size_t c = 0; c < Bpp; ++c) {
        row[i + c] = left[c] = static_cast<uint8_t>(row[i + c] + ((left[c] + above[i + c]) >> 1));
      }
    }
  }
  static void paeth_row(uint8_t* row, const uint8_t* above, size_t size) {
    int left[Bpp] = {};
    int corner[Bpp] = {};
    for (size_t i = 0; i < size; i += Bpp) {
      for (size_t c = 0; c < Bpp; ++c) {
        const int up = above[i + c];
        left[c] = (row[i + c] + paeth(left[c], up, corner[c])) & 0xFF;
        corner[c] = up;
        row[i + c] = static_cast<uint8_t>(left[c]);
      }
    }
  }
};

using Filter = void (*)(uint8_t* row, const uint8_t* above, size_t size);

template <size_t Bpp>
constexpr Filter kFilters[4] = {Filters<Bpp>::sub, Filters<Bpp>::up, Filters<Bpp>::average,
                                Filters<Bpp>::paeth_row};

// By bytes per pixel: 1, 2, 3, 4, 6 or 8.
const Filter* filters(int bytesPerPixel) {
  switch (bytesPerPixel) {
    case 2:
      return kFilters<2>;
    case 3:
      return kFilters<3>;
    case 4:
      return kFilters<4>;
    case 6:
      return kFilters<6>;
    case 8:
      return kFilters<8>;
    default:
      return kFilters<1>;
  }
}

}  // namespace

// Scanlines are whole pixels where a pixel takes more than a byte, so that the loops end with the row.
void unfilter(uint8_t type, uint8_t* row, const uint8_t* above, size_t rowBytes, int bytesPerPixel) {
  constexpr uint8_t kNone = 0, kKnown = 4;
  if (type == kNone) return;
  if (type <= kKnown) {
    filters(bytesPerPixel)[type - 1](row, above, rowBytes);
  } else if (rowBytes != 0) {
    row[0] = 0;
  }
}

}  // namespace pelo::png

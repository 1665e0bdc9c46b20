// Rows go through the first-level cache in runs of R, G, B, A bytes.
#pragma once

#include <algorithm>
#include <cstdint>

namespace pelo {

constexpr int kPixelRun = 256;

// For `count` pixels: fill(first, length, rgba) and use(rgba, first, length), run by run.
template <class Fill, class Use>
void for_pixel_runs(int count, Fill fill, Use use) {
  uint8_t rgba[4 * kPixelRun];
  for (int first = 0; first < count; first += kPixelRun) {
    const int length = std::min(kPixelRun, count - first);
    fill(first, length, rgba);
    use(rgba, first, length);
  }
}

}  // namespace pelo

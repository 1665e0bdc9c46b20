// From a memory budget to a linear scale: a square root in 10-bit fixed point, by table.
#include "codec/base/dec_ratio.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>

#include "tavirpelo/decinfo.h"

namespace pelo {
namespace {

constexpr int kOne = 1024;
constexpr int kTableSteps = 256;

// Entry i is floor(64 sqrt(i)), so that the last one is 1.0.
constexpr std::array<int16_t, kTableSteps + 1> make_roots() {
  std::array<int16_t, kTableSteps + 1> roots{};
  int root = 0;
  for (int i = 0; i <= kTableSteps; ++i) {
    while ((root + 1) * (root + 1) <= 4096 * i) ++root;
    roots[static_cast<size_t>(i)] = static_cast<int16_t>(root);
  }
  return roots;
}
constexpr auto kRoots = make_roots();
static_assert(kRoots[2] == 90 && kRoots[kTableSteps] == kOne);

int root(int64_t step) {
  return kRoots[static_cast<size_t>(std::min<int64_t>(step, kTableSteps))];
}

}  // namespace

int max_dec_ratio(int64_t needed, int64_t available) {
  if (needed < 0) return 0;
  if (needed > available) return kOne;
  if (available == 0) return 0;
  // Small ratios take four times as many steps and half the root.
  if (available >= 64 * needed) return root(needed * 1024 / available) >> 1;
  return root(needed * 256 / available);
}

}  // namespace pelo

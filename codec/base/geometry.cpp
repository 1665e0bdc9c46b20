#include "codec/base/geometry.h"

#include <algorithm>
#include <array>
#include <cstddef>

namespace pelo {

Placement place(Size buffer, Size target, uint32_t option) {
  const Size shown = turned(target, option);
  if ((option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_TIGHT) buffer = shown;
  const int64_t left = (int64_t{buffer.width} - shown.width) >> 1;
  const int64_t top = (int64_t{buffer.height} - shown.height) >> 1;
  const int64_t right = left + shown.width - 1;
  const int64_t bottom = top + shown.height - 1;
  switch (option & TAVIRPELO_ROTATE_MASK) {
    case TAVIRPELO_ROTATE_90:  // the first row runs down the right edge
      return {buffer, {right, 0, -1}, {top, 1, 0}, left, top};
    case TAVIRPELO_ROTATE_180:
      return {buffer, {right, -1, 0}, {bottom, 0, -1}, left, top};
    case TAVIRPELO_ROTATE_270:  // the first row runs up the left edge
      return {buffer, {left, 0, 1}, {bottom, -1, 0}, left, top};
    default:
      return {buffer, {left, 1, 0}, {top, 0, 1}, left, top};
  }
}

namespace {

// The other side of a picture whose `side` is made `fitted`, no more than the box has.
int follow(int64_t other, int64_t side, int fitted, int limit) {
  return static_cast<int>(std::min<int64_t>(other * fitted / side, limit));
}

bool fits(int64_t width, int64_t height, Size box) {
  return width <= box.width && height <= box.height;
}
Size as_it_is(int64_t width, int64_t height) {
  return {static_cast<int>(width), static_cast<int>(height)};
}

}  // namespace

Size fit_by_ratio(int64_t width, int64_t height, Size box) {
  if (fits(width, height, box)) return as_it_is(width, height);
  if (box.width == 0 || box.height == 0) return {0, 0};
  const float across = static_cast<float>(width) / static_cast<float>(box.width);
  const float down = static_cast<float>(height) / static_cast<float>(box.height);
  if (across >= down) return {box.width, follow(height, width, box.width, box.height)};
  return {follow(width, height, box.height, box.width), box.height};
}

Size fit_by_width(int64_t width, int64_t height, Size box) {
  if (fits(width, height, box)) return as_it_is(width, height);
  const int64_t fitted = height * box.width / width;
  if (fitted <= box.height) return {box.width, static_cast<int>(fitted)};
  return {follow(width, height, box.height, box.width), box.height};
}

// ---- from a memory budget to a linear scale: a square root in 10-bit fixed point, by table ----

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

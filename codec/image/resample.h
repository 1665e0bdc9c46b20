// Resampling of packed pixels between two areas of memory: the one loop under every scaling operation.
//
// Nearest samples stand under the middle of each output's span; averages take the two by two of
// codec/pixel/quad_sampler.h. Scaling must not fail for want of memory, so positions and sums are kept
// for a run of columns at a time.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <utility>

#include "codec/base/axis_stepper.h"
#include "codec/pixel/quad_sampler.h"

namespace pelo {

// Pixels in memory; strides in bytes.
struct SourceArea {
  const uint8_t* first;
  int width, height;
  ptrdiff_t stride;
};
struct TargetArea {
  uint8_t* first;
  int width, height;
  ptrdiff_t stride;
};

constexpr int kResampleRun = 256;  // output columns whose sample positions are kept at a time

// Nearest samples of `Bytes` bytes: copy(source pixel, target pixel).
template <class Copy>
void resample_nearest(const SourceArea& source, const TargetArea& target, ptrdiff_t bytes, Copy copy) {
  AxisStepper columns(source.width, target.width, source.width / 2);
  for (int begin = 0; begin < target.width; begin += kResampleRun) {
    const int count = std::min(kResampleRun, target.width - begin);
    ptrdiff_t at[kResampleRun];
    for (int i = 0; i < count; ++i, columns.advance())
      at[i] = static_cast<ptrdiff_t>(columns.position()) * bytes;
    AxisStepper rows(source.height, target.height, source.height / 2);
    for (int y = 0; y < target.height; ++y, rows.advance()) {
      const uint8_t* in = source.first + static_cast<ptrdiff_t>(rows.position()) * source.stride;
      uint8_t* out = target.first + y * target.stride + begin * bytes;
      for (int i = 0; i < count; ++i) copy(in + at[i], out + i * bytes);
    }
  }
}

// What an average takes from one source row: the sums of each output's two samples there. Enlarging asks
// for the same row again and again.
template <class Pixel>
class RowSums {
 public:
  // `a` and `b`: byte offsets of the samples.
  void take(const SourceArea& source, ptrdiff_t row, const ptrdiff_t* a, const ptrdiff_t* b, int count) {
    if (row == row_) return;
    row_ = row;
    const uint8_t* in = source.first + row * source.stride;
    for (int i = 0; i < count; ++i) words_[i] = Pixel::word(in + a[i]) + Pixel::word(in + b[i]);
  }
  ptrdiff_t row() const { return row_; }
  uint32_t operator[](int i) const { return words_[i]; }

 private:
  ptrdiff_t row_ = -1;
  uint32_t words_[kResampleRun];
};

// Averages of two by two samples: words[i] = the sum of Pixel::word() of the four, finished by
// finish(words, out, count), run by run.
template <class Pixel, class Finish>
void resample_average(const SourceArea& source, const TargetArea& target, Phases across, Phases down,
                      Finish finish) {
  QuarterPoints columns(source.width, target.width, across);
  for (int begin = 0; begin < target.width; begin += kResampleRun) {
    const int count = std::min(kResampleRun, target.width - begin);
    ptrdiff_t a[kResampleRun], b[kResampleRun];
    for (int i = 0; i < count; ++i, columns.advance()) {
      a[i] = static_cast<ptrdiff_t>(columns.first()) * Pixel::kBytes;
      b[i] = static_cast<ptrdiff_t>(columns.second()) * Pixel::kBytes;
    }
    QuarterPoints rows(source.height, target.height, down);
    RowSums<Pixel> sums[2];
    RowSums<Pixel>*top = &sums[0], *bottom = &sums[1];
    for (int y = 0; y < target.height; ++y, rows.advance()) {
      const auto topRow = static_cast<ptrdiff_t>(rows.first());
      if (bottom->row() == topRow) std::swap(top, bottom);
      top->take(source, topRow, a, b, count);
      bottom->take(source, static_cast<ptrdiff_t>(rows.second()), a, b, count);
      uint32_t words[kResampleRun];
      for (int i = 0; i < count; ++i) words[i] = (*top)[i] + (*bottom)[i];
      finish(words, target.first + y * target.stride + begin * Pixel::kBytes, count);
    }
  }
}

}  // namespace pelo

// Averages of two by two samples, by which pictures are resized: output k of T along an axis draws on
// the inputs floor((S/4 + k * S) / T) and floor((3*S/4 + k * S) / T) of S, a quarter and three quarters
// of the way through its span; of the four crossings the mean is taken.
#pragma once

#include <cstddef>
#include <cstdint>

#include "codec/base/axis_stepper.h"
#include "codec/base/os_memory.h"

namespace pelo {

// What is added to k * S before the division by T.
struct Phases {
  int64_t first, second;
};
constexpr Phases quarter_phases(int64_t inputs) {
  return {inputs / 4, 3 * inputs / 4};
}

// The two inputs of each output along an axis, from output `from` on.
class QuarterPoints {
 public:
  QuarterPoints(int64_t inputs, int64_t outputs, Phases phases, int64_t from = 0)
      : first_(inputs, outputs, phases.first + from * inputs),
        second_(inputs, outputs, phases.second + from * inputs) {}
  QuarterPoints(int64_t inputs, int64_t outputs)
      : QuarterPoints(inputs, outputs, quarter_phases(inputs)) {}

  int64_t first() const { return first_.position(); }
  int64_t second() const { return second_.position(); }
  void advance() {
    first_.advance();
    second_.advance();
  }

 private:
  AxisStepper first_, second_;
};

// One output row while it is gathered: opened by the input row with its quarter point, closed by the row
// with its three-quarter point, which may be the same row. The column table is made once.
//
// Lanes says how a sample is packed: Word holds the sum of four, and word(row, column) is one sample of
// an input row of type Row. Column is wide enough for an input column. A row may be opened and closed
// with other lanes than the sampler's, as long as their words are alike.
template <class Lanes, class Column>
class QuadSampler {
 public:
  using Word = typename Lanes::Word;

  // For rows of `inputs` samples to `outputs` words, both at least 1; false when memory is short.
  [[nodiscard]] bool prepare(int64_t inputs, int64_t outputs) {
    const auto count = static_cast<size_t>(outputs);
    if (!columns_.allocate(2 * count) || !words_.allocate(count)) return false;
    QuarterPoints points(inputs, outputs);
    for (size_t k = 0; k < count; ++k, points.advance()) {
      columns_[2 * k] = static_cast<Column>(points.first());
      columns_[2 * k + 1] = static_cast<Column>(points.second());
    }
    return true;
  }

  template <class Packing = Lanes>
  void open(const typename Packing::Row& row) {
    take<Packing, false>(row);
  }
  template <class Packing = Lanes>
  void close(const typename Packing::Row& row) {
    take<Packing, true>(row);
  }

  const Word* words() const { return words_.data(); }

 private:
  template <class Packing, bool Add>
  void take(const typename Packing::Row& row) {
    const Column* __restrict columns = columns_.data();
    Word* __restrict words = words_.data();
    const size_t count = words_.size();
    for (size_t k = 0; k < count; ++k) {
      const Word sum = Packing::word(row, columns[2 * k]) + Packing::word(row, columns[2 * k + 1]);
      words[k] = Add ? words[k] + sum : sum;
    }
  }

  OsBuffer<Column> columns_;  // pairs
  OsBuffer<Word> words_;
};

// Sums of four samples for three channels at once, in 10-bit lanes of a 32-bit word: first
// channel in bits 20-29, second in 10-19, third in 0-9. Four samples of 255 fill a lane exactly.
constexpr uint32_t pack_lanes(uint32_t first, uint32_t second, uint32_t third) {
  return first << 20 | second << 10 | third;
}

// The average of four, truncated.
constexpr uint8_t lane_average(uint32_t sums, int channel) {
  return static_cast<uint8_t>(sums >> (20 - 10 * channel) >> 2);
}

}  // namespace pelo

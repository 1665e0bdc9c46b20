// Sampling positions along one axis of a resampled picture.
#pragma once

#include <cstdint>

namespace pelo {

// Output k of `outputs` draws on input floor((phase + k * inputs) / outputs), k = 0, 1, ... Nothing is
// divided after construction. A writer driven by input rows asks while (stepper.position() == row).
class AxisStepper {
 public:
  // inputs, outputs >= 1; phase >= 0.
  AxisStepper(int64_t inputs, int64_t outputs, int64_t phase)
      : position_(phase / outputs),
        rest_(phase % outputs),
        outputs_(outputs),
        whole_(inputs / outputs),
        part_(inputs % outputs) {}
  AxisStepper() : AxisStepper(1, 1, 0) {}

  int64_t position() const { return position_; }
  void advance() {
    position_ += whole_;
    rest_ += part_;
    if (rest_ >= outputs_) {
      rest_ -= outputs_;
      ++position_;
    }
  }

 private:
  int64_t position_;
  int64_t rest_;
  int64_t outputs_;
  int64_t whole_;
  int64_t part_;
};

}  // namespace pelo

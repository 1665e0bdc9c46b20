// Steps that are worth a second try: those behind the point from which an edit cannot be undone without
// loss, and those that undo.
#pragma once

namespace pelo::slideshow {

// A call that fails once does not decide.
constexpr int kTries = 2;

// Runs the step until it answers true, kTries times at the most.
template <class Step>
bool persist(Step step) {
  for (int i = 0; i < kTries; ++i) {
    if (step()) return true;
  }
  return false;
}

}  // namespace pelo::slideshow

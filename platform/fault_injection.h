// Test hooks of the OS layer: count the calls, and fail the k-th or some from there on. Off (failAt 0) unless
// a test arms them.
#pragma once

namespace pelo::faults {

struct Counter {
  long calls = 0;
  long failAt = 0;     // 1 fails the next call; 0 never
  long failCount = 1;  // so many in a row

  // Counts one call; true when it is one to fail.
  bool hit() {
    ++calls;
    return failAt > 0 && calls >= failAt && calls - failAt < failCount;
  }
  void arm(long k, long count = 1) {
    calls = 0;
    failAt = k;
    failCount = count;
  }
};

extern Counter allocations;    // TAVIRPELO_OsMalloc, TAVIRPELO_OsRealloc
extern Counter containerCalls; // every file call of the slide-show store

}  // namespace pelo::faults

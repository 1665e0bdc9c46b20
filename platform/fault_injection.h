// Test hooks of the OS layer: count the calls, and fail the k-th. Off (failAt 0) unless a test arms them.
#pragma once

namespace pelo::faults {

struct Counter {
  long calls = 0;
  long failAt = 0;  // 1 fails the next call; 0 never

  // Counts one call; true when this is the one to fail.
  bool hit() { return ++calls == failAt; }
  void arm(long k) {
    calls = 0;
    failAt = k;
  }
};

extern Counter allocations;    // TAVIRPELO_OsMalloc, TAVIRPELO_OsRealloc
extern Counter containerCalls; // every file call of the slide-show store

}  // namespace pelo::faults

// Test hooks: count the calls of a kind, and fail the k-th or some from there on. They exist in builds with
// tests (TAVIR_FAULT_HOOKS); elsewhere nothing is counted and the checks fold away.
#pragma once

#ifdef TAVIR_FAULT_HOOKS
#include <atomic>
#endif

namespace pelo::faults {

#ifdef TAVIR_FAULT_HOOKS

// Threads that only count may share one; arming is for a test that runs alone.
struct Counter {
  std::atomic<long> calls = 0;
  std::atomic<long> failAt = 0;     // 1 fails the next call; 0 never
  std::atomic<long> failCount = 1;  // so many in a row

  // Counts one call; true when it is one to fail.
  bool hit() {
    const long call = calls.fetch_add(1, std::memory_order_relaxed) + 1;
    const long first = failAt.load(std::memory_order_relaxed);
    return first > 0 && call >= first && call - first < failCount.load(std::memory_order_relaxed);
  }
  void arm(long k, long count = 1) {
    calls = 0;
    failAt = k;
    failCount = count;
  }
};

extern Counter allocations;     // TAVIRPELO_OsMalloc, TAVIRPELO_OsRealloc
extern Counter containerCalls;  // every file call of the slide-show store

#else

struct Counter {
  static constexpr bool hit() { return false; }
};
inline constexpr Counter allocations, containerCalls;

#endif

}  // namespace pelo::faults

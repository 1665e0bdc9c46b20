// The task layer as the engine calls it, and the two words that it shares with a decode task.
#pragma once

#include <atomic>

#include "tavirpelo/zoom.h"

namespace pelo::zoom {

// A host with tasks, or a test, puts its own functions here before a zoom starts.
struct TaskLayer {
  int (*create)(int priority, TAVIRPELO_TASKFN entry);
  int (*start)(int task);
  int (*send)(int task, const TAVIRPELO_TASKMESSAGE* message);
  int (*receive)(int timeout, TAVIRPELO_TASKMESSAGE* message);
  int (*destroy)(int task);
  void (*sleep)(int milliseconds);
};
extern TaskLayer taskLayer;

constexpr int kPollInterval = 100;  // ms

// decodeState is written by the task, stopRequest by the caller. A state of "decoded" publishes the
// pixels.
inline void store_shared(int32_t& word, int32_t value) {
  std::atomic_ref<int32_t>(word).store(value, std::memory_order_release);
}
inline int32_t load_shared(int32_t& word) {
  return std::atomic_ref<int32_t>(word).load(std::memory_order_acquire);
}

}  // namespace pelo::zoom

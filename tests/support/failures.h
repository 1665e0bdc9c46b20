// Memory that runs out, and a quiet log while input is damaged.
#pragma once

#include <gtest/gtest.h>

#include <fstream>
#include <string>

#include "platform/android_log.h"
#include "platform/fault_injection.h"

namespace tests {

// Fails the k-th allocation of run(), for every k there is from `first` on, and hands each answer to
// judge(answer); gives the answer of the run in which all of them succeeded.
template <class Run, class Judge>
auto fail_each_allocation(Run run, Judge judge, long first = 1) {
  for (long k = first;; ++k) {
    SCOPED_TRACE(k);
    pelo::faults::allocations.arm(k);
    auto answer = run();
    const bool failed = pelo::faults::allocations.calls >= k;
    pelo::faults::allocations.arm(0);
    if (!failed) {
      EXPECT_LT(first, k) << "nothing was allocated";
      return answer;
    }
    judge(answer);
    if (k > 2000) ADD_FAILURE() << "no end";
    if (k > 2000) return answer;
  }
}
// The same for runs that then answer 0.
template <class Run>
auto fail_each_allocation(Run run) {
  return fail_each_allocation(run, [](auto answer) { EXPECT_EQ(0, answer); });
}

// A peak of the whole process so far, in KiB: "VmHWM" of memory in use, "VmPeak" of addresses.
inline long peak_kib(const std::string& name) {
  std::ifstream status("/proc/self/status");
  long kib = 0;
  for (std::string word; kib == 0 && status >> word;) {
    if (word == name + ":") status >> kib;
  }
  return kib;
}

// Nothing is logged, nothing fails any more after a test.
class QuietTest : public testing::Test {
 protected:
  void SetUp() override {
    pelo::platform::set_log_sink([](const char*) {});
  }
  void TearDown() override {
    pelo::platform::set_log_sink(nullptr);
    pelo::faults::allocations.arm(0);
  }
};

}  // namespace tests

// Every file call and every allocation failing in turn, and a disk that is full: nothing is lost.
#include <gtest/gtest.h>

#include <functional>

#include "platform/android_log.h"
#include "platform/fault_injection.h"
#include "tests/slideshow/file_limit.h"
#include "tests/slideshow/show_state.h"
#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

using pelo::faults::allocations;
using pelo::faults::containerCalls;

class Failure : public testing::Test {
 protected:
  void SetUp() override {
    pelo::platform::set_log_sink([](const char*) {});
    ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  }
  void TearDown() override {
    allocations.arm(0);
    containerCalls.arm(0);
    pelo::platform::set_log_sink(nullptr);
  }
  // Pictures of which some are shorter and some longer than the one to come, loaded and new.
  void fill() {
    ASSERT_EQ(1, add_sample(show, 40, 40, "A"));
    ASSERT_EQ(1, add_sample(show, 8, 8, "B"));
    ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
    ASSERT_EQ(1, add_sample(show, 64, 24, "C"));
    ASSERT_EQ(1, add_sample(show, 16, 16, "D", 3));
  }
  int edit(int position) {
    return show.InsertImageToBuffer(picture.data(), static_cast<int>(picture.size()), "new", position);
  }

  TempFile file;
  SlideShow show;
  Bytes picture = encode_own(24, 24, 80);
};

// The same edit with the k-th call of one kind failing, for all k until none fails.
void fail_each(pelo::faults::Counter& counter, SlideShow& show, const TempFile& file,
               const std::function<int()>& edit) {
  const Bytes before = file.read();
  const State state(show);
  const bool opens = show.subfileCount > 0;
  const Contents pictures = opens ? reopened(file) : Contents{};
  long k = 1;
  for (; k < 2000; ++k) {
    counter.arm(k);
    const int result = edit();
    const bool failed = counter.calls >= k;
    counter.arm(0);
    if (result == 1 && !failed) break;
    ASSERT_EQ(0, result) << k;
    ASSERT_TRUE(state == State(show)) << k;
    ASSERT_EQ(before, file.read()) << k;
    if (opens) {
      ASSERT_EQ(pictures, reopened(file)) << k;
    }
  }
  EXPECT_GT(k, 10);
  EXPECT_LT(k, 2000);
  EXPECT_EQ(pictures.size() + 1, reopened(file).size());
  EXPECT_EQ(contents(show), reopened(file));
}

TEST_F(Failure, OfAFileCallDuringTheFirstAdd) {
  fail_each(containerCalls, show, file, [&] { return edit(0); });
}

TEST_F(Failure, OfAFileCallDuringAnAdd) {
  fill();
  fail_each(containerCalls, show, file, [&] { return edit(4); });
}

TEST_F(Failure, OfAFileCallDuringAnInsertion) {
  fill();
  fail_each(containerCalls, show, file, [&] { return edit(0); });
  fail_each(containerCalls, show, file, [&] { return edit(3); });
}

TEST_F(Failure, OfAnAllocationDuringAnEdit) {
  fill();
  fail_each(allocations, show, file, [&] { return edit(1); });
  fail_each(allocations, show, file, [&] { return edit(5); });
}

// Memory may be short when the file fails: what the way back needs is there before the first write.
TEST_F(Failure, UndoingNeedsNoMemory) {
  fill();
  containerCalls.arm(0);
  allocations.arm(0);
  ASSERT_EQ(1, edit(0));
  const long needed = allocations.calls;
  const long calls = containerCalls.calls;
  for (long k = calls / 2; k < calls; ++k) {
    allocations.arm(0);
    containerCalls.arm(k);
    ASSERT_EQ(0, edit(0));
    EXPECT_LE(allocations.calls, needed) << k;
  }
}

// A limit on the file's length fails every write beyond it, the flush at closing included.
TEST_F(Failure, OfAFullDisk) {
  fill();
  const Bytes before = file.read();
  int refused = 0;
  for (const int position : {0, 2, 4}) {
    const State state(show);
    for (size_t room = 0;; room += 53) {
      const int result = (FileLimit(before.size() + room), edit(position));
      if (result == 1) break;
      ++refused;
      ASSERT_TRUE(state == State(show)) << position << " " << room;
      ASSERT_EQ(before, file.read()) << position << " " << room;
    }
    file.write(before);
    ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
  }
  EXPECT_GT(refused, 20);
}

TEST_F(Failure, OfCreatingAndOpening) {
  fill();
  for (long k = 1;; ++k) {
    containerCalls.arm(k);
    const int result = show.OpenShow(file.c_str(), 1, 1);
    if (containerCalls.calls < k) break;
    ASSERT_EQ(SlideShow::kGeneralFailure, result) << k;
    ASSERT_EQ(SlideShow::kFree, show.mode);
  }
  containerCalls.arm(0);
  ASSERT_EQ(SlideShow::kFileMode, show.mode);
  for (long k = 1;; ++k) {
    containerCalls.arm(k);
    const int result = show.CreateShow(file.c_str(), 480, 480);
    if (containerCalls.calls < k) break;
    // Only a failed removal of the old file does no harm: it is overwritten.
    ASSERT_TRUE(result == SlideShow::kGeneralFailure || result == 1) << k;
    ASSERT_EQ(result == 1 ? SlideShow::kFileMode : SlideShow::kFree, show.mode);
    if (result == 1) {
      ASSERT_EQ(kHeaderBytes, file.read().size()) << k;
    }
  }
  containerCalls.arm(0);
  for (const char* path : {file.c_str(), static_cast<const char*>(nullptr)}) {
    allocations.arm(1);
    EXPECT_EQ(SlideShow::kGeneralFailure, show.CreateShow(path, 480, 480));
    EXPECT_EQ(SlideShow::kFree, show.mode);
  }
}

TEST_F(Failure, OfAnAllocationWhileDrawing) {
  fill();
  std::vector<uint32_t> pixels(40 * 40);
  int drawn = 0;
  for (long k = 1; drawn == 0; ++k) {
    allocations.arm(k);
    drawn = show.GetDrawble(0, pixels.data(), 40, 40);
    ASSERT_EQ(nullptr, show.file);
    ASSERT_EQ(drawn == 1 ? 0 : -1, show.lastIndex);
    ASSERT_LT(k, 200);
  }
}

}  // namespace
}  // namespace tests

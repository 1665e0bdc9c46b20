// Every file call and every allocation failing in turn, and a disk that is full: nothing is lost.
#include <gtest/gtest.h>
#include <sys/resource.h>

#include <csignal>

#include "platform/android_log.h"
#include "platform/fault_injection.h"
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
  int refused = 0, done = 0;
  fail_at_each(
      counter, 1, [] {}, edit,
      [&](int result) {
        ++(result == 1 ? done : refused);
        if (result == 1) return;
        ASSERT_TRUE(state == State(show));
        ASSERT_EQ(before, file.read());
        ASSERT_TRUE(!opens || pictures == reopened(file));
      });
  EXPECT_GE(refused, 10);
  EXPECT_EQ(1, done);
  EXPECT_EQ(pictures.size() + 1, reopened(file).size());
  EXPECT_EQ(contents(show), reopened(file));
}

TEST_F(Failure, OfACallDuringAnEdit) {
  fail_each(containerCalls, show, file, [&] { return edit(0); });
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  fill();
  for (const int position : {4, 0, 3}) {
    fail_each(containerCalls, show, file, [&] { return edit(position); });
  }
  for (const int position : {1, 5}) {
    fail_each(allocations, show, file, [&] { return edit(position); });
  }
}

// Memory may be short when the file fails: what the way back needs is there before the first write.
TEST_F(Failure, UndoingNeedsNoMemory) {
  fill();
  containerCalls.arm(0);
  allocations.arm(0);
  ASSERT_EQ(1, edit(0));
  const long needed = allocations.calls, calls = containerCalls.calls;
  for (long k = calls / 2; k < calls; ++k) {
    allocations.arm(0);
    containerCalls.arm(k);
    ASSERT_EQ(0, edit(0));
    EXPECT_LE(allocations.calls, needed) << k;
  }
}

// A disk that is full: while one of these lives, no write gets past that length of a file.
class FileLimit {
 public:
  explicit FileLimit(size_t length) : signal_(std::signal(SIGXFSZ, SIG_IGN)) {
    getrlimit(RLIMIT_FSIZE, &before_);
    const rlimit limit{length, before_.rlim_max};
    setrlimit(RLIMIT_FSIZE, &limit);
  }
  ~FileLimit() {
    setrlimit(RLIMIT_FSIZE, &before_);
    std::signal(SIGXFSZ, signal_);
  }
  FileLimit(const FileLimit&) = delete;
  FileLimit& operator=(const FileLimit&) = delete;

 private:
  void (*signal_)(int);
  rlimit before_;
};

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
  int opened = 0;
  fail_at_each(
      containerCalls, 1, [] {}, [&] { return show.OpenShow(file.c_str(), 1, 1); },
      [&](int result) {
        opened += result == 1;
        ASSERT_EQ(result == 1 ? SlideShow::kFileMode : SlideShow::kFree, show.mode);
      });
  EXPECT_EQ(1, opened);
  // Only a failed removal of the old file does no harm: it is overwritten.
  fail_at_each(
      containerCalls, 1, [] {}, [&] { return show.CreateShow(file.c_str(), 480, 480); },
      [&](int result) {
        ASSERT_TRUE(result == SlideShow::kGeneralFailure || result == 1);
        ASSERT_EQ(result == 1 ? SlideShow::kFileMode : SlideShow::kFree, show.mode);
        ASSERT_TRUE(result != 1 || file.read().size() == kHeaderBytes);
      });
  for (const char* path : {file.c_str(), static_cast<const char*>(nullptr)}) {
    allocations.arm(1);
    EXPECT_EQ(SlideShow::kGeneralFailure, show.CreateShow(path, 480, 480));
    EXPECT_EQ(SlideShow::kFree, show.mode);
  }
}

TEST_F(Failure, OfAnAllocationWhileDrawing) {
  fill();
  std::vector<uint32_t> pixels(40 * 40);
  fail_at_each(
      allocations, 1, [&] { show.lastIndex = -1; },
      [&] { return show.GetDrawble(0, pixels.data(), 40, 40); },
      [&](int drawn) {
        ASSERT_EQ(nullptr, show.file);
        ASSERT_EQ(drawn == 1 ? 0 : -1, show.lastIndex);
      });
  EXPECT_EQ(0, show.lastIndex);
}

}  // namespace
}  // namespace tests

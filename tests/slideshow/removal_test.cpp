// Marking and compaction: whole files against a builder of the test's own, and every failing file call.
#include <gtest/gtest.h>

#include "platform/fault_injection.h"
#include "tests/slideshow/file_limit.h"
#include "tests/slideshow/show_state.h"
#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

using pelo::faults::allocations;
using pelo::faults::containerCalls;

// Five pictures of different lengths behind some music, as an earlier session left them.
class Removal : public testing::Test {
 protected:
  void SetUp() override {
    image.path = file.path();
    image.musicPath = "tune";
    image.music = Bytes(50, 'm');
    image.interval = 3;
    for (const auto& [name, side] : {std::pair{"P", 40}, {"Q", 8}, {"R", 64}, {"S", 16}, {"T", 24}}) {
      image.pictures.push_back(
          {name, std::string(name) + ".jpg", side, side, 0, encode_own(side, side, 80)});
    }
    image.staleMarks = 1;
    open();
  }
  void TearDown() override {
    allocations.arm(0);
    containerCalls.arm(0);
  }

  void open(const std::vector<int>& marks = {}) {
    file.write(image.bytes());
    ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
    for (const int index : marks) ASSERT_EQ(1, show.RemoveImage(index));
  }
  // The file after compaction: without the marked pictures and without stale end marks.
  ContainerImage without(const std::vector<int>& marks) const {
    ContainerImage rest = image;
    rest.staleMarks = 0;
    for (size_t i = marks.size(); i-- > 0;) rest.pictures.erase(rest.pictures.begin() + marks[i]);
    for (auto& picture : rest.pictures) picture.state &= ~1;
    return rest;
  }
  // The k-th file call fails, and `count` - 1 after it.
  void fail_each(const std::vector<int>& marks, long count);

  TempFile file;
  ContainerImage image;
  SlideShow show;
};

const std::vector<int> kMarkings[] = {{},     {0},       {1},       {4},       {0, 1},
                                      {1, 3}, {0, 2, 4}, {2, 3, 4}, {0, 1, 3}, {0, 1, 2, 3, 4}};

TEST_F(Removal, ClosesTheGapsByteForByte) {
  for (const auto& marks : kMarkings) {
    open(marks);
    ASSERT_EQ(1, show.RemoveSubfile());
    const ContainerImage rest = without(marks);
    ASSERT_EQ(rest.bytes(), file.read()) << marks.size();
    ASSERT_EQ(rest.pictures.size(), static_cast<size_t>(show.subfileCount));
    EXPECT_EQ(contents(show), reopened(file));
    for (int i = 0; i < 20; ++i) {
      const bool used = i < show.subfileCount;
      EXPECT_EQ(used ? number_at(file.read(), 50 + 548 + static_cast<size_t>(i) * 4) : 0,
                show.subfileOffsets[i]);
      EXPECT_EQ(used, show.subfiles[i].size != 0);
    }
    // The show goes on from there.
    ASSERT_EQ(1, add_sample(show, 12, 12, "new", 0));
    ASSERT_EQ(1, show.RemoveImage(0));
    ASSERT_EQ(1, show.RemoveSubfile());
    EXPECT_EQ(rest.bytes(), file.read());
  }
}

TEST_F(Removal, MarksStayInMemoryAndDrawable) {
  std::vector<uint32_t> pixels(8 * 8);
  EXPECT_EQ(2, show.GetImageState(1));
  ASSERT_EQ(1, show.RemoveImage(1));
  ASSERT_EQ(1, show.RemoveImage(1));
  EXPECT_EQ(3, show.GetImageState(1));
  EXPECT_EQ(image.bytes(), file.read());
  EXPECT_EQ(1, show.GetDrawble(1, pixels.data(), 8, 8));
  for (const int index : {-1, 5, 20}) {
    EXPECT_EQ(0, show.RemoveImage(index));
    EXPECT_EQ(0, show.GetImageState(index));
  }
  // An insertion writes the mark into the file. Opening ignores it, and a compaction does so too.
  ASSERT_EQ(1, add_sample(show, 10, 10, "new", 0));
  ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
  EXPECT_EQ(3, number_at(file.read(), static_cast<size_t>(show.subfiles[2].offset) + 528));
  EXPECT_EQ(2, show.GetImageState(2));
  ASSERT_EQ(1, show.RemoveImage(0));
  ASSERT_EQ(1, show.RemoveSubfile());
  ASSERT_EQ(1, show.RemoveSubfile());
  EXPECT_EQ(5, show.subfileCount);
  EXPECT_EQ(2, show.GetImageState(0));
  EXPECT_EQ(2, number_at(file.read(), static_cast<size_t>(show.subfiles[1].offset) + 528));
}

TEST_F(Removal, OtherShowsRefuse) {
  SlideShow other;
  EXPECT_EQ(0, other.RemoveSubfile());
  EXPECT_EQ(0, other.RemoveImage(0));
  ASSERT_EQ(1, other.CreateShow(nullptr, 480, 480));
  ASSERT_EQ(1, add_sample(other, 8, 8, "memory"));
  EXPECT_EQ(0, other.RemoveImage(0));
  EXPECT_EQ(0, other.RemoveSubfile());
  EXPECT_EQ(1, other.subfileCount);
  // A container without a picture gets its end mark.
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  EXPECT_EQ(1, show.RemoveSubfile());
  EXPECT_EQ(kHeaderBytes + kMarkBytes, file.read().size());
  EXPECT_EQ(0u, reopened(file).size());
}

// A file that someone else changed behind the open show is left alone.
TEST_F(Removal, RefusesAFileThatChangedMeanwhile) {
  open({1});
  const State state(show);
  Bytes other = image.bytes();
  set_number(other, static_cast<size_t>(show.subfiles[3].offset) + 532, 541);
  file.write(other);
  EXPECT_EQ(0, show.RemoveSubfile());
  EXPECT_EQ(other, file.read());
  other.resize(static_cast<size_t>(show.subfiles[4].offset) + 600);
  file.write(other);
  EXPECT_EQ(0, show.RemoveSubfile());
  EXPECT_EQ(other, file.read());
  EXPECT_TRUE(state == State(show));
}

// One failure: the old file or the new one. The same call failing again: the pictures to keep are safe,
// the others still listed.
void Removal::fail_each(const std::vector<int>& marks, long count) {
  const Bytes after = without(marks).bytes();
  for (long k = 1;; ++k) {
    ASSERT_LT(k, 2000);
    open(marks);
    const State state(show);
    containerCalls.arm(k, count);
    const int result = show.RemoveSubfile();
    const bool hit = containerCalls.calls >= k;
    containerCalls.arm(0);
    if (result == 1) {
      ASSERT_EQ(after, file.read()) << k;
      ASSERT_EQ(contents(show), reopened(file)) << k;
    } else {
      ASSERT_TRUE(state == State(show)) << k;
      const Bytes left = file.read();
      if (count == 1) {
        ASSERT_EQ(image.bytes(), left) << k;
      }
      const Contents pictures = reopened(file);
      ASSERT_EQ(image.pictures.size(), pictures.size()) << k;
      for (size_t i = 0; i < pictures.size(); ++i) {
        ASSERT_EQ(image.pictures[i].name, pictures[i].first) << k;
        if ((show.subfiles[i].state & 1) == 0) {
          ASSERT_EQ(image.pictures[i].jpeg, pictures[i].second) << k;
        }
      }
      // Once the obstacle is gone the compaction goes through.
      ASSERT_EQ(1, show.RemoveSubfile()) << k;
      ASSERT_EQ(after, file.read()) << k;
    }
    if (!hit) return;
  }
}

TEST_F(Removal, SurvivesAFailingCall) {
  for (const auto& marks : kMarkings) fail_each(marks, 1);
}

TEST_F(Removal, SurvivesACallFailingTwice) {
  for (const auto& marks : kMarkings) {
    fail_each(marks, 2);
    fail_each(marks, 3);
  }
}

// A part of the file cannot be written any more.
TEST_F(Removal, KeepsThePicturesWhereWritingEnds) {
  const std::vector<int> marks{1, 3};
  for (size_t limit = 0; limit < image.bytes().size(); limit += 31) {
    open(marks);
    const State state(show);
    const int result = (FileLimit(limit), show.RemoveSubfile());
    if (result == 1) {
      ASSERT_EQ(without(marks).bytes(), file.read()) << limit;
      continue;
    }
    ASSERT_TRUE(state == State(show)) << limit;
    const Contents pictures = reopened(file);
    ASSERT_EQ(5u, pictures.size()) << limit;
    for (const size_t kept : {0u, 2u, 4u})
      ASSERT_EQ(image.pictures[kept].jpeg, pictures[kept].second) << limit;
  }
}

TEST_F(Removal, NeedsItsMemoryBeforeItBegins) {
  open({0, 2});
  const State state(show);
  int result = 0;
  for (long k = 1; result == 0; ++k) {
    allocations.arm(k);
    result = show.RemoveSubfile();
    if (result == 1) break;
    ASSERT_TRUE(state == State(show)) << k;
    ASSERT_EQ(image.bytes(), file.read()) << k;
  }
  EXPECT_EQ(without({0, 2}).bytes(), file.read());
}

}  // namespace
}  // namespace tests

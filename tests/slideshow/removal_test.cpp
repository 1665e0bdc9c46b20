// Marking and compaction: whole files against a builder of the test's own, and every failing file call.
#include <gtest/gtest.h>

#include <optional>

#include "tests/slideshow/show_state.h"

namespace tests {
namespace {

using pelo::faults::allocations;
using pelo::faults::containerCalls;

// Five pictures of different lengths behind some music, as an earlier session left them.
class Removal : public StoredShow {
 protected:
  Removal() : StoredShow({40, 8, 64, 16, 24}) {
    image.musicPath = "tune";
    image.music = Bytes(50, 'm');
    image.interval = 3;
    image.staleMarks = 1;
    open({});
  }
  // The file after compaction: without the marked pictures and without stale end marks.
  ContainerImage without(const std::vector<int>& marks) const {
    ContainerImage rest = image;
    rest.staleMarks = 0;
    for (size_t i = marks.size(); i-- > 0;) rest.pictures.erase(rest.pictures.begin() + marks[i]);
    for (auto& picture : rest.pictures) picture.state &= ~1;
    return rest;
  }
};

const std::vector<int> kMarkings[] = {{},     {0},       {1},       {4},       {0, 1},
                                      {1, 3}, {0, 2, 4}, {2, 3, 4}, {0, 1, 3}, {0, 1, 2, 3, 4}};

TEST_F(Removal, MarksStayInMemoryAndDrawable) {
  std::vector<uint32_t> pixels(8 * 8);
  EXPECT_EQ(2, show.GetImageState(1));
  ASSERT_EQ(1, show.RemoveImage(1));
  EXPECT_EQ(3, show.GetImageState(1));
  EXPECT_EQ(image.bytes(), file.read());
  EXPECT_EQ(1, show.GetDrawble(1, pixels.data(), 8, 8));
  for (const int index : {-1, 5, 20}) EXPECT_EQ(0, show.RemoveImage(index) + show.GetImageState(index));
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
  ASSERT_EQ(1, other.CreateShow(nullptr, 480, 480));
  ASSERT_EQ(1, add_sample(other, 8, 8, "memory"));
  EXPECT_EQ(0, other.RemoveImage(0));
  EXPECT_EQ(0, other.RemoveSubfile());
  // A container without a picture gets its end mark.
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  EXPECT_EQ(1, show.RemoveSubfile());
  EXPECT_EQ(kHeaderBytes + kMarkBytes, file.read().size());
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
  EXPECT_TRUE(state == State(show));
}

// One failure: the old file or the new one. The same call failing again: the pictures to keep are safe,
// the others still listed.
TEST_F(Removal, SurvivesAFailingCall) {
  for (const auto& marks : kMarkings) {
    const Bytes after = without(marks).bytes();
    for (const long count : {1, 2, 3}) {
      std::optional<State> state;
      const auto prepare = [&] {
        open(marks);
        state.emplace(show);
      };
      const auto check = [&](int result) {
        if (result == 1) {
          ASSERT_EQ(after, file.read());
          ASSERT_EQ(contents(show), reopened(file));
          return;
        }
        ASSERT_TRUE(*state == State(show));
        ASSERT_TRUE(count > 1 || image.bytes() == file.read());
        const Contents pictures = reopened(file);
        ASSERT_EQ(image.pictures.size(), pictures.size());
        for (size_t i = 0; i < pictures.size(); ++i) {
          ASSERT_EQ(image.pictures[i].name, pictures[i].first);
          const bool marked = (show.subfiles[i].state & 1) != 0;
          ASSERT_TRUE(marked || image.pictures[i].jpeg == pictures[i].second) << i;
        }
        // Once the obstacle is gone the compaction goes through.
        ASSERT_EQ(1, show.RemoveSubfile());
        ASSERT_EQ(after, file.read());
      };
      fail_at_each(
          containerCalls, count, prepare, [&] { return show.RemoveSubfile(); }, check);
    }
  }
}

TEST_F(Removal, NeedsItsMemoryBeforeItBegins) {
  open({0, 2});
  const State state(show);
  fail_at_each(
      allocations, 1, [] {}, [&] { return show.RemoveSubfile(); },
      [&](int result) {
        ASSERT_TRUE(result == 1 || state == State(show));
        ASSERT_TRUE(result == 1 || image.bytes() == file.read());
      });
  EXPECT_EQ(without({0, 2}).bytes(), file.read());
}

}  // namespace
}  // namespace tests

// Long sequences of edits of every kind: after each the file is, byte for byte, what a model of the show
// says, and opens again with the same pictures.
#include <gtest/gtest.h>

#include <random>

#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

class Model {
 public:
  explicit Model(unsigned seed) : random_(seed) {
    EXPECT_EQ(1, show_.CreateShow(file_.c_str(), 480, 480));
    image_.path = file_.path();
    insert(0);
  }

  void step() {
    const int count = static_cast<int>(states_.size());
    switch (pick(8)) {
      case 0:
        return compact();
      case 1:
        return reopen();
      case 2:
        return image_.music.empty() ? add_music() : remove_music();
      case 3:
        return insert(pick(count + 1));
      default:
        return pick(2) ? insert(count) : mark(pick(count + 1) - 1);
    }
  }

  // The end of the file may hold older marks, the rest is known.
  void check() {
    Bytes body = image_.bytes();
    const Bytes mark(body.end() - kMarkBytes, body.end());
    body.resize(body.size() - kMarkBytes);
    const Bytes file = file_.read();
    ASSERT_GE(file.size(), body.size() + kMarkBytes);
    ASSERT_TRUE(std::equal(body.begin(), body.end(), file.begin()));
    ASSERT_TRUE(std::equal(mark.begin(), mark.end(), file.end() - kMarkBytes));
    const Contents pictures = contents(show_);
    ASSERT_EQ(pictures, reopened(file_));
    ASSERT_EQ(states_.size(), pictures.size());
    for (size_t i = 0; i < states_.size(); ++i) {
      ASSERT_EQ(image_.pictures[i].jpeg, pictures[i].second);
      ASSERT_EQ(states_[i], show_.GetImageState(static_cast<int>(i)));
    }
    ASSERT_EQ(static_cast<int>(image_.music.size()), show_.GetMusicSize());
  }

 private:
  int pick(int count) { return static_cast<int>(random_() % static_cast<unsigned>(count)); }

  // Every picture header in the file tells the state in memory.
  void headers_written() {
    for (size_t i = 0; i < states_.size(); ++i) image_.pictures[i].state = states_[i];
  }

  void insert(int position) {
    const std::string name = "picture " + std::to_string(++named_);
    const int width = 8 + pick(60), height = 8 + pick(60);
    const bool fits = states_.size() < 20;
    ASSERT_EQ(fits, add_sample(show_, width, height, name.c_str(), position));
    if (!fits) return;
    const bool last = position == static_cast<int>(states_.size());
    image_.pictures.insert(
        image_.pictures.begin() + position,
        {name, "", width, height, 0, contents(show_)[static_cast<size_t>(position)].second});
    states_.insert(states_.begin() + position, 0);
    if (!last) headers_written();
  }

  void mark(int index) {
    ASSERT_EQ(index >= 0, show_.RemoveImage(index));
    if (index >= 0) states_[static_cast<size_t>(index)] |= 1;
  }

  void compact() {
    ASSERT_EQ(1, show_.RemoveSubfile());
    for (size_t i = states_.size(); i-- > 0;) {
      if (states_[i] & 1) {
        states_.erase(states_.begin() + static_cast<ptrdiff_t>(i));
        image_.pictures.erase(image_.pictures.begin() + static_cast<ptrdiff_t>(i));
      } else {
        states_[i] = image_.pictures[i].state & ~1;
      }
    }
    headers_written();
  }

  void add_music() {
    image_.music =
        Bytes(static_cast<size_t>(1 + pick(pick(2) ? 20 : 5000)), static_cast<uint8_t>(pick(256)));
    image_.musicPath = tune_.path();
    tune_.write(image_.music);
    ASSERT_EQ(1, show_.AddMusic(tune_.c_str()));
    headers_written();
  }

  void remove_music() {
    image_.music.clear();
    image_.musicPath.clear();
    ASSERT_EQ(1, show_.RemoveMusic());
    headers_written();
  }

  void reopen() {
    show_.interval = image_.interval = pick(100);
    ASSERT_EQ(1, show_.writeVssHeader("r+b"));
    ASSERT_EQ(1, show_.OpenShow(file_.c_str(), 1, 1));
    states_.assign(states_.size(), 2);
  }

  std::mt19937 random_;
  TempFile file_, tune_{".tune"};
  SlideShow show_;
  ContainerImage image_;
  std::vector<int> states_;  // in memory
  int named_ = 0;
};

TEST(RandomEdits, AgreeWithAModel) {
  for (const unsigned seed : {1u, 2u, 3u}) {
    Model model(seed);
    for (int i = 0; i < 300; ++i) {
      model.step();
      model.check();
      ASSERT_FALSE(testing::Test::HasFailure()) << seed << " " << i;
    }
  }
}

}  // namespace
}  // namespace tests

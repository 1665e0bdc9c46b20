// What a failed edit must leave alone, and edits that fail at each of their calls.
#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <functional>
#include <iterator>
#include <tuple>
#include <vector>

#include "platform/fault_injection.h"
#include "tests/support/slideshow_files.h"

namespace tests {

struct State {
  SlideShowFields fields;
  std::vector<subfileInfo> entries;

  explicit State(const SlideShow& show)
      : fields(show), entries(show.subfiles, show.subfiles + SlideShow::kMaxFileSubfiles) {}

  static auto settings(const SlideShowFields& f) {
    return std::tuple(std::to_array(f.pathName), std::to_array(f.musicName), f.file, f.mode, f.width,
                      f.height, f.lastIndex, f.musicSize, f.subfileCount,
                      std::to_array(f.subfileOffsets), f.interval, f.effectType, f.shuffle, f.loop,
                      f.screenDirection, f.subfiles);
  }
  static auto facts(const subfileInfo& e) {
    return std::tuple(std::to_array(e.name), std::to_array(e.path), e.flag, e.sourceFile, e.reserved,
                      e.width, e.height, e.state, e.size, e.offset);
  }

  // By fields: what padding holds is nobody's promise.
  bool operator==(const State& other) const {
    return settings(fields) == settings(other.fields) &&
           std::equal(entries.begin(), entries.end(), other.entries.begin(), other.entries.end(),
                      [](const subfileInfo& x, const subfileInfo& y) { return facts(x) == facts(y); });
  }
};

// A show that an earlier session left in a file: square pictures of these sides, and what a test adds.
class StoredShow : public testing::Test {
 protected:
  explicit StoredShow(const std::vector<int>& sides) {
    image.path = file.path();
    for (const int side : sides) {
      image.pictures.push_back({"picture " + std::to_string(side), std::to_string(side) + ".jpg", side,
                                side, 0, encode_own(side, side, 80)});
    }
  }
  void open(const std::vector<int>& marks) {
    file.write(image.bytes());
    ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
    for (const int index : marks) ASSERT_EQ(1, show.RemoveImage(index));
  }

  TempFile file;
  ContainerImage image;
  SlideShow show;
};

// Runs `edit` with its k-th call failing and `count` - 1 after it, for each k until none is reached, and
// hands its results to `check`.
inline void fail_at_each(pelo::faults::Counter& counter, long count,
                         const std::function<void()>& prepare, const std::function<int()>& edit,
                         const std::function<void(int)>& check) {
  bool hit = true;
  for (long k = 1; hit; ++k) {
    ASSERT_LT(k, 2000);
    prepare();
    counter.arm(k, count);
    const int result = edit();
    hit = counter.calls >= k;
    counter.arm(0);
    check(result);
    ASSERT_FALSE(testing::Test::HasFailure()) << k;
  }
}

}  // namespace tests

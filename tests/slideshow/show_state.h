// A copy of everything that a failed edit must leave alone.
#pragma once

#include <algorithm>
#include <array>
#include <iterator>
#include <tuple>
#include <vector>

#include "slideshow/SlideShow.h"

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

}  // namespace tests

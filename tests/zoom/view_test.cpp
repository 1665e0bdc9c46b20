// The arithmetic of zooms without pixels: sizes at the start, controls, limits, maps.
#include "codec/zoom/view.h"

#include <gtest/gtest.h>

#include <climits>
#include <random>
#include <tuple>

#include "codec/zoom/layout.h"

namespace tests {
namespace {

using namespace pelo::zoom;
using pelo::Size;
using Zoom = TAVIRPELO_ZOOMINFO;

constexpr int64_t kPlenty = int64_t{1} << 31;

Zoom zoom_of(Size picture, Size display, int64_t budget = kPlenty, int factor = 1, int bytes = 2) {
  Zoom zoom{};
  EXPECT_TRUE(lay_out(zoom, picture, display, budget, factor, bytes));
  return zoom;
}

using Four = std::tuple<int, int, int, int>;
Four view(const Zoom& z) {
  return {z.viewX, z.viewY, z.viewWidth, z.viewHeight};
}
Four zoomed(const Zoom& z) {
  return {z.zoomedWidth, z.zoomedHeight, z.zoomRatio, z.zoomLevel};
}

TEST(Layout, FitMaximumAndImage) {
  Zoom z = zoom_of({1600, 1200}, {400, 400});
  EXPECT_EQ(Four(400, 300, 100, 0), zoomed(z));
  EXPECT_EQ(Four(0, 0, 400, 300), view(z));
  EXPECT_EQ(Four(1600, 1200, 1600, 1200), Four(z.maxWidth, z.maxHeight, z.imageWidth, z.imageHeight));
  EXPECT_EQ(40, z.zoomStep);

  z = zoom_of({30, 20}, {400, 300}, kPlenty, 3);  // smaller than the display; enlarged three times
  EXPECT_EQ(Four(30, 20, 100, 0), zoomed(z));
  EXPECT_EQ(Four(90, 60, 30, 20), Four(z.maxWidth, z.maxHeight, z.imageWidth, z.imageHeight));

  z = zoom_of({1, 5000}, {10, 10});
  EXPECT_EQ(Four(1, 10, 100, 0), zoomed(z));

  // A quarter of the bytes: half the size, rounded up.
  z = zoom_of({1601, 1200}, {400, 300}, kDecoderBytes + 1601 * 1200 * 2 / 4, 1);
  EXPECT_EQ(Four(801, 600, 801, 600), Four(z.maxWidth, z.maxHeight, z.imageWidth, z.imageHeight));
}

TEST(Layout, BudgetsTooSmallAndFactorsTooLarge) {
  Zoom z{};
  EXPECT_FALSE(lay_out(z, {100, 100}, {10, 10}, kDecoderBytes, 1, 2));
  EXPECT_FALSE(lay_out(z, {100, 100}, {10, 10}, INT_MIN, 1, 2));
  EXPECT_FALSE(lay_out(z, {5000, 5000}, {10, 10}, INT_MAX, INT_MAX, 3));
  EXPECT_TRUE(lay_out(z, {100, 100}, {10, 10}, kPlenty, 0, 2));
  EXPECT_EQ(1, z.maxWidth);
  // Need 64 times the budget and beyond: roots of sixteenths, halved.
  EXPECT_TRUE(lay_out(z, {1000, 1000}, {10, 10}, kDecoderBytes + 1000000 * 2 / 100, 1, 2));
  EXPECT_EQ(99, z.maxWidth);  // ceil((floor(64 * sqrt(10)) >> 1) * 1000 / 1024) = ceil(98.6...)
}

TEST(Layout, Rotation) {
  const Size wide{40, 30}, tall{30, 40}, square{30, 30};
  const struct {
    uint32_t option;
    Size picture, display;
    uint32_t rotation;
  } cases[] = {{0xF, wide, tall, 0},  // the decoder's own rotation does not count
               {0x10, wide, wide, 4}, {0x20, wide, wide, 8},  {0x30, tall, wide, 12},
               {0x50, wide, tall, 4}, {0x70, tall, wide, 12}, {0x50, wide, square, 4},
               {0x50, wide, wide, 0}, {0x70, tall, tall, 0},  {0x50, square, wide, 0}};
  for (const auto& c : cases) EXPECT_EQ(c.rotation, zoom_rotation(c.option, c.picture, c.display));
}

TEST(Views, ByHand) {
  const Size display{400, 300};
  Zoom z = zoom_of({1600, 1200}, display);
  EXPECT_EQ(1, zoom_in(z, display));  // 2 * 40 pixels wider
  EXPECT_EQ(Four(480, 360, 120, 1), zoomed(z));
  EXPECT_EQ(Four(40, 30, 400, 300), view(z));
  EXPECT_EQ(1, move_view(z, kMove, 0));
  EXPECT_EQ(Four(70, 30, 400, 300), view(z));
  EXPECT_EQ(2, move_view(z, kMove, kMove));  // right edge at 80
  EXPECT_EQ(Four(80, 60, 400, 300), view(z));
  EXPECT_EQ(2, zoom_out(z, display));
  EXPECT_EQ(Four(400, 300, 100, 1), zoomed(z));
  EXPECT_EQ(Four(0, 0, 400, 300), view(z));

  EXPECT_EQ(1, zoom_to_ratio(z, display, 250));
  EXPECT_EQ(Four(1000, 750, 250, 0), zoomed(z));
  EXPECT_EQ(Four(300, 225, 400, 300), view(z));
  EXPECT_EQ(1, zoom_to_ratio(z, display, 1000));
  EXPECT_EQ(Four(1600, 1200, 400, 20), zoomed(z));
  EXPECT_EQ(Four(600, 450, 400, 300), view(z));
  EXPECT_EQ(2, zoom_to_ratio(z, display, -7));
  EXPECT_EQ(Four(400, 300, 100, 1), zoomed(z));

  jump(z, display, 3, 50, 5000);
  EXPECT_EQ(Four(640, 480, 160, 3), zoomed(z));
  EXPECT_EQ(Four(50, 180, 400, 300), view(z));
}

TEST(Views, MovesStopAtTheEdges) {
  const Size display{100, 100};
  Zoom z = zoom_of({1000, 1000}, display);
  jump(z, display, 10, 20, 40);  // 300 x 300
  EXPECT_EQ(2, move_view(z, -kMove, 0));
  EXPECT_EQ(Four(0, 40, 100, 100), view(z));
  place_view(z, 31, 30);
  EXPECT_EQ(2, move_view(z, 0, -kMove));  // exactly at the edge
  EXPECT_EQ(1, move_view(z, 0, kMove));   // the other axis is not judged
  EXPECT_EQ(1, refresh_view(z, 1, 199));
  EXPECT_EQ(2, refresh_view(z, 200, 50));
  EXPECT_EQ(2, refresh_view(z, int64_t{INT_MAX} * 2, 50));
  EXPECT_EQ(Four(200, 50, 100, 100), view(z));
  EXPECT_EQ(kMove, z.mapStepX);
}

TEST(Views, MaximaBelowTheFittedSize) {
  const Size display{400, 300};
  Zoom z = zoom_of({400, 300}, display, kDecoderBytes + 400 * 300 * 2 / 4);
  EXPECT_EQ(Four(200, 150, 200, 150), Four(z.maxWidth, z.maxHeight, z.imageWidth, z.imageHeight));
  EXPECT_EQ(0, max_level(z));
  EXPECT_EQ(50, max_ratio(z));
  for (const int result : {zoom_in(z, display), zoom_out(z, display), zoom_to_ratio(z, display, 300)}) {
    EXPECT_EQ(2, result);
    EXPECT_EQ(Four(0, 0, 400, 300), view(z));
  }
}

TEST(Views, MemoryRequirement) {
  EXPECT_EQ(100 * 76 * 3 + 0x30000, memory_requirement({1601, 1202}, 100, 3));  // 75.07 rows
  EXPECT_EQ(3 + 0x30000, memory_requirement({5000, 5000}, -5, 3));
}

// ---- any sequence of operations ----

void expect_sound(const Zoom& z, Size display) {
  const Size most = largest_zoomed(z);
  ASSERT_TRUE(z.minWidth >= 1 && z.minWidth <= z.zoomedWidth && z.zoomedWidth <= most.width);
  ASSERT_TRUE(z.minHeight >= 1 && z.minHeight <= z.zoomedHeight && z.zoomedHeight <= most.height);
  ASSERT_TRUE(z.viewWidth >= 1 && z.viewX >= 0 && z.viewX <= z.zoomedWidth - z.viewWidth);
  ASSERT_TRUE(z.viewHeight >= 1 && z.viewY >= 0 && z.viewY <= z.zoomedHeight - z.viewHeight);
  ASSERT_GE(z.zoomRatio, 100);
  for (const Size shown : {Size{z.viewWidth, z.viewHeight}, Size{1, 1}}) {
    const Area r = visible_region(z, shown);
    ASSERT_TRUE(r.x >= 0 && r.width >= 1 && r.x + r.width <= z.imageWidth);
    ASSERT_TRUE(r.y >= 0 && r.height >= 1 && r.y + r.height <= z.imageHeight);
  }
  const Area a = view_in_map(z, display);
  ASSERT_TRUE(a.x >= 0 && a.x < display.width && a.y >= 0 && a.y < display.height && a.width >= 1);
}

class RandomZoom {
 public:
  explicit RandomZoom(uint32_t seed) : random_(seed) {}

  void run() {
    const Size picture{side(5000), side(5000)};
    display_ = {side(1200), side(1200)};
    const int factor = random_() % 8 ? side(4) : extreme();
    const int64_t budget = random_() % 4 ? kDecoderBytes + side(20'000'000) : INT_MAX;
    if (!lay_out(zoom_, picture, display_, budget, factor, 2 + side(2) - 1)) return;
    ASSERT_LE(zoom_.imageWidth, picture.width);
    ASSERT_LE(zoom_.imageHeight, picture.height);
    if (random_() % 4 == 0) zoom_.zoomScale = random_() % 2 ? side(9) : INT_MAX;
    if (max_level(zoom_) < 500) climb();
    for (int n = 0; n < 60; ++n) {
      expect_sound(zoom_, display_);
      if (::testing::Test::HasFatalFailure()) return;
      if (random_() % 20 == 0) display_ = {side(1200), side(1200)};
      const int result = step();
      ASSERT_TRUE(result == 1 || result == 2);
    }
  }

 private:
  int side(int most) {  // small ones often
    return 1 +
           static_cast<int>(random_() % static_cast<uint32_t>(random_() % 3 ? most : std::min(most, 8)));
  }
  int extreme() {
    constexpr int kExtremes[] = {INT_MIN, INT_MAX, -1, 0, 1, 100000};
    return kExtremes[random_() % std::size(kExtremes)];
  }
  int any() { return random_() % 5 ? static_cast<int>(random_() % 8000) - 2000 : extreme(); }

  // The maximum level is the number of steps to the maximum.
  void climb() {
    const int levels = max_level(zoom_);
    for (int i = 1; i <= levels; ++i) ASSERT_EQ(i == levels ? 2 : 1, zoom_in(zoom_, display_));
    if (levels == 0) return;
    EXPECT_EQ(Four(zoom_.maxWidth, zoom_.maxHeight, max_ratio(zoom_), 20), zoomed(zoom_));
  }

  int step() {
    Position source;
    switch (random_() % 8) {
      case 0:
      case 1:
        return zoom_in(zoom_, display_);
      case 2:
        return zoom_out(zoom_, display_);
      case 3:
        return zoom_to_ratio(zoom_, display_, any());
      case 4:
        return move_view(zoom_, any() % 31, any() % 31);
      case 5:
        return refresh_view(zoom_, int64_t{zoom_.viewX} + any(), int64_t{zoom_.viewY} + any());
      case 6: {
        const Position at = from_map(zoom_, display_, any(), any(), source);
        return refresh_view(zoom_, at.x, at.y);
      }
      default:
        jump(zoom_, display_, any(), any(), any());
        return 1;
    }
  }

  std::mt19937 random_;
  Zoom zoom_{};
  Size display_{};
};

TEST(Views, AnySequenceKeepsTheViewInsideThePicture) {
  for (uint32_t seed = 0; seed < 3000; ++seed) {
    RandomZoom(seed).run();
    if (HasFatalFailure()) FAIL() << "seed " << seed;
  }
}

}  // namespace
}  // namespace tests

// Zooms over real pictures: what the display shows, results and errors of every operation.
#include <gmock/gmock.h>

#include <climits>
#include <functional>
#include <random>

#include "platform/fault_injection.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

constexpr int kBudget = 8 << 20;

// A zoom over a picture, with its display.
class Zooming {
 public:
  Zooming(int pictureWidth, int pictureHeight, int format, uint32_t option = 0)
      : jpeg_(sample_jpeg(pictureWidth, pictureHeight)),
        object(open_memory(jpeg_, format, option)),
        format_(format) {}

  int start(int displayWidth, int displayHeight, int budget = kBudget, int factor = 1,
            bool withZoomedImage = false) {
    resize(displayWidth, displayHeight);
    const auto starter = withZoomedImage ? TAVIRPELO_StartZoomWithZoomImage : TAVIRPELO_StartZoom;
    return starter(info(), nullptr, 0, 0, display(), width, height, background, budget, factor, -1);
  }
  void resize(int displayWidth, int displayHeight) {
    width = displayWidth;
    height = displayHeight;
    pixels_ = std::make_unique<GuardedPixels>(width, height, format_, 0x5A);
  }
  int control(int code) { return TAVIRPELO_ControlZoom(info(), display(), width, height, code); }

  TAVIRPELO_DECINFO* info() { return object.get(); }
  uint8_t* display() { return pixels_->data(); }
  Bytes content() { return pixels_->content(); }
  const TAVIRPELO_ZOOMINFO& state() { return *object->pZoomInfo; }

  // What the display must hold: the view's part of the zoom image, scaled, centred on the background.
  Bytes expected(bool fast = false) {
    const TAVIRPELO_ZOOMINFO& z = state();
    const size_t bytes = format_ == TAVIRPELO_RGB565 ? 2 : 3;
    Bytes out;
    for (int i = 0; i < width * height; ++i) {
      for (size_t b = 0; b < bytes; ++b) {
        out.push_back(background >> 8 * (bytes == 3 ? 2 - b : b) & 0xFF);
      }
    }
    const int w = std::min(z.viewWidth, width), h = std::min(z.viewHeight, height);
    const auto part = [](int64_t n, int64_t of, int64_t from) {
      return static_cast<int>(n * of / from);
    };
    const auto part_up = [](int64_t n, int64_t of, int64_t from) {
      return static_cast<int>((n * of + from - 1) / from);
    };
    const int x = part(z.viewX, z.imageWidth, z.zoomedWidth),
              y = part(z.viewY, z.imageHeight, z.zoomedHeight);
    const int inWidth = std::min(part_up(w, z.imageWidth, z.zoomedWidth), z.imageWidth - x);
    const int inHeight = std::min(part_up(h, z.imageHeight, z.zoomedHeight), z.imageHeight - y);
    const auto scaler = bytes == 3 ? PELO_RGB888Scale_ex : fast ? PELO_FastScale_ex : PELO_Scale_ex;
    scaler(static_cast<const uint8_t*>(z.pZoomImage) + static_cast<size_t>(y * z.imageWidth + x) * bytes,
           inWidth, inHeight, z.imageWidth,
           out.data() + static_cast<size_t>((height - h) / 2 * width + (width - w) / 2) * bytes, w, h,
           width);
    return out;
  }

 private:
  Bytes jpeg_;
  std::unique_ptr<GuardedPixels> pixels_;

 public:
  DecInfo object;
  int width = 0, height = 0;
  uint32_t background = 0x345678;

 private:
  int format_;
};

int status(TAVIRPELO_DECINFO* info, int which) {
  int values[3] = {-1, -1, -1};
  TAVIRPELO_GetZoomStatus(info, &values[0], &values[1], &values[2]);
  return values[which];
}

TEST(Zoom, ViewsOfBothFormats) {
  std::mt19937 random(11);
  const auto pick = [&](int most) { return static_cast<int>(random() % static_cast<uint32_t>(most)); };
  for (int n = 0; n < 60; ++n) {
    const int format = n % 2;
    Zooming zoom(1 + pick(200), 1 + pick(200), format);
    constexpr uint32_t kBackgrounds[] = {0x345678, 0, 0xABFFFF, 0xFFFFFF, 0x12345678};
    zoom.background = kBackgrounds[n % 5];
    const int budget = n % 3 ? kBudget : 0x30000 + 5000 + pick(40000);
    ASSERT_EQ(1, zoom.start(1 + pick(90), 1 + pick(90), budget, 1 + pick(3)));
    ASSERT_EQ(zoom.expected(), zoom.content());
    for (int step = 0; step < 40; ++step) {
      if (pick(8) == 0) zoom.resize(1 + pick(120), 1 + pick(120));  // also below the view's size
      TAVIRPELO_DECINFO* info = zoom.info();
      uint8_t* display = zoom.display();
      const int x = pick(400) - 60, y = pick(400) - 60, w = zoom.width, h = zoom.height;
      const int target[3] = {pick(12) - 2, x, y}, map[2] = {1 + pick(80), 1 + pick(80)};
      const std::function<int()> operations[] = {
          [&] { return TAVIRPELO_FastZoomRatio(info, display, w, h, 5 * y); },
          [&] { return TAVIRPELO_FastPanPosition(info, display, w, h, x, y); },
          [&] { return TAVIRPELO_ZoomRatio(info, display, w, h, 5 * x); },
          [&] { return TAVIRPELO_PanPosition(info, display, w, h, x, y); },
          [&] { return TAVIRPELO_JumpZoom(info, display, w, h, target); },
          [&] { return TAVIRPELO_SetDisplayOnPosition(info, display, 0, w, h, x, y); },
          [&] { return TAVIRPELO_SetMapOnPosition(info, display, map, w, h, x, y); },
          [&] { return zoom.control(pick(11)); },
          [&] { return zoom.control(pick(11)); }};
      const int which = pick(9), result = operations[which]();
      const bool fast = which < 2;
      ASSERT_TRUE(result == 1 || result == 2);
      ASSERT_EQ(zoom.expected(fast), zoom.content());
    }
    EXPECT_EQ(1, TAVIRPELO_StopZoom(zoom.info()));
  }
}

TEST(Zoom, TheZoomImageIsTheDecodedPictureTurned) {
  for (const uint32_t turn : {0u, 0x10u, 0x20u, 0x30u}) {
    // The object's own rotation and fitting are set aside while zooming.
    Zooming zoom(64, 48, TAVIRPELO_RGB888, turn | 0x704 | TAVIRPELO_THUMBNAIL_NEVER);
    ASSERT_EQ(1, zoom.start(40, 40));
    const int w = zoom.state().imageWidth, h = zoom.state().imageHeight;
    EXPECT_EQ(turn & 0x10 ? 64 : 48, h);
    EXPECT_EQ(turn >> 2, zoom.info()->option);
    Bytes jpeg = sample_jpeg(64, 48), whole(64 * 48 * 3);
    DecInfo other = open_memory(jpeg, TAVIRPELO_RGB888, turn >> 2);
    ASSERT_EQ(1, TAVIRPELO_DecodeJPEG(other.get(), whole.data(), w, h));
    const auto* image = static_cast<const uint8_t*>(TAVIRPELO_GetZoomBuffer(zoom.info()));
    EXPECT_EQ(whole, Bytes(image, image + whole.size()));
    EXPECT_EQ(1, TAVIRPELO_StopZoom(zoom.info()));
    EXPECT_EQ(turn | 0x705, zoom.info()->option);
    EXPECT_EQ(TAVIRPELO_CheckFn, zoom.info()->CheckFn);
  }
}

TEST(Zoom, ControlsStatusAndMaps) {
  Zooming zoom(400, 300, TAVIRPELO_RGB565);
  ASSERT_EQ(1, zoom.start(100, 100));
  TAVIRPELO_DECINFO* info = zoom.info();
  int level = 0, ratio = 0;
  EXPECT_EQ(2, TAVIRPELO_GetMaxZoomLevel(info, &level) + TAVIRPELO_GetMaxZoomRatio(info, &ratio));
  EXPECT_EQ(15, level);  // 300 pixels in steps of twice 10
  EXPECT_EQ(400, ratio);
  for (int i = 1; i <= level; ++i) EXPECT_EQ(i == level ? 2 : 1, zoom.control(TAVIRPELO_ZOOM_IN));
  EXPECT_EQ(400, status(info, 2));
  const int moves[][3] = {{TAVIRPELO_ZOOM_UP, 0, -30},        {TAVIRPELO_ZOOM_LEFT, -30, 0},
                          {TAVIRPELO_ZOOM_DOWN, 0, 30},       {TAVIRPELO_ZOOM_RIGHT, 30, 0},
                          {TAVIRPELO_ZOOM_UP_LEFT, -30, -30}, {TAVIRPELO_ZOOM_DOWN_RIGHT, 30, 30},
                          {TAVIRPELO_ZOOM_UP_RIGHT, 30, -30}, {TAVIRPELO_ZOOM_DOWN_LEFT, -30, 30}};
  for (const auto& move : moves) {
    const int x = status(info, 0), y = status(info, 1);
    EXPECT_EQ(1, zoom.control(move[0]));
    EXPECT_EQ(x + move[1], status(info, 0));
    EXPECT_EQ(y + move[2], status(info, 1));
  }
  TAVIRPELO_PanPosition(info, zoom.display(), 100, 100, 20, 60);
  EXPECT_EQ(2, zoom.control(TAVIRPELO_ZOOM_LEFT));
  EXPECT_EQ(2, zoom.control(TAVIRPELO_ZOOM_REFRESH));
  for (const int code : {11, -1, INT_MAX, INT_MIN}) {
    EXPECT_EQ(0, zoom.control(code));
    EXPECT_EQ(TAVIRPELO_ERROR_ZOOM_CONTROL, gTAVIRPELO_Error);
  }
  EXPECT_EQ(1, TAVIRPELO_GetZoomStatus(info, nullptr, nullptr, nullptr));
  EXPECT_EQ(1, TAVIRPELO_SetZoomScale(info, 0) + TAVIRPELO_SetZoomScale(info, 3));
  EXPECT_EQ(1, zoom.control(TAVIRPELO_ZOOM_OUT));
  EXPECT_EQ(340, status(info, 2));

  // Maps.
  ASSERT_EQ(1, TAVIRPELO_ZoomRatio(info, zoom.display(), 100, 100, 400));
  const int map[2] = {80, 60};
  EXPECT_EQ(1, TAVIRPELO_SetMapOnPosition(info, zoom.display(), map, 100, 100, 40, 20));
  EXPECT_EQ(150, status(info, 0));  // 200 - 50
  EXPECT_EQ(50, status(info, 1));   // 100 - 50
  int area[6] = {};
  EXPECT_EQ(1, TAVIRPELO_GetMapOnArea(info, 100, 60, area));
  EXPECT_THAT(area, testing::ElementsAre(100, 60, 10 + 30, 10, 20, 20));
  EXPECT_EQ(2, TAVIRPELO_SetDisplayOnPosition(info, zoom.display(), 7, 100, 100, INT_MIN, 3));
  EXPECT_EQ(53, status(info, 1));
  const int noMap[2] = {80, 0};
  EXPECT_EQ(0, TAVIRPELO_SetMapOnPosition(info, zoom.display(), noMap, 100, 100, 40, 20));
  EXPECT_EQ(TAVIRPELO_ERROR_NULL, gTAVIRPELO_Error);
}

TEST(Zoom, ZoomedImageIsPannedWithoutScaling) {
  for (const int format : {TAVIRPELO_RGB565, TAVIRPELO_RGB888}) {
    Zooming zoom(120, 90, format);
    ASSERT_EQ(1, zoom.start(50, 50, kBudget, 2, true));
    TAVIRPELO_DECINFO* info = zoom.info();
    for (const int ratio : {100, 260, 480}) {
      TAVIRPELO_ZoomRatio(info, zoom.display(), 50, 50, ratio);
      EXPECT_EQ(0, TAVIRPELO_PanWithZoomImage(info, zoom.display(), 50, 50, 0, 0));  // none of the size
      ASSERT_EQ(1, TAVIRPELO_MakeZoomImageHighQuality(info));
      ASSERT_EQ(1, TAVIRPELO_PanWithZoomImage(info, zoom.display(), 50, 50, 13, 1000));
      const TAVIRPELO_ZOOMINFO& z = zoom.state();
      const Bytes shown = zoom.content();
      const int bytes = format == TAVIRPELO_RGB565 ? 2 : 3, top = (50 - z.viewHeight) / 2;
      const auto scaler = bytes == 3 ? PELO_RGB888Scale_ex : PELO_Scale_ex;
      Bytes whole(static_cast<size_t>(z.zoomedWidth * z.zoomedHeight * bytes));
      scaler(z.pZoomImage, z.imageWidth, z.imageHeight, z.imageWidth, whole.data(), z.zoomedWidth,
             z.zoomedHeight, z.zoomedWidth);
      for (int y = 0; y < z.viewHeight; ++y) {
        const auto from = whole.begin() + ((z.viewY + y) * z.zoomedWidth + z.viewX) * bytes;
        ASSERT_TRUE(
            std::equal(from, from + z.viewWidth * bytes, shown.begin() + (top + y) * 50 * bytes));
      }
    }
    // A smaller display gets the corner, a larger one the whole view on the background.
    for (const int side : {20, 70}) {
      zoom.resize(side, side - 10);
      EXPECT_EQ(1, TAVIRPELO_PanWithZoomImage(info, zoom.display(), side, side - 10, 200, 5));
    }
    EXPECT_EQ(2, TAVIRPELO_MakeZoomImageLowQuality(info) + TAVIRPELO_MakeZoomImageMediumQuality(info));
  }
  Zooming without(120, 90, TAVIRPELO_RGB565);
  ASSERT_EQ(1, without.start(50, 50));
  EXPECT_EQ(0, TAVIRPELO_PanWithZoomImage(without.info(), without.display(), 50, 50, 0, 0));
}

// A maximum below the fitted size must not make the second buffer too small.
TEST(Zoom, ZoomedImageOfATightBudget) {
  Zooming zoom(200, 150, TAVIRPELO_RGB565);
  ASSERT_EQ(1, zoom.start(180, 180, 2 * (0x30000 + 200 * 150 * 2 / 16), 1, true));
  EXPECT_EQ(50, zoom.state().maxWidth);
  EXPECT_EQ(180, zoom.state().zoomedWidth);
  EXPECT_EQ(1, TAVIRPELO_MakeZoomImageHighQuality(zoom.info()));
  EXPECT_EQ(1, TAVIRPELO_PanWithZoomImage(zoom.info(), zoom.display(), 180, 180, 9, 9));
}

TEST(Zoom, MemoryRequirement) {
  Zooming zoom(400, 300, TAVIRPELO_RGB888);
  // 60 + 40 * 6
  EXPECT_EQ(300 * 225 * 3 + 0x30000, TAVIRPELO_GetZoomMemRequirement(zoom.info(), 60, 10));
  ASSERT_EQ(1, zoom.start(30, 30));
  EXPECT_EQ(180 * 135 * 3 + 0x30000, TAVIRPELO_GetZoomMemRequirement(zoom.info(), 60, 10));
  Bytes noJpeg(300, 7);
  EXPECT_EQ(-1, TAVIRPELO_GetZoomMemRequirement(open_memory(noJpeg, 0).get(), 60, 10));
  TAVIRPELO_ZOOMINFO sizes{};
  PELO_CheckInvalidSize(&sizes);
  EXPECT_EQ(1, sizes.imageHeight);
}

// A start that must fail, and leave the object as it was.
void expect_refused(TAVIRPELO_DECINFO* info, void* display, int budget, int error) {
  const TAVIRPELO_DECINFO before = *info;
  for (const auto starter : {TAVIRPELO_StartZoom, TAVIRPELO_StartZoomWithZoomImage}) {
    EXPECT_EQ(0, starter(info, nullptr, 0, 0, display, 8, 8, 0, budget, 1, -1));
    EXPECT_EQ(error, gTAVIRPELO_Error);
    EXPECT_EQ(before.option, info->option);
    EXPECT_EQ(before.CheckFn, info->CheckFn);
    EXPECT_EQ(before.pZoomInfo, info->pZoomInfo);
  }
}

TEST(Zoom, FailedStartsLeaveTheObject) {
  GuardedPixels display(8, 8, TAVIRPELO_RGB888);
  Bytes jpeg = sample_jpeg(40, 30), noJpeg(300, 7), headerOnly = jpeg;
  for (size_t i = 0; i + 1 < headerOnly.size(); ++i) {  // no Huffman tables: measured, but not decoded
    if (headerOnly[i] == 0xFF && headerOnly[i + 1] == 0xC4) headerOnly[i + 1] = 0xEC;
  }
  const uint32_t option = 0x730;
  EXPECT_EQ(0, TAVIRPELO_StartZoom(nullptr, nullptr, 0, 0, display.data(), 8, 8, 0, kBudget, 1, -1));
  expect_refused(open_memory(jpeg, TAVIRPELO_ARGB8888, option).get(), display.data(), kBudget, 0);
  expect_refused(open_memory(noJpeg, TAVIRPELO_RGB888, option).get(), display.data(), kBudget, 0);
  expect_refused(open_memory(headerOnly, TAVIRPELO_RGB888, option).get(), display.data(), kBudget, 2);
  DecInfo info = open_memory(jpeg, TAVIRPELO_RGB888, option);
  expect_refused(info.get(), nullptr, kBudget, TAVIRPELO_ERROR_NULL);
  expect_refused(info.get(), display.data(), 0x30000, TAVIRPELO_ERROR_MEMORY);
  expect_refused(info.get(), display.data(), INT_MIN, TAVIRPELO_ERROR_MEMORY);
  ASSERT_EQ(1, TAVIRPELO_StartZoom(info.get(), nullptr, 0, 0, display.data(), 8, 8, 0, kBudget, 1, -1));
  EXPECT_EQ(TAVIRPELO_ZoomCheckFn, info->CheckFn);
  expect_refused(info.get(), display.data(), kBudget, TAVIRPELO_ERROR_ZOOM_PRESENT);
  EXPECT_EQ(1, TAVIRPELO_StopZoom(info.get()));
}

TEST(Zoom, MemoryRunsOutAtEveryAllocation) {
  Bytes jpeg = sample_jpeg(40, 30);
  GuardedPixels display(16, 16, TAVIRPELO_RGB565);
  bool started = false;
  for (long k = 1; !started && k < 500; ++k) {
    DecInfo info = open_memory(jpeg, TAVIRPELO_RGB565, 0x730);
    pelo::faults::allocations.arm(k);
    const int result = TAVIRPELO_StartZoomWithZoomImage(info.get(), nullptr, 0, 0, display.data(), 16,
                                                        16, 0, kBudget, 1, -1);
    const bool spent = pelo::faults::allocations.calls >= k;
    pelo::faults::allocations.arm(0);
    started = result == 1 && !spent;
    EXPECT_EQ(result, TAVIRPELO_StopZoom(info.get()));
    EXPECT_EQ(nullptr, info->pZoomInfo);
    EXPECT_EQ(0x730u, info->option);
  }
  EXPECT_TRUE(started);
}

TEST(Zoom, NothingWithoutObjectZoomOrDisplay) {
  Bytes jpeg = sample_jpeg(40, 30);
  DecInfo idle = open_memory(jpeg, TAVIRPELO_RGB565, 0x14);
  Zooming active(40, 30, TAVIRPELO_RGB565);
  ASSERT_EQ(1, active.start(16, 16));
  uint8_t pixels[2] = {7, 7};
  int out[6] = {};
  const int target[3] = {1, 2, 3}, map[2] = {4, 4};
  const struct {
    TAVIRPELO_DECINFO* info;
    void* display;
    int side;
  } cases[] = {{nullptr, pixels, 1},
               {idle.get(), pixels, 1},
               {active.info(), nullptr, 9},
               {active.info(), pixels, 0},
               {active.info(), pixels, -1}};
  for (const auto& c : cases) {
    const int results[] = {TAVIRPELO_ControlZoom(c.info, c.display, 1, c.side, 0),
                           TAVIRPELO_ZoomRatio(c.info, c.display, c.side, 1, 120),
                           TAVIRPELO_FastPanPosition(c.info, c.display, 1, c.side, 1, 1),
                           TAVIRPELO_JumpZoom(c.info, c.display, 1, c.side, target),
                           TAVIRPELO_SetDisplayOnPosition(c.info, c.display, 0, 1, c.side, 1, 1),
                           TAVIRPELO_SetMapOnPosition(c.info, c.display, map, 1, c.side, 1, 1),
                           TAVIRPELO_RefreshZoom(c.info, c.display, 1, c.side),
                           TAVIRPELO_PanWithZoomImage(c.info, c.display, 1, c.side, 1, 1)};
    for (const int result : results) EXPECT_EQ(0, result);
    EXPECT_EQ(TAVIRPELO_ERROR_NULL, gTAVIRPELO_Error);
  }
  EXPECT_EQ(7, pixels[0]);
  for (TAVIRPELO_DECINFO* info : {static_cast<TAVIRPELO_DECINFO*>(nullptr), idle.get()}) {
    EXPECT_EQ(nullptr, TAVIRPELO_GetZoomBuffer(info));
    const int results[] = {TAVIRPELO_GetMapOnArea(info, 4, 4, out),
                           TAVIRPELO_GetZoomStatus(info, out, out, out),
                           TAVIRPELO_GetMaxZoomLevel(info, out),
                           TAVIRPELO_GetMaxZoomRatio(info, out),
                           TAVIRPELO_SetZoomScale(info, 2),
                           TAVIRPELO_MakeZoomImageHighQuality(info),
                           TAVIRPELO_StopZoom(info)};
    for (const int result : results) EXPECT_EQ(0, result);
    EXPECT_EQ(TAVIRPELO_ERROR_NULL, gTAVIRPELO_Error);
  }
  EXPECT_EQ(0, TAVIRPELO_JumpZoom(active.info(), active.display(), 16, 16, nullptr));
  EXPECT_EQ(0, PELO_MakeRGB888Display(&active.state(), active.display(), 16, 16));  // the other format
}

// Without tasks the preview stays the zoom image, and the decode has not begun.
TEST(Zoom, PreviewStandsInForThePicture) {
  Bytes jpeg = sample_jpeg(60, 40);
  for (const uint32_t option : {0u, 0x4u, 0x14u}) {
    // The caller's preview shows the picture in its own rotation.
    const int width = 50, height = 70;
    Bytes preview(width * height * 3, 9);
    DecInfo info = open_memory(jpeg, TAVIRPELO_RGB888, option);
    ASSERT_EQ(1, TAVIRPELO_DecodeJPEG(info.get(), preview.data(), width, height));
    GuardedPixels display(30, 30, TAVIRPELO_RGB888);
    ASSERT_EQ(1, TAVIRPELO_StartZoom(info.get(), preview.data(), width, height, display.data(), 30, 30,
                                     0, kBudget, 1, 0));
    const TAVIRPELO_ZOOMINFO& z = *info->pZoomInfo;
    const bool turned = (option & 4) != 0;
    const int partWidth = turned ? 40 : 50, partHeight = turned ? 60 : 33;
    EXPECT_EQ(turned, z.previewFlag);
    EXPECT_EQ(TAVIRPELO_ZOOM_NOT_STARTED, z.decodeState);
    Bytes image(60 * 40 * 3);
    const int first = (height - partHeight) / 2 * width + (width - partWidth) / 2;
    PELO_RGB888Scale_ex(preview.data() + 3 * first, partWidth, partHeight, width, image.data(),
                        z.imageWidth, z.imageHeight, z.imageWidth);
    const auto* held = static_cast<const uint8_t*>(z.pZoomImage);
    EXPECT_EQ(image, Bytes(held, held + image.size()));
    EXPECT_EQ(1, TAVIRPELO_RefreshZoom(info.get(), display.data(), 30, 30));
    EXPECT_EQ(1, TAVIRPELO_StopZoom(info.get()));
  }
}

}  // namespace
}  // namespace tests

// Formats, rotations, fittings and modes of a decode, against the upright RGB888 picture.
#include "tests/support/exif_builder.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

Decode run(Bytes jpeg, int width, int height, int format, uint32_t option, int mode = 0) {
  const DecInfo info = open_memory(jpeg, format, option);
  TAVIRPELO_SetDecMode(info.get(), mode);
  return decode(TAVIRPELO_DecodeJPEG, info.get(), width, height);
}

// An upright picture to compare with.
struct Upright {
  int width, height;
  Bytes rgb;
  Upright(const Bytes& jpeg, int w, int h, uint32_t fit = TAVIRPELO_FIT_INSIDE)
      : width(w), height(h), rgb(run(jpeg, w, h, TAVIRPELO_RGB888, fit).pixels) {}
  Rgba at(int x, int y) const {
    const uint8_t* p = &rgb[static_cast<size_t>(3 * (y * width + x))];
    return {p[0], p[1], p[2]};
  }
  Bytes as(const Placement& place, int format) const {
    return placed(place, format, [&](int x, int y) { return pixel_bytes(at(x, y), format); });
  }
};

TEST(Formats, StoreTheSamePixels) {
  const Bytes jpeg = sample_jpeg(121, 83);
  const Size size{121, 83};
  const Upright up(jpeg, 121, 83);
  for (const int format : {0, 5, 7, 8})
    EXPECT_EQ(up.as(centred(size, size), format), run(jpeg, 121, 83, format, 0).pixels) << format;
  const Bytes dithered = run(jpeg, 121, 83, TAVIRPELO_RGB565_DITHER, 0).pixels;
  for (int i = 0; i < 121 * 83; ++i) {
    const int pixel = dithered[2 * i] | dithered[2 * i + 1] << 8, r = up.rgb[3 * i];
    ASSERT_EQ(0, pixel & 0x20);
    ASSERT_TRUE(pixel >> 11 >= r >> 3 && pixel >> 11 <= (std::min(r + 15, 255) >> 3));
  }
}

TEST(Formats, PlanarHoldsEvenSamplesAndNeutralGrey) {
  for (const bool grey : {false, true}) {
    const Bytes jpeg = sample_jpeg(33, 21, grey);
    const Bytes planar = run(jpeg, 33, 21, TAVIRPELO_YUV420, TAVIRPELO_ROTATE_90).pixels;
    const Upright up(jpeg, 33, 21);
    for (int y = 0; y < 21; ++y) {
      for (int x = 0; x < 33; ++x) {
        const int c = 33 * 21 + y / 2 * 17 + x / 2;
        const int luma = planar[y * 33 + x], u = planar[c] - 128, v = planar[c + 17 * 11] - 128;
        if (grey) ASSERT_TRUE(u == 0 && v == 0);
        ASSERT_EQ(std::clamp(luma + (v * 91881 >> 16), 0, 255), up.at(x, y).r);
        ASSERT_EQ(std::clamp(luma + (u * 116130 >> 16), 0, 255), up.at(x, y).b);
      }
    }
  }
  // A code that nobody writes leaves the buffer alone.
  Bytes jpeg = sample_jpeg(16, 16), out(16 * 16 * 4, kFill);
  EXPECT_EQ(1, TAVIRPELO_DecodeJPEG(open_memory(jpeg, 3).get(), out.data(), 16, 16));
  EXPECT_EQ(Bytes(out.size(), kFill), out);
}

// Every fitting: the size that is produced, and exactly the box's pixels of it.
TEST(Fitting, ProducesPlacesAndTurns) {
  struct {
    Size picture, box;
    uint32_t fit;
    Size out;
  } const cases[] = {{{100, 50}, {400, 400}, TAVIRPELO_FIT_INSIDE, {100, 50}},
                     {{100, 50}, {120, 90}, TAVIRPELO_FIT_INSIDE, {100, 50}},
                     {{97, 61}, {97, 61}, TAVIRPELO_FIT_TIGHT, {97, 61}},
                     {{1000, 1000}, {400, 400}, TAVIRPELO_FIT_INSIDE, {400, 400}},
                     {{200, 100}, {50, 50}, TAVIRPELO_FIT_INSIDE, {50, 25}},
                     {{200, 100}, {50, 50}, TAVIRPELO_FIT_FILL, {100, 50}},
                     {{200, 100}, {50, 50}, TAVIRPELO_FIT_STRETCH, {50, 50}},
                     {{20, 10}, {300, 70}, TAVIRPELO_FIT_STRETCH, {300, 70}},
                     {{200, 100}, {50, 80}, TAVIRPELO_FIT_TIGHT, {50, 25}},
                     {{1600, 800}, {300, 300}, TAVIRPELO_FIT_FILL, {600, 300}},
                     {{1000, 3}, {30, 30}, TAVIRPELO_FIT_INSIDE, {30, 1}},
                     {{101, 67}, {33, 80}, TAVIRPELO_FIT_FILL, {101, 67}}};
  for (const auto& c : cases) {
    const Bytes jpeg = sample_jpeg(c.picture.width, c.picture.height);
    const uint32_t fit = c.fit == TAVIRPELO_FIT_STRETCH ? c.fit : 0;
    const Upright up(jpeg, c.out.width, c.out.height, fit);
    for (uint32_t turn = 0; turn < 4; ++turn) {
      const Size box = turn % 2 ? Size{c.box.height, c.box.width} : c.box;
      const Decode got = run(jpeg, box.width, box.height, TAVIRPELO_RGB888, c.fit | turn << 2);
      EXPECT_EQ(1, got.answer);
      EXPECT_EQ(c.out.width, got.outWidth) << c.picture.width << " " << turn;
      EXPECT_EQ(c.out.height, got.outHeight) << c.picture.width << " " << turn;
      Placement place = centred(box, c.out, static_cast<int>(turn));
      if (c.fit == TAVIRPELO_FIT_TIGHT) {
        place.box = turn % 2 ? Size{c.out.height, c.out.width} : c.out;
        place.x = place.y = 0;
      }
      const Bytes want = up.as(place, TAVIRPELO_RGB888);
      EXPECT_TRUE(want == prefix(got.pixels, want.size())) << c.picture.width << " " << turn;
    }
    const Decode planar = run(jpeg, c.box.width, c.box.height, TAVIRPELO_YUV420, c.fit);
    EXPECT_EQ(c.out.width, planar.outWidth);
    EXPECT_EQ(c.out.height, planar.outHeight);
  }
}

// Every mode, scale and fitting stays inside the box.
TEST(Fitting, RandomRequestsStayInsideTheBox) {
  std::mt19937 random(7);
  const auto below = [&](uint32_t n) { return static_cast<int>(random() % n); };
  for (int i = 0; i < 400; ++i) {
    const Bytes jpeg = sample_jpeg(1 + below(60), 1 + below(60), below(4) == 0);
    const uint32_t option = std::array{0, 0x100, 0x300, 0x700}[random() % 4] | below(4) << 2;
    const int format = std::array{0, 1, 2, 5, 8, 9}[random() % 6];
    EXPECT_EQ(1, run(jpeg, 1 + below(90), 1 + below(90), format, option, below(5)).answer);
  }
}

TEST(Modes, CoarserModesEnlarge) {
  const Bytes jpeg = sample_jpeg(320, 240);
  const Bytes exact = run(jpeg, 320, 240, TAVIRPELO_RGB888, 0).pixels;
  Bytes last;
  for (int mode = 1; mode <= 4; ++mode) {
    const Decode got = run(jpeg, 320, 240, TAVIRPELO_RGB888, 0, mode);
    EXPECT_EQ(1, got.answer);
    EXPECT_EQ(320, got.outWidth);
    EXPECT_GT(psnr(got.pixels, exact), mode == 1 ? 20 : 10) << mode;
    EXPECT_NE(last, got.pixels);
    last = got.pixels;
  }
}

// A JPEG inside an APP1 directory serves requests that it covers.
TEST(Thumbnails, ServeSmallRequests) {
  Bytes plain = sample_jpeg(400, 300);
  ExifBuilder exif(false);
  Bytes jpeg = exif.shorts(Ifd::k1, 259, {6}).thumbnail(sample_jpeg(64, 48, true)).jpeg(plain);
  const auto is_grey = [&](int width, int height, uint32_t option) {
    const Bytes pixels = run(jpeg, width, height, 1, option).pixels;
    const uint8_t* middle = &pixels[static_cast<size_t>(3 * (height / 2 * width + width / 2 + 1))];
    return middle[0] == middle[1] && middle[0] == middle[2];
  };
  EXPECT_TRUE(is_grey(64, 48, TAVIRPELO_THUMBNAIL_IF_ENOUGH));
  EXPECT_FALSE(is_grey(65, 48, TAVIRPELO_THUMBNAIL_IF_ENOUGH));
  EXPECT_FALSE(is_grey(64, 48, TAVIRPELO_THUMBNAIL_NEVER));
  EXPECT_TRUE(is_grey(300, 300, TAVIRPELO_THUMBNAIL_ANY));
  Bytes out(64 * 48 * 3);
  int width = 9, height = 9;
  EXPECT_EQ(1, PELOJ_DecodeThumbnail(open_memory(jpeg, 1).get(), out.data(), 64, 48, &width, &height));
  EXPECT_TRUE(width == 64 && height == 48);
  EXPECT_EQ(0, PELOJ_DecodeThumbnail(open_memory(plain, 1).get(), out.data(), 64, 48, &width, &height));
  EXPECT_EQ(0, width + height);
}

// A failure leaves its reason, whatever the word held; a fallback that succeeds leaves none.
TEST(Thumbnails, BrokenOnesGiveWayToTheMainPicture) {
  ExifBuilder exif(false);
  Bytes broken = frame(64, 48);  // too little to decode
  broken.insert(broken.begin(), {0xFF, 0xD8});
  append(broken, segment(0xDA, {1, 1, 0, 0, 63, 0}));
  Bytes jpeg = exif.shorts(Ifd::k1, 259, {6}).thumbnail(broken).jpeg(sample_jpeg(400, 300));
  Bytes out(64 * 48 * 3);
  for (const uint32_t option : {TAVIRPELO_THUMBNAIL_IF_ENOUGH, TAVIRPELO_THUMBNAIL_ANY}) {
    EXPECT_EQ(1, run(jpeg, 64, 48, 1, option).answer);
    EXPECT_EQ(TAVIRPELO_ERROR_NONE, gTAVIRPELO_Error);
  }
  int width, height;
  gTAVIRPELO_Error = TAVIRPELO_ERROR_MEMORY;
  EXPECT_EQ(0, PELOJ_DecodeThumbnail(open_memory(jpeg, 1).get(), out.data(), 64, 48, &width, &height));
  EXPECT_EQ(TAVIRPELO_ERROR_DECODE, gTAVIRPELO_Error);
}

TEST(RotateBuffer, RoundTrips) {
  for (const int format : {TAVIRPELO_RGB565, TAVIRPELO_RGB888, TAVIRPELO_RGB565_DITHER}) {
    const Bytes before = random_bytes(7 * 5 * 3, 1);
    Bytes buffer = before;
    EXPECT_EQ(1, PELOJ_RotateImage90(buffer.data(), 7, 5, format));
    EXPECT_NE(before, buffer);
    EXPECT_EQ(1, PELOJ_RotateImage270(buffer.data(), 5, 7, format));
    EXPECT_EQ(before, buffer);
  }
  EXPECT_EQ(0, PELOJ_RotateImage90(nullptr, 7, 5, TAVIRPELO_BGRA8888));
}

}  // namespace
}  // namespace tests

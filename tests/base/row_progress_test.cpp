// CheckFn in every decoder but JPEG's: asked before each step of rows, and able to end the decode
// between two. And the reasons that these decoders give for their failures.
#include <cstring>
#include <functional>

#include "tests/support/gif_builder.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/png_builder.h"

namespace tests {
namespace {

using Run = std::function<int(TAVIRPELO_DECINFO*, uint8_t*, int, int)>;

// Calls that go on while they answer 4, in one buffer.
Run repeated(Decoder decoder) {
  return [=](TAVIRPELO_DECINFO* d, uint8_t* out, int width, int height) {
    int answer = 4;
    while (answer == 4) answer = decoder(d, out, width, height);
    return answer;
  };
}
// Calls for three rows each, every one at its rows or, when `whole`, with the whole buffer.
using Lines = int (*)(TAVIRPELO_DECINFO*, void*, int, int, int);
Run by_lines(Lines decoder, bool whole = false) {
  return [=](TAVIRPELO_DECINFO* d, uint8_t* out, int width, int height) {
    int answer, row = 0;
    do {
      answer = decoder(d, out + (whole ? 0 : bytes_of(1, width, row)), width, height,
                       std::min(3, height - row));
      row += 3;
    } while (d->pFormatInfo != nullptr);
    return answer;
  };
}

struct Case {
  const char* name;
  Bytes file;
  Size image;
  Run run;
  Size box;
  size_t steps;
  uint32_t option = 0;
  bool passes = false;  // rows are written several times
};

std::vector<Case> cases() {
  const auto png = [](bool interlaced) {
    return build_png(random_png_image(1, 2, 8, 21, 14, interlaced, false));
  };
  const auto gif = [](bool interlaced) { return sample_gif(30, 20, 6, interlaced).bytes(); };
  GifFile framed = sample_gif(30, 6, 6);
  framed.height = 20;
  framed.images[0].top = 5;
  ByteWriter bmp(false);
  bmp.text("BM").u32(0).u32(0).u32(54).u32(40).u32(12).u32(11).u16(1).u16(24).block(Bytes(24));
  bmp.block(random_bytes(36 * 11, 1));
  const Bytes wbmp = ByteWriter().u16(0).u8(16).u8(9).block(random_bytes(18, 1));
  constexpr uint32_t kStretch = TAVIRPELO_FIT_STRETCH, kGather = 0x1000;
  return {
      {"png", png(false), {21, 14}, TAVIRPELOI_DecodePNG, {21, 14}, 14},
      {"png, enlarged", png(false), {21, 14}, TAVIRPELOI_DecodePNG, {9, 40}, 40, kStretch},
      {"png by lines", png(false), {21, 14}, by_lines(TAVIRPELOI_DecodePNGLine), {21, 14}, 14},
      {"png by blocks", png(false), {21, 14}, repeated(TAVIRPELOI_DecodePNGIter), {21, 14}, 14},
      // Rows of the seven passes: 2 + 2 + 2 + 4 + 3 + 7 + 7.
      {"png, interlaced", png(true), {21, 14}, TAVIRPELOI_DecodePNG, {21, 14}, 27, 0, true},
      {"png, gathered", png(true), {21, 14}, TAVIRPELOI_DecodePNG, {9, 40}, 40, kStretch | kGather},
      {"gif", gif(false), {30, 20}, TAVIRPELOI_DecodeGIF, {30, 20}, 20},
      {"gif, interlaced", gif(true), {30, 20}, TAVIRPELOI_DecodeGIF, {30, 20}, 20},
      {"gif, enlarged", gif(false), {30, 20}, TAVIRPELOI_DecodeGIF, {30, 70}, 20, kStretch},
      {"gif, averaged", gif(false), {30, 20}, TAVIRPELOI_DecodeGIF, {17, 11}, 11, kStretch},
      {"gif by lines", gif(false), {30, 20}, by_lines(TAVIRPELOI_DecodeGIFLine), {30, 20}, 20},
      {"gif by lines, interlaced",
       gif(true),
       {30, 20},
       by_lines(TAVIRPELOI_DecodeGIFLine),
       {30, 20},
       20},
      {"gif in batches", gif(false), {30, 20}, repeated(TAVIRPELOI_DecodeGIFIter), {30, 20}, 20},
      {"gif in batches, averaged",
       gif(false),
       {30, 20},
       repeated(TAVIRPELOI_DecodeGIFIter),
       {17, 11},
       11,
       kStretch},
      {"animation", framed.bytes(), {30, 20}, TAVIRPELOI_DecodeAGIF, {30, 20}, 20},
      {"animation, resampled",
       framed.bytes(),
       {30, 20},
       repeated(TAVIRPELOI_DecodeAGIFIter),
       {30, 9},
       9,
       kStretch},
      {"bmp", bmp, {12, 11}, TAVIRPELOI_DecodeBMP, {12, 11}, 11},
      {"bmp, averaged, by lines",
       bmp,
       {12, 11},
       by_lines(TAVIRPELOI_DecodeBMPLine, true),
       {7, 8},
       8,
       kStretch},
      {"wbmp", wbmp, {16, 9}, TAVIRPELOI_DecodeWBMP, {16, 9}, 9},
      {"wbmp, averaged", wbmp, {16, 9}, TAVIRPELOI_DecodeWBMP, {8, 5}, 5, kStretch},
  };
}

TAVIRPELO_DECINFO* asking;
std::vector<int> rows;
int last;  // the row at which a decode is ended

int note(TAVIRPELO_DECINFO* decInfo, int row, int counter) {
  EXPECT_EQ(asking, decInfo);
  EXPECT_EQ(row, counter);
  rows.push_back(row);
  return row != last;
}

// Rows of a buffer that a decode wrote as the whole decode does; the others must be untouched.
int rows_written(const Bytes& got, const Bytes& whole, size_t rowBytes) {
  int written = 0;
  for (size_t at = 0; at < got.size(); at += rowBytes) {
    const Bytes row = prefix(suffix(got, at), rowBytes);
    const bool untouched = row == Bytes(rowBytes, kFill);
    EXPECT_TRUE(untouched || row == prefix(suffix(whole, at), rowBytes));
    written += !untouched;
  }
  return written;
}

int reason() {
  TAVIRPELO_ERROR error;
  TAVIRPELO_LastError(&error);
  return error.reason;
}

TEST(RowProgress, EveryFormatAsksAndStops) {
  for (const Case& c : cases()) {
    SCOPED_TRACE(c.name);
    const auto run = [&](TAVIRPELO_DECINFO* decInfo, int lastRow, int& answer) {
      asking = decInfo, last = lastRow, rows.clear();
      decInfo->CheckFn = note;
      GuardedPixels pixels(c.box.width, c.box.height, 1);
      answer = c.run(decInfo, pixels.data(), c.box.width, c.box.height);
      EXPECT_EQ(nullptr, decInfo->pFormatInfo);
      return pixels.content();
    };
    Bytes bytes = c.file;
    const DecInfo decInfo = open_memory(bytes, 1, c.option);
    int answer;
    const Bytes whole = run(decInfo.get(), -1, answer);
    EXPECT_TRUE(answer == 1 || answer == 3);
    EXPECT_EQ(c.image.width, decInfo->imageWidth);
    EXPECT_EQ(c.image.height, decInfo->imageHeight);
    ASSERT_EQ(c.steps, rows.size());
    EXPECT_EQ(0, rows[0]);
    EXPECT_GT(c.box.height, rows.back());
    const std::vector<int> asked = rows;
    for (size_t i = 1; i < asked.size(); ++i) EXPECT_GE(asked[i], asked[i - 1] + (c.passes ? 0 : 1));
    for (const int k : {0, asked[asked.size() / 2], asked.back()}) {
      const Bytes part = run(decInfo.get(), k, answer);
      EXPECT_EQ(0, answer) << k;
      EXPECT_EQ(TAVIRPELO_REASON_CANCELLED, reason());
      EXPECT_EQ(k, rows.back());
      if (!c.passes || k == 0) EXPECT_EQ(k, rows_written(part, whole, bytes_of(1, c.box.width, 1)));
    }
  }
}

// A file with one byte changed.
Bytes changed(Bytes file, size_t at, uint8_t value) {
  file[at] = value;
  return file;
}

Bytes png_of(const std::function<void(PngImage&)>& change) {
  PngImage image = random_png_image(1, 2, 8, 21, 14, false, false);
  const Bytes pixels = zlib_stored(png_scanlines(image, [](size_t) { return 0; }));
  change(image);
  return build_png(image, pixels);
}

TEST(RowProgress, FailuresTellTheirReason) {
  ByteWriter writer(false);
  writer.text("BM").u32(0).u32(0).u32(54).u32(40).u32(12).u32(11).u16(1).u16(24).block(Bytes(24));
  const Bytes bmp = writer.block(random_bytes(36 * 11, 1));
  const Bytes png = png_of([](PngImage&) {}), gif = sample_gif(30, 20).bytes();
  GifFile vast = sample_gif(30, 20);
  vast.width = vast.height = 65535;
  const struct {
    Decoder decoder;
    Bytes file;
    int reason;
    const char* says;  // part of the sentence
  } failures[] = {
      {TAVIRPELOI_DecodeBMP, prefix(bmp, 40), TAVIRPELO_REASON_TRUNCATED, ""},
      {TAVIRPELOI_DecodeBMP, changed(bmp, 14, 124), TAVIRPELO_REASON_VARIANT, "124-byte header"},
      {TAVIRPELOI_DecodeBMP, changed(bmp, 30, 1), TAVIRPELO_REASON_VARIANT, "run lengths"},
      {TAVIRPELOI_DecodeBMP, changed(bmp, 18, 0), TAVIRPELO_REASON_ZERO_SIZE, ""},
      {TAVIRPELOI_DecodeBMP, changed(bmp, 28, 8), TAVIRPELO_REASON_DAMAGED, "palette"},
      {TAVIRPELOI_DecodeWBMP, {0, 0, 8, 2, 1}, TAVIRPELO_REASON_DAMAGED, "shorter"},
      {TAVIRPELOI_DecodePNG, prefix(png, 20), TAVIRPELO_REASON_TRUNCATED, ""},
      {TAVIRPELOI_DecodePNG, changed(png, png.size() - 20, 0), TAVIRPELO_REASON_DAMAGED, "checksum"},
      {TAVIRPELOI_DecodePNG, png_of([](PngImage& i) { i.depth = 3; }), TAVIRPELO_REASON_VARIANT,
       "depth"},
      {TAVIRPELOI_DecodePNG, build_png(random_png_image(1, 2, 8, 9, 9, false, false), Bytes{1, 2, 3}),
       TAVIRPELO_REASON_DAMAGED, ""},
      {TAVIRPELOI_DecodePNG, png_of([](PngImage& i) { i.width = 1u << 30; }),
       TAVIRPELO_REASON_BLOCK_LIMIT, ""},
      {TAVIRPELOI_DecodePNG, bmp, TAVIRPELO_REASON_UNKNOWN_FORMAT, ""},
      {TAVIRPELOI_DecodeGIF, prefix(gif, 20), TAVIRPELO_REASON_TRUNCATED, ""},
      {TAVIRPELOI_DecodeGIF, prefix(gif, 13 + 3 * 4), TAVIRPELO_REASON_TRUNCATED, ""},
      {TAVIRPELOI_DecodeAGIF, vast.bytes(), TAVIRPELO_REASON_BLOCK_LIMIT, ""},
  };
  for (const auto& failure : failures) {
    SCOPED_TRACE(&failure - failures);
    Bytes file = failure.file;
    const DecInfo decInfo = open_memory(file, 1, TAVIRPELO_FIT_STRETCH);
    GuardedPixels pixels(30, 20, 1);
    TAVIRPELO_ERROR error;
    EXPECT_EQ(0, failure.decoder(decInfo.get(), pixels.data(), 30, 20));
    EXPECT_EQ(1, TAVIRPELO_LastError(&error));
    EXPECT_EQ(failure.reason, error.reason) << error.text;
    EXPECT_NE(nullptr, std::strstr(error.text, failure.says)) << error.text;
  }
  const std::pair<Lines, const Bytes*> byLines[] = {{TAVIRPELOI_DecodeBMPLine, &bmp},
                                                    {TAVIRPELOI_DecodePNGLine, &png},
                                                    {TAVIRPELOI_DecodeGIFLine, &gif}};
  for (const auto& [decoder, whole] : byLines) {
    Bytes file = *whole;
    const DecInfo decInfo = open_memory(file, 1);
    GuardedPixels pixels(30, 20, 1);
    ASSERT_NE(0, decoder(decInfo.get(), pixels.data(), 30, 20, 2));
    EXPECT_EQ(0, TAVIRPELO_LastError(nullptr));
    EXPECT_EQ(0, decoder(decInfo.get(), pixels.data(), 29, 20, 2));
    EXPECT_EQ(TAVIRPELO_REASON_REQUEST_CHANGED, reason());
  }
}

}  // namespace
}  // namespace tests

// The reasons that decoders other than JPEG's give for their failures.
#include <cstring>
#include <functional>

#include "tests/support/gif_builder.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/png_builder.h"
#include "tests/support/samples.h"

namespace tests {
namespace {

using Lines = int (*)(TAVIRPELO_DECINFO*, void*, int, int, int);

int reason() {
  TAVIRPELO_ERROR error;
  TAVIRPELO_LastError(&error);
  return error.reason;
}

Bytes png_of(const std::function<void(PngImage&)>& change) {
  PngImage image = random_png_image(1, 2, 8, 21, 14, false, false);
  const Bytes pixels = zlib_stored(png_scanlines(image, [](size_t) { return 0; }));
  change(image);
  return build_png(image, pixels);
}

TEST(Reasons, FailuresTellTheirReason) {
  const Bytes bmp = bmp_file(12, 11);
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
      {TAVIRPELOI_DecodeBMP, overwritten(bmp, 14, {124}), TAVIRPELO_REASON_VARIANT, "124-byte header"},
      {TAVIRPELOI_DecodeBMP, overwritten(bmp, 30, {1}), TAVIRPELO_REASON_VARIANT, "run lengths"},
      {TAVIRPELOI_DecodeBMP, overwritten(bmp, 18, {0}), TAVIRPELO_REASON_ZERO_SIZE, ""},
      {TAVIRPELOI_DecodeBMP, overwritten(bmp, 28, {8}), TAVIRPELO_REASON_DAMAGED, "palette"},
      {TAVIRPELOI_DecodeWBMP, {0, 0, 8, 2, 1}, TAVIRPELO_REASON_DAMAGED, "shorter"},
      {TAVIRPELOI_DecodePNG, prefix(png, 20), TAVIRPELO_REASON_TRUNCATED, ""},
      {TAVIRPELOI_DecodePNG, overwritten(png, png.size() - 20, {0}), TAVIRPELO_REASON_DAMAGED,
       "checksum"},
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

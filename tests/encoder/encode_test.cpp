// The encoder's streams: layout, sizes, growth, edges, and agreement with an independent decoder.
#include "codec/formats/jpeg/encoder/encoder.h"
#include "codec/formats/jpeg/encoder/encoder_abi.h"
#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

size_t size_of(uint32_t format, int w, int h) {
  return format == TAVIRPELO_GREY8 ? static_cast<size_t>(w * h)
                                   : bytes_of(static_cast<int>(format), w, h);
}
Bytes pixels_of(uint32_t format, int w, int h) {
  Bytes pixels = sample_pixels(w, h);
  pixels.resize(size_of(format, w, h), 128);
  return pixels;
}
Bytes encode(int w, int h, uint32_t format, int quality = 100) {
  return encode_pixels(pixels_of(format, w, h), w, h, format, {quality, nullptr, 0});
}

TEST(Stream, HeadersHaveTheirFixedLayout) {
  const Bytes app1Bytes{0xFF, 0xE1, 0, 4, 'x', 'y'};
  const TAVIRPELO_APP1 app1{app1Bytes.data(), 6};
  const Bytes plain = encode(20, 9, TAVIRPELO_RGB888, 50);
  const Bytes tagged = encode_pixels(pixels_of(1, 20, 9), 20, 9, TAVIRPELO_RGB888, {50, &app1, 0}, 1);
  ASSERT_GT(plain.size(), 623u);
  const auto expect_at = [&](size_t at, const Bytes& want) {
    EXPECT_EQ(want, prefix(suffix(plain, at), want.size())) << at;
  };
  expect_at(0, ByteWriter().u32(0xFFD8FFE0).u16(16).text("JFIF").block({0, 1, 1, 0, 0, 1, 0, 1, 0, 0}));
  expect_at(20, {0xFF, 0xDB, 0, 67, 0, 16, 11, 12});
  expect_at(158, {0xFF, 0xC0, 0, 17, 8, 0, 9, 0, 20, 3, 1, 0x22, 0, 2, 0x11, 1, 3, 0x11, 1});
  expect_at(609, {0xFF, 0xDA, 0, 12, 3, 1, 0, 2, 0x11, 3, 0x11, 0, 63, 0});
  EXPECT_EQ(0xD9, plain.back());
  EXPECT_EQ(Bytes(ByteWriter().block(prefix(plain, 20)).block(app1Bytes).block(suffix(plain, 20))),
            tagged);
  EXPECT_EQ(0xDA, encode(8, 8, TAVIRPELO_GREY8)[328 - 9]);
  // Stuffing: behind every FF of the entropy-coded data stands a zero.
  const Bytes noisy = encode(64, 64, TAVIRPELO_RGB888);
  for (size_t i = 623; i + 2 < noisy.size(); ++i) {
    if (noisy[i] == 0xFF) ASSERT_EQ(0, noisy[i + 1]);
  }
}

TEST(Stream, DoesNotDependOnWhereItGoes) {
  for (const uint32_t format : {TAVIRPELO_RGB565, TAVIRPELO_RGB888, TAVIRPELO_YUV420, TAVIRPELO_GREY8}) {
    const Bytes pixels = pixels_of(format, 61, 47);
    const TAVIRPELO_ENCOPTION options{100, nullptr, 0};
    const Bytes large = encode_pixels(pixels, 61, 47, format, options, 1 << 20);
    ASSERT_FALSE(large.empty());
    EXPECT_EQ(large, encode_pixels(pixels, 61, 47, format, options, 1));
    const TempFile file;
    const TAVIRPELO_RAWINFO raw = raw_image(pixels, 61, 47, format);
    ASSERT_EQ(1, TAVIRPELO_EncodeJpegToFile(&raw, file.c_str(), 100));
    EXPECT_EQ(large, file.read());
    ASSERT_EQ(1, elo_enc_jpeg_to_file_ex(&raw, file.c_str(), &options));
    EXPECT_EQ(large, file.read());
  }
}

TEST(Bands, EqualTheWholePicture) {
  const int w = 45, h = 41, cw = (w + 1) / 2, ch = (h + 1) / 2;
  const Bytes pixels = pixels_of(TAVIRPELO_YUV420, w, h);
  const TAVIRPELO_ENCOPTION options{80, nullptr, 0};
  const TAVIRPELO_RAWINFO raw = raw_image(pixels, w, h, TAVIRPELO_YUV420);
  ELO_DESTINATION destination{1, 16, 0, 0, nullptr, static_cast<uint8_t*>(TAVIRPELO_OsMalloc(16))};
  ELO_ENCODER* encoder = elo_jpeg_enc_mcu_init(&raw, &destination, &options, nullptr);
  ASSERT_NE(nullptr, encoder);
  for (int top = 0, position = 0; top < h; top += 16) {
    // A whole band of each plane, whose last rows the picture may lack.
    Bytes band;
    const auto add = [&](int plane, int width, int row, int rows, int size) {
      const size_t have = static_cast<size_t>(width * std::min(size, rows - row));
      append(band, prefix(suffix(pixels, static_cast<size_t>(plane + width * row)), have));
      band.resize(band.size() + static_cast<size_t>(width * size) - have);
    };
    add(0, w, top, h, 16);
    for (int p = 0; p < 2; ++p) add(w * h + cw * ch * p, cw, top / 2, ch, 8);
    ASSERT_EQ(1, elo_jpeg_enc_muc_process(encoder, band.data(), &position));
    EXPECT_EQ(std::min(top + 16, h), position);
  }
  uint8_t* buffer;
  int size;
  ASSERT_EQ(1, elo_jpeg_enc_mcu_finish(encoder, &buffer, &size));
  EXPECT_EQ(encode(w, h, TAVIRPELO_YUV420, 80), Bytes(buffer, buffer + size));
  TAVIRPELO_OsFree(buffer);
}

TEST(Refusals, SizesFormatsAndArguments) {
  const auto done = [](int w, int h, uint32_t format) {
    return !encode_pixels(Bytes(5000), w, h, format, {80, nullptr, 0}).empty();
  };
  EXPECT_TRUE(done(4999, 1, TAVIRPELO_GREY8));
  EXPECT_FALSE(done(5000, 1, TAVIRPELO_GREY8));
  EXPECT_FALSE(done(1, 5000, TAVIRPELO_GREY8));
  EXPECT_FALSE(done(0, 5, TAVIRPELO_GREY8));
  EXPECT_FALSE(done(4, 4, TAVIRPELO_ARGB8888));
  debug_PeloCodecError = 0;
  EXPECT_EQ(0, TAVIRPELO_EncodeJpegToFile(nullptr, "x", 1));
  EXPECT_EQ(TAVIRPELO_CODEC_ARGUMENT, debug_PeloCodecError);
  const Bytes pixels = sample_pixels(90, 70);
  EXPECT_EQ(1, fail_each_allocation([&] {
              return !encode_pixels(pixels, 90, 70, TAVIRPELO_RGB888, {100, nullptr, 0}, 1).empty();
            }));
}

#ifdef TAVIR_HAVE_LIBJPEG
// Every small size in every format decodes elsewhere, close to what went in.
TEST(Pictures, DecodeElsewhere) {
  const auto luma = [](const Bytes& rgb) {  // chroma is not averaged: only luma has to survive
    Bytes out;
    for (size_t i = 0; i < rgb.size(); i += 3)
      out.push_back(static_cast<uint8_t>((1225 * rgb[i] + 2404 * rgb[i + 1] + 467 * rgb[i + 2]) >> 12));
    return out;
  };
  for (int w = 1; w <= 33; w += w < 18 ? 1 : 5) {
    for (int h = 1; h <= 33; h += h < 18 ? 1 : 5) {
      const Decoded out = decode_libjpeg(encode(w, h, TAVIRPELO_RGB888), 8);
      ASSERT_TRUE(out.width == w && out.height == h);
      ASSERT_GT(psnr(luma(out.pixels), luma(sample_pixels(w, h))), 22) << w << "x" << h;
      const Bytes grey = decode_libjpeg(encode(w, h, TAVIRPELO_GREY8), 8).pixels;
      ASSERT_GT(psnr(grey, pixels_of(TAVIRPELO_GREY8, w, h)), 35);
      for (const uint32_t format : {TAVIRPELO_RGB565, TAVIRPELO_YUV420})
        ASSERT_EQ(w, decode_libjpeg(encode(w, h, format, 90), 8).width);
    }
  }
}
#endif

}  // namespace
}  // namespace tests

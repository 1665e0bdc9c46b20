// The encoder's streams: layout, sizes, growth, edges, and agreement with an independent decoder.
#include <gtest/gtest.h>

#include <cstdio>
#include <fstream>
#include <iterator>

#include "codec/jpeg/encoder/encoder.h"
#include "platform/fault_injection.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

struct Result {
  int done;
  Bytes jpeg;
};

Result encode(int width, int height, uint32_t format, const Bytes& pixels, const TAVIRPELO_ENCOPTION& options, int capacity = 1024) {
  Bytes copy(pixels);  // a heap block of its own: reads past it are seen
  const TAVIRPELO_RAWINFO raw{static_cast<uint32_t>(width), static_cast<uint32_t>(height), copy.data(), format};
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(static_cast<size_t>(capacity)));
  if (buffer == nullptr) return {0, {}};
  int size = capacity;
  Result result{elo_enc_jpeg_to_buffer_ex(&raw, &buffer, &size, &options), {}};
  if (result.done) {
    result.jpeg.assign(buffer, buffer + size);
  } else {
    EXPECT_EQ(nullptr, buffer);
    EXPECT_EQ(0, size);
  }
  TAVIRPELO_OsFree(buffer);
  return result;
}

size_t bytes_of(uint32_t format, int w, int h) {
  const int area = w * h;
  switch (format) {
    case TAVIRPELO_RGB565: return static_cast<size_t>(2 * area);
    case TAVIRPELO_RGB888: return static_cast<size_t>(3 * area);
    case TAVIRPELO_YUV420: return static_cast<size_t>(area + (w + 1) / 2 * ((h + 1) / 2) * 2);
    default: return static_cast<size_t>(area);
  }
}

Bytes pixels_of(uint32_t format, int w, int h) {
  Bytes pixels = sample_pixels(w, h);
  pixels.resize(bytes_of(format, w, h), 128);
  return pixels;
}

TEST(Stream, HeadersHaveTheirFixedLayout) {
  const uint8_t app1Bytes[] = {0xFF, 0xE1, 0, 4, 'x', 'y'};
  const TAVIRPELO_APP1 app1{app1Bytes, 6};
  const Bytes plain = encode(20, 9, TAVIRPELO_RGB888, pixels_of(1, 20, 9), {50, nullptr, 0}).jpeg;
  const Bytes tagged = encode(20, 9, TAVIRPELO_RGB888, pixels_of(1, 20, 9), {50, &app1, 0}, 1).jpeg;
  ASSERT_GT(plain.size(), 623u);
  const Bytes start = {0xFF, 0xD8, 0xFF, 0xE0, 0, 16, 'J', 'F', 'I', 'F', 0, 1, 1, 0, 0, 1, 0, 1, 0, 0, 0xFF, 0xDB, 0, 67, 0, 16, 11, 12};
  EXPECT_TRUE(std::equal(start.begin(), start.end(), plain.begin()));
  const Bytes frame = {0xFF, 0xC0, 0, 17, 8, 0, 9, 0, 20, 3, 1, 0x22, 0, 2, 0x11, 1, 3, 0x11, 1};
  EXPECT_TRUE(std::equal(frame.begin(), frame.end(), plain.begin() + 158));
  const Bytes scan = {0xFF, 0xDA, 0, 12, 3, 1, 0, 2, 0x11, 3, 0x11, 0, 63, 0};
  EXPECT_TRUE(std::equal(scan.begin(), scan.end(), plain.begin() + 609));
  EXPECT_EQ(0xD9, plain.back());
  EXPECT_TRUE(std::equal(app1Bytes, app1Bytes + 6, tagged.begin() + 20));
  EXPECT_TRUE(std::equal(plain.begin() + 20, plain.end(), tagged.begin() + 26));
  const Bytes grey = encode(8, 8, TAVIRPELO_GREY8, Bytes(64, 200), {100, nullptr, 0}).jpeg;
  EXPECT_EQ(0xDA, grey[328 - 9]);
  // Stuffing: behind every FF of the entropy-coded data stands a zero.
  const Bytes noisy = encode(64, 64, TAVIRPELO_RGB888, pixels_of(1, 64, 64), {100, nullptr, 0}).jpeg;
  for (size_t i = 623; i + 2 < noisy.size(); ++i) {
    if (noisy[i] == 0xFF) ASSERT_EQ(0, noisy[i + 1]);
  }
}

TEST(Stream, DoesNotDependOnWhereItGoes) {
  for (const uint32_t format : {TAVIRPELO_RGB565, TAVIRPELO_RGB888, TAVIRPELO_YUV420, TAVIRPELO_GREY8}) {
    const Bytes pixels = pixels_of(format, 61, 47);
    const TAVIRPELO_ENCOPTION options{100, nullptr, 0};
    const Bytes large = encode(61, 47, format, pixels, options, 1 << 20).jpeg;
    EXPECT_EQ(large, encode(61, 47, format, pixels, options, 1).jpeg);
    const std::string path = testing::TempDir() + "tavir_encode_file.jpg";
    const TAVIRPELO_RAWINFO raw{61, 47, const_cast<uint8_t*>(pixels.data()), format};
    ASSERT_EQ(1, TAVIRPELO_EncodeJpegToFile(&raw, path.c_str(), 100));
    std::ifstream in(path, std::ios::binary);
    EXPECT_EQ(large, Bytes(std::istreambuf_iterator<char>(in), {}));
    std::remove(path.c_str());
  }
}

TEST(Bands, EqualTheWholePicture) {
  const int w = 45, h = 41;
  const Bytes pixels = pixels_of(TAVIRPELO_YUV420, w, h);
  const TAVIRPELO_ENCOPTION options{80, nullptr, 0};
  const TAVIRPELO_RAWINFO raw{45, 41, const_cast<uint8_t*>(pixels.data()), TAVIRPELO_YUV420};
  ELO_DESTINATION destination{1, 16, 0, 0, nullptr, static_cast<uint8_t*>(TAVIRPELO_OsMalloc(16))};
  ELO_ENCODER* encoder = elo_jpeg_enc_mcu_init(&raw, &destination, &options, nullptr);
  ASSERT_NE(nullptr, encoder);
  const int cw = (w + 1) / 2, ch = (h + 1) / 2;
  for (int top = 0, position = 0; top < h; top += 16) {
    Bytes band(static_cast<size_t>(16 * w + 2 * 8 * cw));
    for (int y = 0; y < 16 && top + y < h; ++y) std::copy_n(pixels.begin() + w * (top + y), w, band.begin() + w * y);
    for (int p = 0; p < 2; ++p) {
      for (int y = 0; y < 8 && top / 2 + y < ch; ++y) {
        std::copy_n(pixels.begin() + w * h + cw * (ch * p + top / 2 + y), cw, band.begin() + 16 * w + cw * (8 * p + y));
      }
    }
    ASSERT_EQ(1, elo_jpeg_enc_muc_process(encoder, band.data(), &position));
    EXPECT_EQ(std::min(top + 16, h), position);
  }
  uint8_t* buffer;
  int size;
  ASSERT_EQ(1, elo_jpeg_enc_mcu_finish(encoder, &buffer, &size));
  EXPECT_EQ(encode(w, h, TAVIRPELO_YUV420, pixels, options).jpeg, Bytes(buffer, buffer + size));
  TAVIRPELO_OsFree(buffer);
}

TEST(Refusals, SizesFormatsAndArguments) {
  const TAVIRPELO_ENCOPTION options{80, nullptr, 0};
  EXPECT_EQ(1, encode(4999, 1, TAVIRPELO_GREY8, Bytes(4999), options).done);
  EXPECT_EQ(0, encode(5000, 1, TAVIRPELO_GREY8, Bytes(5000), options).done);
  EXPECT_EQ(0, encode(1, 5000, TAVIRPELO_GREY8, Bytes(5000), options).done);
  EXPECT_EQ(0, encode(0, 5, TAVIRPELO_GREY8, Bytes(5), options).done);
  EXPECT_EQ(0, encode(4, 4, TAVIRPELO_ARGB8888, Bytes(64), options).done);
  debug_PeloCodecError = 0;
  EXPECT_EQ(0, TAVIRPELO_EncodeJpegToFile(nullptr, "x", 1));
  EXPECT_EQ(TAVIRPELO_CODEC_ARGUMENT, debug_PeloCodecError);
}

TEST(Refusals, MemoryRunsOutAtEveryAllocation) {
  const Bytes pixels = pixels_of(TAVIRPELO_RGB888, 90, 70);
  int done = 0;
  for (long k = 1; !done && k < 100; ++k) {
    pelo::faults::allocations.arm(k);
    done = encode(90, 70, TAVIRPELO_RGB888, pixels, {100, nullptr, 0}, 1).done;
    if (done) EXPECT_LT(pelo::faults::allocations.calls, k);
    pelo::faults::allocations.arm(0);
  }
  EXPECT_EQ(1, done);
}

#ifdef TAVIR_HAVE_LIBJPEG
// Every small size in every format decodes elsewhere, close to what went in.
TEST(Pictures, DecodeElsewhere) {
  for (int w = 1; w <= 33; w += w < 18 ? 1 : 5) {
    for (int h = 1; h <= 33; h += h < 18 ? 1 : 5) {
      const Bytes rgb = sample_pixels(w, h);
      const Bytes jpeg = encode(w, h, TAVIRPELO_RGB888, rgb, {100, nullptr, 0}).jpeg;
      const Decoded out = decode_libjpeg(jpeg, 8);
      ASSERT_TRUE(out.width == w && out.height == h);
      Bytes luma, expected;
      for (size_t i = 0; i < rgb.size(); i += 3) {
        // Chroma is not averaged: only luma has to survive.
        expected.push_back(static_cast<uint8_t>((1225 * rgb[i] + 2404 * rgb[i + 1] + 467 * rgb[i + 2]) >> 12));
        luma.push_back(static_cast<uint8_t>((1225 * out.pixels[i] + 2404 * out.pixels[i + 1] + 467 * out.pixels[i + 2]) >> 12));
      }
      ASSERT_GT(psnr(luma, expected), 22) << w << "x" << h;
      const Bytes grey = pixels_of(TAVIRPELO_GREY8, w, h);
      ASSERT_GT(psnr(decode_libjpeg(encode(w, h, TAVIRPELO_GREY8, grey, {100, nullptr, 0}).jpeg, 8).pixels, grey), 35);
      for (const uint32_t format : {TAVIRPELO_RGB565, TAVIRPELO_YUV420}) {
        ASSERT_EQ(w, decode_libjpeg(encode(w, h, format, pixels_of(format, w, h), {90, nullptr, 0}).jpeg, 8).width);
      }
    }
  }
}

// A block's coefficients against the transform written out step by step.
TEST(Pictures, CoefficientsEqualTheFormulas) {
  const Bytes samples = pixels_of(TAVIRPELO_GREY8, 8, 8);
  const int quality = 90;
  const auto planes = read_coefficients(encode(8, 8, TAVIRPELO_GREY8, samples, {quality, nullptr, 0}).jpeg);
  int block[64];
  for (size_t i = 0; i < 64; ++i) block[i] = samples[i];
  const auto pass = [&](int* d, int s, int shift) {
    const int t0 = d[0] + d[7 * s], t7 = d[0] - d[7 * s], t1 = d[s] + d[6 * s], t6 = d[s] - d[6 * s];
    const int t2 = d[2 * s] + d[5 * s], t5 = d[2 * s] - d[5 * s], t3 = d[3 * s] + d[4 * s], t4 = d[3 * s] - d[4 * s];
    const int a = t0 + t3, b = t0 - t3, c = t1 + t2, e = t1 - t2;
    const int z1 = (e + b) * 181 >> 8, p = t4 + t5, q = t5 + t6, r = t6 + t7, z5 = (p - r) * 98 >> 8;
    const int z2 = (p * 139 >> 8) + z5, z4 = (r * 334 >> 8) + z5, z3 = q * 181 >> 8;
    d[0] = a + c - shift, d[4 * s] = a - c, d[2 * s] = b + z1, d[6 * s] = b - z1;
    d[5 * s] = t7 - z3 + z2, d[3 * s] = t7 - z3 - z2, d[s] = t7 + z3 + z4, d[7 * s] = t7 + z3 - z4;
  };
  for (int r = 0; r < 8; ++r) pass(block + 8 * r, 1, 1024);
  for (int c = 0; c < 8; ++c) pass(block + c, 8, 0);
  for (size_t k = 0; k < 63; ++k) {
    const int reciprocal = 65536 / ((planes[0].quant[k] * pelo::jpeg::kAanScale[k] + 1024) >> 11);
    const int x = block[k];
    EXPECT_EQ(x >= 0 ? x * reciprocal >> 16 : (x * reciprocal + 32768) >> 16, planes[0].coefficients[k]) << k;
  }
  EXPECT_EQ(0, planes[0].coefficients[63]);
}
#endif

}  // namespace
}  // namespace tests

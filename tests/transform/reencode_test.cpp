// Fitting into a number of bytes: never more than the target, from every kind of source, and the
// arithmetic of gains, tables and scales.
#include "codec/jpeg/transform/reencode.h"

#include <gtest/gtest.h>

#include <cmath>

#include "codec/jpeg/transform/requantise.h"
#include "platform/fault_injection.h"
#include "tavirpelo/tavirpelo.h"
#include "tests/support/jpeg_samples.h"
#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

struct Fitted {
  int answer;
  Bytes jpeg;
  TAVIRPELO_HINFO header{};
};

Fitted fit(Bytes source, int target) {
  int size = 1024;
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(1024));
  Fitted result{TAVIRPELO_ReEncodeJpegToBuffer(source.data(), static_cast<int>(source.size()), 1,
                                               &buffer, &size, target),
                {}};
  EXPECT_EQ(result.answer == 1, buffer != nullptr);
  if (buffer != nullptr) result.jpeg.assign(buffer, buffer + size);
  TAVIRPELO_OsFree(buffer);
  if (result.answer == 1) {
    EXPECT_LE(size, target);
    Bytes copy = result.jpeg;
    EXPECT_EQ(TAVIRPELO_FORMAT_JPEG, TAVIRPELO_ParseFromBuffer(copy.data(), size, &result.header));
  }
  return result;
}

TEST(ReEncode, NeverMoreThanTheTarget) {
  for (const bool grey : {false, true}) {
    const Bytes source = encode_own(400, 300, 95, grey);
    const int estimate = 400 * 300 * 12 / 160;
    for (const int target :
         {50000, estimate, estimate - 1, estimate / 2, estimate / 4, 2000, 1200, 700}) {
      const Fitted fitted = fit(source, target);
      ASSERT_EQ(1, fitted.answer) << target;
      if (target >= estimate && target >= static_cast<int>(source.size()))
        EXPECT_EQ(400, fitted.header.width);
      if (target == estimate / 4) EXPECT_GE(200, fitted.header.width);
      // What comes out is a picture like the source.
      const int width = fitted.header.width, height = fitted.header.height;
      EXPECT_NEAR(400.0 / 300, static_cast<double>(width) / height, 0.15);
      Bytes want(static_cast<size_t>(width * height * 3)), got(want.size());
      TAVIRPELO_RAWINFO raw{};
      raw.width = static_cast<uint32_t>(width), raw.height = static_cast<uint32_t>(height),
      raw.format = 1;
      Bytes original = source, copy = fitted.jpeg;
      raw.pData = want.data();
      ASSERT_EQ(1, TAVIRPELO_DecodeJpegFromBuffer(original.data(), static_cast<int>(original.size()),
                                                  &raw, 0x700));
      raw.pData = got.data();
      ASSERT_EQ(1, TAVIRPELO_DecodeJpegFromBuffer(copy.data(), static_cast<int>(copy.size()), &raw, 0));
      EXPECT_LT(target > 5000 ? 16 : 12, psnr(want, got)) << target;
    }
  }
}

TEST(ReEncode, FilesLikeBuffers) {
  Bytes source = encode_own(200, 150, 95);
  const TempFile in("_in"), out("_out");
  in.write(source);
  const Fitted fitted = fit(source, 3000);
  EXPECT_EQ(1, TAVIRPELO_ReEncodeJpegToFile(const_cast<char*>(in.c_str()), 0, 0, out.c_str(), 3000));
  EXPECT_EQ(fitted.jpeg, out.read());
  EXPECT_EQ(1, TAVIRPELO_ReEncodeJpegToFile(source.data(), static_cast<int>(source.size()), 1,
                                            out.c_str(), 3000));
  EXPECT_EQ(fitted.jpeg, out.read());
  EXPECT_EQ(0, TAVIRPELO_ReEncodeJpegToFile(nullptr, 0, 0, out.c_str(), 3000));
  EXPECT_EQ(0, TAVIRPELO_ReEncodeJpegToFile(const_cast<char*>("no such file"), 0, 0, out.c_str(), 3000));
}

TEST(ReEncode, WhatIsRefused) {
  Bytes source = encode_own(64, 64, 90);
  for (const int target : {-5, 0, 1, 327, 500}) EXPECT_EQ(0, fit(source, target).answer) << target;
  EXPECT_EQ(0, fit({1, 2, 3, 4}, 3000).answer);
  int size = 10;
  uint8_t* none = nullptr;
  EXPECT_EQ(0, TAVIRPELO_ReEncodeJpegToBuffer(source.data(), 4, 1, &none, &size, 3000));
  EXPECT_EQ(TAVIRPELO_CODEC_ARGUMENT, debug_PeloCodecError);
}

TEST(ReEncode, DamageAndShortMemory) {
  const Bytes source = encode_own(60, 50, 90);
  for (size_t at = 2; at < source.size(); at += 5) {
    for (const uint8_t flip : {0x01, 0x80, 0xFF}) {
      Bytes damaged = source;
      damaged[at] ^= flip;
      fit(damaged, at % 2 ? 900 : 1500);
    }
  }
  for (size_t size = 2; size < source.size(); size += 9)
    fit(Bytes(source.begin(), source.begin() + static_cast<ptrdiff_t>(size)), 900);
  for (long k = 2;; ++k) {
    Bytes copy = source;
    int size = 1024;
    auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(1024));
    pelo::faults::allocations.arm(k);
    const int answer =
        elo_re_encode_to_buffer(copy.data(), static_cast<int>(copy.size()), 1, &buffer, &size, 900);
    const bool reached = pelo::faults::allocations.calls >= k;
    pelo::faults::allocations.arm(0);
    TAVIRPELO_OsFree(buffer);
    if (!reached) break;
    EXPECT_EQ(answer == 1, buffer != nullptr) << k;
  }
}

TEST(ReEncode, GainsAndScales) {
  EXPECT_EQ(1024, __elo_get_update_gain(99, 100));
  for (const auto& [r, gain] : {std::pair{25, 960},
                                {28, 960},
                                {29, 959},
                                {30, 912},
                                {35, 724},
                                {50, 424},
                                {100, 149},
                                {225, 44},
                                {499, 13},
                                {500, 10}}) {
    EXPECT_EQ(gain, __elo_get_update_gain(r, 25)) << r;
  }
  EXPECT_EQ(10, __elo_get_update_gain(1000, 0));
  EXPECT_EQ(10, __elo_get_update_gain(0x7FFFFFFF, 1));
  EXPECT_EQ(1024, __elo_get_outimage_scale_ratio(400, 300, 9000));
  EXPECT_EQ(512, __elo_get_outimage_scale_ratio(400, 300, 9000 / 4));
  EXPECT_EQ(1024, __elo_get_outimage_scale_ratio(3, 3, 0));
  for (int p = 0; p < 100; ++p) {
    EXPECT_EQ(static_cast<int>(std::floor(1024 * std::sqrt(p / 100.0))),
              __elo_get_outimage_scale_ratio(1600, 1000, 1200 * p))
        << p;
  }
}

TEST(ReEncode, TablesGrowWithTheGain) {
  pelo::jpeg::TransformParameters parameters{};
  parameters.tableCount = 2;
  parameters.numbers = {0, 1};
  for (auto& ratios : parameters.ratio) ratios.fill(1024);
  for (int n = 0; n < 2; ++n) parameters.coding.quant[static_cast<size_t>(n)].fill(1);
  EXPECT_EQ(pelo::jpeg::Coarsening::kDone, __elo_set_qunat_table(&parameters, 512));
  // At a scale of 16 the tables of Annex K are divided by 8.
  EXPECT_EQ(2, parameters.coding.quant[0][0]);
  EXPECT_EQ(12, parameters.coding.quant[1][63]);  // 99 at an eighth of 17 / 17 and a half
  EXPECT_EQ(512, parameters.ratio[0][0]);
  int steps = 0;
  while (__elo_set_qunat_table(&parameters, 300) == pelo::jpeg::Coarsening::kDone)
    ASSERT_LT(++steps, 20);
  EXPECT_LT(0, steps);
  parameters.tableCount = 3;
  EXPECT_EQ(pelo::jpeg::Coarsening::kFailed, __elo_set_qunat_table(&parameters, 1024));
}

#ifdef TAVIR_HAVE_LIBJPEG

TEST(ReEncode, ProgressiveSources) {
  for (const int components : {1, 3}) {
    JpegStyle style;
    style.progressive = true;
    style.components = components;
    style.quality = 95;
    const Bytes source = encode_libjpeg(200, 150, style);
    JpegStyle sequential = style;
    sequential.progressive = false;
    const Bytes twin = encode_libjpeg(200, 150, sequential);
    for (const int target : {200 * 150 * 12 / 160, 1000}) {
      const Fitted fitted = fit(source, target);
      EXPECT_EQ(1, fitted.answer) << target;
      // The same coefficients in one scan give the same coefficients; sizes steer the passes alike only
      // when they are close.
      EXPECT_EQ(1, fit(twin, target).answer);
    }
  }
  JpegStyle rgb;
  rgb.rgb = true;
  EXPECT_EQ(0, fit(encode_libjpeg(64, 64, rgb), 3000).answer);
}

#endif

}  // namespace
}  // namespace tests

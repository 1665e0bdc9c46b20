// Fitting into a number of bytes: never more than the target, from every kind of source, and the
// arithmetic of gains, tables and scales.
#include <cmath>

#include "codec/formats/jpeg/transform/coding_parameters.h"
#include "codec/formats/jpeg/transform/transform.h"
#include "codec/formats/jpeg/transform/transform_abi.h"
#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

struct Fitted {
  int answer = 0;
  Bytes jpeg = {};
  TAVIRPELO_HINFO header{};
};

Fitted fit(Bytes source, int target) {
  int size = 1024;
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(1024));
  if (buffer == nullptr) return {};
  Fitted result{TAVIRPELO_ReEncodeJpegToBuffer(source.data(), static_cast<int>(source.size()), 1,
                                               &buffer, &size, target),
                {}};
  EXPECT_EQ(result.answer == 1, buffer != nullptr);
  if (buffer != nullptr) result.jpeg.assign(buffer, buffer + size);
  TAVIRPELO_OsFree(buffer);
  if (result.answer == 1) {
    EXPECT_LE(size, target);
    EXPECT_EQ(TAVIRPELO_FORMAT_JPEG,
              TAVIRPELO_ParseFromBuffer(result.jpeg.data(), size, &result.header));
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
      const Bytes want =
          decode(TAVIRPELO_DecodeJPEG, source, width, height, 1, TAVIRPELO_FIT_STRETCH).pixels;
      const Bytes got = decode(TAVIRPELO_DecodeJPEG, fitted.jpeg, width, height, 1).pixels;
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
  EXPECT_EQ(fitted.jpeg, out.read());
  // Onto the source, too small a target first.
  for (const int target : {327, 3000}) {
    EXPECT_EQ(target == 3000,
              TAVIRPELO_ReEncodeJpegToFile(const_cast<char*>(in.c_str()), 0, 0, in.c_str(), target));
    EXPECT_EQ(target == 3000 ? fitted.jpeg : source, in.read());
  }
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
  every_flip(
      source, {0x01, 0x80, 0xFF},
      [](const Bytes& damaged, size_t at) { fit(damaged, at % 2 ? 900 : 1500); }, 2, 5);
  every_truncation(
      source, [](const Bytes& cut) { fit(cut, 900); }, 2, 9);
  uint8_t* buffer = nullptr;
  const auto run = [&] {
    Bytes copy = source;
    int size = 1024;
    TAVIRPELO_OsFree(std::exchange(buffer, static_cast<uint8_t*>(TAVIRPELO_OsMalloc(1024))));
    return elo_re_encode_to_buffer(copy.data(), static_cast<int>(copy.size()), 1, &buffer, &size, 900);
  };
  // The first of them is the buffer's own. A pass that had to be left out may still leave a picture.
  const auto judge = [&](int answer) { EXPECT_EQ(answer == 1, buffer != nullptr); };
  EXPECT_EQ(1, fail_each_allocation(run, judge, 2));
  TAVIRPELO_OsFree(buffer);
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

#ifdef TAVIR_HAVE_LIBJPEG

TEST(ReEncode, ProgressiveSources) {
  for (const int components : {1, 3}) {
    // The same coefficients in one scan.
    for (const bool progressive : {false, true}) {
      const JpegStyle style{.quality = 95, .components = components, .progressive = progressive};
      for (const int target : {200 * 150 * 12 / 160, 1000})
        EXPECT_EQ(1, fit(encode_libjpeg(200, 150, style), target).answer) << target;
    }
  }
  EXPECT_EQ(0, fit(encode_libjpeg(64, 64, {.rgb = true}), 3000).answer);
}

#endif

}  // namespace
}  // namespace tests

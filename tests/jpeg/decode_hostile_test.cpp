// Damaged and cut data, and memory that runs out: every decode ends, inside its buffers.
#include <gtest/gtest.h>

#include "platform/android_log.h"
#include "platform/fault_injection.h"
#include "tavirpelo/tavirpelo.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

class Hostile : public testing::Test {
 protected:
  void SetUp() override { pelo::platform::set_log_sink([](const char*) {}); }
  void TearDown() override {
    pelo::platform::set_log_sink(nullptr);
    pelo::faults::allocations.arm(0);
  }
};

struct Outcome {
  int result;
  int parsed;
  Bytes pixels;
};

Outcome decode(const Bytes& jpeg, int width, int height, uint32_t option, int mode = 0) {
  Bytes exact(jpeg);  // a heap block of its own: reads past it are seen
  exact.shrink_to_fit();
  Outcome outcome{0, 0, Bytes(static_cast<size_t>(width * height * 3))};
  TAVIRPELO_DECINFO* info =
      TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, exact.data(), static_cast<int>(exact.size()), 1, option);
  if (info == nullptr) return outcome;
  TAVIRPELO_SetDecMode(info, mode);
  TAVIRPELO_HINFO header;
  outcome.parsed = TAVIRPELO_Parser(info, &header);
  outcome.result = TAVIRPELO_DecodeJPEG(info, outcome.pixels.data(), width, height);
  TAVIRPELO_DestroyDecInfo(info);
  return outcome;
}

std::vector<Bytes> victims() {
  std::vector<Bytes> pictures = {encode_own(40, 36, 80), encode_own(20, 20, 60, true)};
#ifdef TAVIR_HAVE_LIBJPEG
  JpegStyle style;
  style.restartInterval = 2;
  pictures.push_back(encode_libjpeg(50, 40, style));
  style.progressive = true;
  pictures.push_back(encode_libjpeg(50, 40, style));
  style = {};
  style.h = 4;
  style.v = 1;
  style.optimise = true;
  pictures.push_back(encode_libjpeg(50, 40, style));
#endif
  return pictures;
}

TEST_F(Hostile, EveryTruncationKeepsTheUpperPart) {
  for (const Bytes& jpeg : victims()) {
    const Bytes whole = decode(jpeg, 40, 32, 1).pixels;
    int good = 0;
    for (size_t length = 1; length < jpeg.size(); ++length) {
      const Bytes cut(jpeg.begin(), jpeg.begin() + static_cast<ptrdiff_t>(length));
      good += decode(cut, 40, 32, 1).result;
      decode(cut, 10, 8, 0);
    }
    EXPECT_GT(good, 0);
    // Only EOI is missing: nothing is lost.
    EXPECT_EQ(whole, decode(Bytes(jpeg.begin(), jpeg.end() - 2), 40, 32, 1).pixels);
  }
}

TEST_F(Hostile, FlippedBytesNeverLeaveTheBuffers) {
  uint32_t seed = 99;
  for (const Bytes& jpeg : victims()) {
    for (size_t i = 2; i < jpeg.size(); ++i) {
      for (const uint8_t mask : {uint8_t{0xFF}, uint8_t{0x01}, uint8_t{0x80}}) {
        Bytes bad = jpeg;
        bad[i] ^= mask;
        seed = seed * 1664525 + 1013904223;
        const uint32_t fits[] = {0, 0x100, 0x300, 0x700};
        decode(bad, 1 + static_cast<int>(seed >> 26), 1 + static_cast<int>(seed >> 20 & 63),
               fits[seed >> 9 & 3] | (seed >> 11 & 0xC), static_cast<int>(seed >> 16) % 5);
      }
    }
  }
}

// Headers with every field at its extremes: sizes, counts, sampling factors, table numbers.
TEST_F(Hostile, FrameAndScanFieldsAtTheirExtremes) {
  for (const Bytes& jpeg : victims()) {
    for (size_t i = 0; i + 20 < jpeg.size(); ++i) {
      const bool header = jpeg[i] == 0xFF && (jpeg[i + 1] == 0xC0 || jpeg[i + 1] == 0xC2 || jpeg[i + 1] == 0xDA ||
                                              jpeg[i + 1] == 0xDD || jpeg[i + 1] == 0xC4 || jpeg[i + 1] == 0xDB);
      for (size_t field = 2; header && field < 20; ++field) {
        for (const uint8_t value : {0, 1, 2, 3, 4, 0x11, 0x14, 0x41, 0x44, 0x7F, 0x80, 0xFF}) {
          Bytes bad = jpeg;
          bad[i + field] = value;
          decode(bad, 33, 17, 0x300, value % 5);
        }
      }
    }
  }
}

TEST_F(Hostile, MemoryRunsOutAtEveryAllocation) {
  for (const Bytes& jpeg : victims()) {
    for (const int mode : {0, 4}) {
      int result = 0;
      for (long k = 1; result == 0 && k < 500; ++k) {
        pelo::faults::allocations.arm(k);
        result = decode(jpeg, 23, 31, 0x700, mode).result;
        const bool spent = pelo::faults::allocations.calls >= k;
        pelo::faults::allocations.arm(0);
        if (!spent) ASSERT_EQ(1, result);
        // An allocation of the parser alone may fail and the decode go on.
        if (result == 1 && spent) result = 0;
      }
      EXPECT_EQ(1, result);
    }
  }
}

TEST_F(Hostile, AbortingKeepsTheRowsSoFar) {
  Bytes jpeg = encode_own(64, 200, 80);
  Bytes out(64 * 200 * 3);
  TAVIRPELO_DECINFO* info = TAVIRPELO_CreateDecInfo(1, jpeg.data(), static_cast<int>(jpeg.size()), 1, 0);
  info->CheckFn = [](TAVIRPELO_DECINFO*, int row, int) { return row < 32 ? 1 : 0; };
  EXPECT_EQ(1, TAVIRPELO_DecodeJPEG(info, out.data(), 64, 200));
  const Bytes whole = decode(jpeg, 64, 200, 0).pixels;
  EXPECT_TRUE(std::equal(out.begin(), out.begin() + 64 * 32 * 3, whole.begin()));
  EXPECT_TRUE(std::all_of(out.begin() + 64 * 32 * 3, out.end(), [](uint8_t b) { return b == 0; }));
  EXPECT_EQ(0, TAVIRPELO_DecodeJPEG(info, out.data(), 0, 200));
  TAVIRPELO_DestroyDecInfo(info);
}

}  // namespace
}  // namespace tests

// Damaged and cut data, and memory that runs out: every decode ends, inside its buffers.
#include "tavirpelo/error.h"
#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

using Hostile = QuietTest;

Decode run(Bytes jpeg, int width, int height, uint32_t option, int mode = 0) {
  const DecInfo info = open_memory(jpeg, 1, option);
  if (info == nullptr) return {};
  TAVIRPELO_SetDecMode(info.get(), mode);
  TAVIRPELO_HINFO header;
  TAVIRPELO_Parser(info.get(), &header);
  return decode(TAVIRPELO_DecodeJPEG, info.get(), width, height);
}

TEST_F(Hostile, AbortingKeepsTheRowsSoFar) {
  Bytes jpeg = encode_own(64, 200, 80);
  const DecInfo info = open_memory(jpeg, 1);
  info->CheckFn = [](TAVIRPELO_DECINFO*, int row, int) { return row < 32 ? 1 : 0; };
  const Decode part = decode(TAVIRPELO_DecodeJPEG, info.get(), 64, 200);
  EXPECT_EQ(1, part.answer);
  Bytes want = prefix(run(jpeg, 64, 200, 0).pixels, 64 * 32 * 3);
  want.resize(part.pixels.size(), kFill);
  EXPECT_EQ(want, part.pixels);
  EXPECT_EQ(0, decode(TAVIRPELO_DecodeJPEG, info.get(), 0, 200).answer);
}

// What the calling thread is told of a decode; of a good one nothing, whatever was tried on the way.
TEST_F(Hostile, ReasonsTellRefusalsApart) {
  const Bytes good = encode_own(40, 36, 80);
  const size_t sof = find_marker(good, 0xC0), sos = find_marker(good, 0xDA);
  const size_t code = sof + 1, precision = sof + 4, height = sof + 5, width = sof + 7, count = sof + 9;
  const auto reason = [](Bytes jpeg, TAVIRPELO_CHECKFN check = nullptr, uint32_t option = 1) {
    const DecInfo info = open_memory(jpeg, 1, option);
    if (info == nullptr) return int{TAVIRPELO_REASON_NO_MEMORY};
    info->CheckFn = check;
    const Decode result = decode(TAVIRPELO_DecodeJPEG, info.get(), 40, 36);
    TAVIRPELO_ERROR error;
    EXPECT_EQ(result.answer == 0, TAVIRPELO_LastError(&error) != 0);
    return error.reason;
  };
  const auto stop = [](TAVIRPELO_DECINFO*, int, int) { return 0; };
  struct {
    int reason;
    Bytes jpeg;
  } const cases[] = {
      {TAVIRPELO_REASON_NONE, good},
      {TAVIRPELO_REASON_TOO_LARGE, overwritten(good, width, {0x13, 0x89})},
      {TAVIRPELO_REASON_ZERO_SIZE, overwritten(good, height, {0, 0})},
      {TAVIRPELO_REASON_CMYK, overwritten(good, count, {4})},
      {TAVIRPELO_REASON_VARIANT, overwritten(good, count, {2})},
      {TAVIRPELO_REASON_VARIANT, overwritten(good, precision, {16})},
      {TAVIRPELO_REASON_VARIANT, overwritten(good, code, {0xC1})},
      {TAVIRPELO_REASON_TWELVE_BIT, overwritten(good, precision, {12})},
      {TAVIRPELO_REASON_TWELVE_BIT, overwritten(overwritten(good, code, {0xC1}), precision, {12})},
      {TAVIRPELO_REASON_LOSSLESS, overwritten(good, code, {0xC3})},
      {TAVIRPELO_REASON_ARITHMETIC, overwritten(good, code, {0xC9})},
      {TAVIRPELO_REASON_TRUNCATED, prefix(good, sof + 8)},
      {TAVIRPELO_REASON_TRUNCATED, prefix(good, sos)},
      {TAVIRPELO_REASON_DAMAGED, overwritten(good, sos + 5, {9})},  // a component that is none
      {TAVIRPELO_REASON_UNKNOWN_FORMAT, overwritten(good, 1, {0})},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.reason);
    EXPECT_EQ(c.reason, reason(c.jpeg));
    EXPECT_EQ(c.reason, reason(c.jpeg, nullptr, 0)) << "after a search for thumbnails";
  }
  EXPECT_EQ(TAVIRPELO_REASON_NONE, reason(good, stop)) << "the rows so far are kept";
#ifdef TAVIR_HAVE_LIBJPEG
  EXPECT_EQ(TAVIRPELO_REASON_CANCELLED, reason(encode_libjpeg(40, 36, {.progressive = true}), stop));
#endif
  fail_each_allocation(
      [&] { return reason(good); },
      [](int why) { EXPECT_TRUE(why == TAVIRPELO_REASON_NO_MEMORY || why == 0) << why; });
}

}  // namespace
}  // namespace tests

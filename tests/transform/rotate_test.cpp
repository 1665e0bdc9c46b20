// Turning and mirroring: coefficients against libjpeg's reading and jpegtran's moves, in one call and in
// steps, to memory and files, and what is refused.
#include <cstdio>
#include <cstdlib>

#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

struct Turn {
  int angle, flip;
  const char* jpegtran;  // its options for the same
};
constexpr Turn kTurns[] = {{0, 1, "-flip horizontal"}, {180, 0, "-rotate 180"},
                           {180, 1, "-flip vertical"}, {90, 0, "-rotate 90"},
                           {90, 1, "-transverse"},     {270, 0, "-rotate 270"},
                           {270, 1, "-transpose"}};

struct Turned {
  int answer;
  Bytes jpeg;
  int calls = 1;
};

Turned turn(Bytes source, Size size, int angle, int flip, bool inSteps = false) {
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(700));
  if (buffer == nullptr) return {0, {}};
  ELO_DESTINATION destination{ELO_TO_MEMORY, 700, 0, 0, nullptr, buffer};
  int stray = 0;  // an idle state's context may be anything
  ELO_TRANSFORMSTATE state{0, 0, inSteps ? &stray : nullptr};
  Turned result{4, {}, 0};
  while (result.answer == 4) {
    result.answer = elo_rotate_jpeg(source.data(), static_cast<int>(source.size()), size.width,
                                    size.height, &destination, angle, flip, inSteps ? &state : nullptr);
    ++result.calls;
    EXPECT_EQ(result.answer == 4, state.context != nullptr);
  }
  if (destination.buffer != nullptr)
    result.jpeg.assign(destination.buffer, destination.buffer + destination.total);
  EXPECT_TRUE(result.answer == 1 || destination.buffer == nullptr);
  TAVIRPELO_OsFree(destination.buffer);
  return result;
}

TEST(Rotate, StepsGiveTheSameBytes) {
  Bytes source = encode_own(83, 61, 90);
  for (const Turn& t : kTurns) {
    Turned whole = turn(source, {83, 61}, t.angle, t.flip);
    const Turned steps = turn(source, {83, 61}, t.angle, t.flip, true);
    EXPECT_EQ(1, whole.answer);
    EXPECT_EQ(whole.jpeg, steps.jpeg);
    EXPECT_LT(3, steps.calls);
    // To a file.
    const TempFile file;
    ELO_DESTINATION destination{ELO_TO_FILE, 0, 0, 0, std::fopen(file.c_str(), "wb"), nullptr};
    EXPECT_EQ(1, elo_rotate_jpeg(source.data(), static_cast<int>(source.size()), 83, 61, &destination,
                                 t.angle, t.flip, nullptr));
    std::fclose(destination.file);
    EXPECT_EQ(whole.jpeg, file.read());
    EXPECT_EQ(static_cast<int>(whole.jpeg.size()), destination.total);
    TAVIRPELO_HINFO header{};
    EXPECT_EQ(TAVIRPELO_FORMAT_JPEG,
              TAVIRPELO_ParseFromBuffer(whole.jpeg.data(), destination.total, &header));
    EXPECT_EQ(t.angle % 180 == 0 ? 83 : 61, header.width);
    EXPECT_EQ(whole.jpeg.size(), find_marker(whole.jpeg, 0xE1));
  }
}

TEST(Rotate, RowsOfTurnedPicturesEndInRestartMarkers) {
  const auto restarts = [](const Bytes& jpeg) {
    Bytes found;
    for (size_t i = find_marker(jpeg, 0xDA); i + 1 < jpeg.size(); ++i) {
      if (jpeg[i] == 0xFF && jpeg[i + 1] >= 0xD0 && jpeg[i + 1] <= 0xD7) found.push_back(jpeg[i + 1]);
    }
    return found;
  };
  const Bytes turned = turn(encode_own(176, 33, 90), {176, 33}, 90, 0).jpeg;
  const size_t dri = find_marker(turned, 0xDD);
  ASSERT_LT(dri, turned.size());
  EXPECT_EQ(3, turned[dri + 5]);  // MCUs of an output row
  EXPECT_EQ((Bytes{0xD0, 0xD1, 0xD2, 0xD3, 0xD4, 0xD5, 0xD6, 0xD7, 0xD0, 0xD1}), restarts(turned));
  EXPECT_TRUE(restarts(turn(encode_own(16, 16, 90), {16, 16}, 90, 0).jpeg).empty());
}

TEST(Rotate, WhatIsRefused) {
  const Bytes source = encode_own(40, 24, 90);
  EXPECT_EQ(0, turn(source, {40, 24}, 45, 0).answer);
  EXPECT_EQ(0, turn(source, {40, 23}, 90, 0).answer);
  EXPECT_EQ(0, turn(source, {24, 40}, 90, 0).answer);
  ELO_DESTINATION idle{};
  EXPECT_EQ(1, elo_rotate_jpeg(nullptr, 0, 1, 1, &idle, 0, 0, nullptr));
  EXPECT_EQ(0, elo_rotate_jpeg(nullptr, 0, 1, 1, &idle, 90, 0, nullptr));
  const Bytes zero = overwritten(source, find_marker(source, 0xDB) + 9, {0});  // a quantiser of nothing
  EXPECT_EQ(0, turn(zero, {40, 24}, 90, 0).answer);
  EXPECT_EQ(1, elo_abort_rotate_jpeg(nullptr));
  ELO_TRANSFORMSTATE stray{0, 0, &idle};
  EXPECT_EQ(1, elo_abort_rotate_jpeg(&stray));
}

TEST(Rotate, AbortedAnywhereEndsTheFile) {
  Bytes source = encode_own(100, 100, 90);
  for (const Turn& t : kTurns) {
    for (int steps = 1;; ++steps) {
      ELO_DESTINATION destination{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
      ELO_TRANSFORMSTATE state{};
      int answer = 4;
      for (int i = 0; i < steps && answer == 4; ++i) {
        answer = elo_rotate_jpeg(source.data(), static_cast<int>(source.size()), 100, 100, &destination,
                                 t.angle, t.flip, &state);
      }
      EXPECT_EQ(1, elo_abort_rotate_jpeg(&state));
      EXPECT_EQ(nullptr, state.context);
      ASSERT_LT(600, destination.total);
      EXPECT_EQ(0xD9, destination.buffer[destination.total - 1]);
      TAVIRPELO_OsFree(destination.buffer);
      if (answer == 1) break;
    }
  }
}

TEST(Rotate, DamageAndShortMemory) {
  const Bytes source = encode_own(48, 40, 80);
  const auto cut_turn = [](const Bytes& cut) {
    for (const size_t t : {0, 1, 3, 5})
      turn(cut, {48, 40}, kTurns[t].angle, kTurns[t].flip, cut.size() % 2 == 0);
  };
  every_truncation(source, cut_turn, 2, 7);
  const auto damaged_turn = [](const Bytes& damaged, size_t at) {
    turn(damaged, {48, 40}, kTurns[at % 7].angle, kTurns[at % 7].flip);
  };
  every_flip(source, {0x01, 0x80, 0xFF}, damaged_turn, 2, 3);
  for (const size_t t : {1, 3})
    fail_each_allocation([&] { return turn(source, {48, 40}, kTurns[t].angle, kTurns[t].flip).answer; });
}

#ifdef TAVIR_HAVE_LIBJPEG

Bytes run_jpegtran(const Bytes& source, const char* options) {
  const TempFile in("_in"), out("_out");
  in.write(source);
  const std::string command =
      std::string("jpegtran ") + options + " -outfile " + out.path() + " " + in.path();
  EXPECT_EQ(0, std::system(command.c_str()));
  return out.read();
}

// Coefficients but for the last of each block, which is not coded.
std::vector<Plane> comparable(const Bytes& jpeg) {
  std::vector<Plane> planes = read_coefficients(jpeg);
  for (Plane& plane : planes) {
    for (size_t i = 63; i < plane.coefficients.size(); i += 64) plane.coefficients[i] = 0;
  }
  return planes;
}

void expect_same(const std::vector<Plane>& want, const std::vector<Plane>& got, const char* what) {
  ASSERT_EQ(want.size(), got.size());
  for (size_t c = 0; c < want.size(); ++c) {
    EXPECT_EQ(want[c].coefficients, got[c].coefficients) << what << ", component " << c;
    EXPECT_EQ(want[c].quant, got[c].quant) << what << ", component " << c;
  }
}

TEST(Rotate, MovesWhatJpegtranMoves) {
  for (const JpegStyle& style : {JpegStyle{},
                                 {.v = 1},
                                 {.h = 1},
                                 {.h = 1, .v = 1},
                                 {.components = 1},
                                 {.quality = 100, .restartInterval = 5}}) {
    const Bytes source = encode_libjpeg(96, 64, style);
    for (const Turn& t : kTurns) {
      const Turned turned = turn(source, {96, 64}, t.angle, t.flip);
      ASSERT_EQ(1, turned.answer);
      expect_same(comparable(run_jpegtran(source, t.jpegtran)), comparable(turned.jpeg), t.jpegtran);
    }
    // There and back.
    const Turned there = turn(source, {96, 64}, 90, 0), back = turn(there.jpeg, {64, 96}, 270, 0);
    expect_same(comparable(source), comparable(back.jpeg), "back");
  }
}

TEST(Rotate, RefusesWhatItCannotMove) {
  for (const JpegStyle& style : {JpegStyle{.progressive = true},
                                 {.rgb = true},
                                 {.scans = JpegScans::kSeparate},
                                 {.h = 4, .v = 1}}) {
    EXPECT_EQ(0, turn(encode_libjpeg(64, 64, style), {64, 64}, 90, 0).answer);
  }
}

#endif

}  // namespace
}  // namespace tests

// Turning and mirroring: coefficients against libjpeg's reading and jpegtran's moves, in one call and in
// steps, to memory and files, and what is refused.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <map>

#include "codec/jpeg/tables.h"
#include "platform/fault_injection.h"
#include "tavirpelo/tavirpelo.h"
#include "tests/support/jpeg_samples.h"
#include "tests/support/slideshow_files.h"

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

Turned turn(Bytes source, int width, int height, int angle, int flip, bool inSteps = false) {
  ELO_DESTINATION destination{
      ELO_TO_MEMORY, 700, 0, 0, nullptr, static_cast<uint8_t*>(TAVIRPELO_OsMalloc(700))};
  ELO_TRANSFORMSTATE state{};
  Turned result{4, {}, 0};
  while (result.answer == 4) {
    result.answer = elo_rotate_jpeg(source.data(), static_cast<int>(source.size()), width, height,
                                    &destination, angle, flip, inSteps ? &state : nullptr);
    ++result.calls;
    EXPECT_EQ(result.answer == 4, state.context != nullptr);
  }
  if (destination.buffer != nullptr)
    result.jpeg.assign(destination.buffer, destination.buffer + destination.total);
  EXPECT_TRUE(result.answer == 1 || destination.buffer == nullptr);
  TAVIRPELO_OsFree(destination.buffer);
  return result;
}

// Markers of the entropy-coded data, and the segments before it.
std::vector<uint8_t> restarts(const Bytes& jpeg) {
  std::vector<uint8_t> found;
  for (size_t i = 0; i + 1 < jpeg.size(); ++i) {
    if (jpeg[i] == 0xFF && jpeg[i + 1] >= 0xD0 && jpeg[i + 1] <= 0xD7) found.push_back(jpeg[i + 1]);
  }
  return found;
}
bool has_marker(const Bytes& jpeg, uint8_t marker) {
  for (size_t i = 0; i + 1 < jpeg.size(); ++i) {
    if (jpeg[i] == 0xFF && jpeg[i + 1] == marker) return true;
  }
  return false;
}

TEST(Rotate, StepsGiveTheSameBytes) {
  const Bytes source = encode_own(83, 61, 90);
  for (const Turn& t : kTurns) {
    const Turned whole = turn(source, 83, 61, t.angle, t.flip);
    const Turned steps = turn(source, 83, 61, t.angle, t.flip, true);
    EXPECT_EQ(1, whole.answer);
    EXPECT_EQ(whole.jpeg, steps.jpeg);
    EXPECT_LT(3, steps.calls);
    // To a file.
    const TempFile file;
    ELO_DESTINATION destination{ELO_TO_FILE, 0, 0, 0, std::fopen(file.c_str(), "wb"), nullptr};
    Bytes copy = source;
    EXPECT_EQ(1, elo_rotate_jpeg(copy.data(), static_cast<int>(copy.size()), 83, 61, &destination,
                                 t.angle, t.flip, nullptr));
    std::fclose(destination.file);
    EXPECT_EQ(whole.jpeg, file.read());
    EXPECT_EQ(static_cast<int>(whole.jpeg.size()), destination.total);
    TAVIRPELO_HINFO header{};
    Bytes parsed = whole.jpeg;
    EXPECT_EQ(TAVIRPELO_FORMAT_JPEG,
              TAVIRPELO_ParseFromBuffer(parsed.data(), static_cast<int>(parsed.size()), &header));
    EXPECT_EQ(t.angle % 180 == 0 ? 83 : 61, header.width);
    EXPECT_FALSE(has_marker(whole.jpeg, 0xE1));
  }
}

TEST(Rotate, RowsOfTurnedPicturesEndInRestartMarkers) {
  const Turned turned = turn(encode_own(176, 33, 90), 176, 33, 90, 0);
  const size_t dri = [&] {
    for (size_t i = 0; i + 5 < turned.jpeg.size(); ++i) {
      if (turned.jpeg[i] == 0xFF && turned.jpeg[i + 1] == 0xDD) return i;
    }
    return size_t{0};
  }();
  ASSERT_NE(0u, dri);
  EXPECT_EQ(3, turned.jpeg[dri + 5]);  // MCUs of an output row
  const std::vector<uint8_t> markers = restarts(turned.jpeg);
  ASSERT_EQ(10u, markers.size());
  for (size_t i = 0; i < markers.size(); ++i) EXPECT_EQ(0xD0 + i % 8, markers[i]);
  EXPECT_TRUE(restarts(turn(encode_own(16, 16, 90), 16, 16, 90, 0).jpeg).empty());
}

TEST(Rotate, WhatIsRefused) {
  const Bytes source = encode_own(40, 24, 90);
  EXPECT_EQ(0, turn(source, 40, 24, 45, 0).answer);
  EXPECT_EQ(0, turn(source, 40, 23, 90, 0).answer);
  EXPECT_EQ(0, turn(source, 24, 40, 90, 0).answer);
  ELO_DESTINATION idle{};
  EXPECT_EQ(1, elo_rotate_jpeg(nullptr, 0, 1, 1, &idle, 0, 0, nullptr));
  EXPECT_EQ(0, elo_rotate_jpeg(nullptr, 0, 1, 1, &idle, 90, 0, nullptr));
  Bytes zero = source;  // a quantiser of nothing
  for (size_t i = 0; i + 10 < zero.size(); ++i) {
    if (zero[i] == 0xFF && zero[i + 1] == 0xDB) {
      zero[i + 9] = 0;
      break;
    }
  }
  EXPECT_EQ(0, turn(zero, 40, 24, 90, 0).answer);
  EXPECT_EQ(1, elo_abort_rotate_jpeg(nullptr));
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

TEST(Rotate, DamagedAndCutSources) {
  const Bytes source = encode_own(48, 40, 80);
  for (size_t size = 2; size < source.size(); size += 7) {
    const Bytes cut(source.begin(), source.begin() + static_cast<ptrdiff_t>(size));
    for (const Turn& t : {kTurns[0], kTurns[1], kTurns[3], kTurns[5]})
      turn(cut, 48, 40, t.angle, t.flip, size % 2 == 0);
  }
  for (size_t at = 2; at < source.size(); at += 3) {
    for (const uint8_t flip : {0x01, 0x80, 0xFF}) {
      Bytes damaged = source;
      damaged[at] ^= flip;
      const Turn& t = kTurns[at % 7];
      turn(damaged, 48, 40, t.angle, t.flip);
    }
  }
}

TEST(Rotate, ShortMemoryAtEveryStep) {
  const Bytes source = encode_own(48, 40, 80);
  for (const Turn& t : {kTurns[1], kTurns[3]}) {
    for (long k = 1;; ++k) {
      Bytes copy = source;
      ELO_DESTINATION destination{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
      pelo::faults::allocations.arm(k);
      const int answer = elo_rotate_jpeg(copy.data(), static_cast<int>(copy.size()), 48, 40,
                                         &destination, t.angle, t.flip, nullptr);
      const bool reached = pelo::faults::allocations.calls >= k;
      pelo::faults::allocations.arm(0);
      TAVIRPELO_OsFree(destination.buffer);
      if (!reached) break;
      EXPECT_EQ(0, answer) << k;
    }
  }
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
  std::vector<JpegStyle> styles;
  for (const auto& [h, v] : {std::pair{2, 2}, {2, 1}, {1, 2}, {1, 1}}) {
    JpegStyle style;
    style.h = h, style.v = v;
    styles.push_back(style);
  }
  JpegStyle grey;
  grey.components = 1;
  styles.push_back(grey);
  JpegStyle restarted;
  restarted.restartInterval = 5;
  restarted.quality = 100;
  styles.push_back(restarted);
  for (const JpegStyle& style : styles) {
    const Bytes source = encode_libjpeg(96, 64, style);
    for (const Turn& t : kTurns) {
      const Turned turned = turn(source, 96, 64, t.angle, t.flip);
      ASSERT_EQ(1, turned.answer);
      expect_same(comparable(run_jpegtran(source, t.jpegtran)), comparable(turned.jpeg), t.jpegtran);
    }
    // There and back.
    const Turned there = turn(source, 96, 64, 90, 0), back = turn(there.jpeg, 64, 96, 270, 0);
    expect_same(comparable(source), comparable(back.jpeg), "back");
  }
}

TEST(Rotate, RefusesWhatItCannotMove) {
  JpegStyle progressive, rgb, separate;
  progressive.progressive = true;
  rgb.rgb = true;
  separate.separateScans = true;
  for (const JpegStyle& style : {progressive, rgb, separate}) {
    EXPECT_EQ(0, turn(encode_libjpeg(64, 64, style), 64, 64, 90, 0).answer);
  }
  JpegStyle wide;
  wide.h = 4, wide.v = 1;
  EXPECT_EQ(0, turn(encode_libjpeg(64, 64, wide), 64, 64, 90, 0).answer);
}

#endif

}  // namespace
}  // namespace tests

// The store on disk: its bytes, its edits, damage, and every file call failing in turn.
#include <gtest/gtest.h>

#include <cstdio>
#include <fstream>
#include <iterator>

#include "platform/fault_injection.h"
#include "slideshow/SlideShow.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

using pelo::faults::allocations;
using pelo::faults::containerCalls;

constexpr int kHeader = 628, kSubfile = 540, kMark = 12;

std::string temp(const char* name) { return testing::TempDir() + "tavir_show_" + name; }

Bytes read_file(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  return Bytes(std::istreambuf_iterator<char>(in), {});
}

void write_file(const std::string& path, const Bytes& bytes) {
  std::ofstream(path, std::ios::binary).write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
}

int32_t number(const Bytes& file, size_t at) {
  return static_cast<int32_t>(file[at] | file[at + 1] << 8 | file[at + 2] << 16 | static_cast<uint32_t>(file[at + 3]) << 24);
}

void set_number(Bytes& file, size_t at, uint32_t value) {
  for (size_t i = 0; i < 4; ++i) file[at + i] = static_cast<uint8_t>(value >> 8 * i);
}

// Names and sizes of a show's pictures, and the bytes of each.
std::vector<std::pair<std::string, Bytes>> contents(SlideShow& show) {
  std::vector<std::pair<std::string, Bytes>> list;
  for (int i = 0; i < show.subfileCount; ++i) {
    Bytes jpeg(static_cast<size_t>(show.GetSizeOfSubfile(i)));
    EXPECT_EQ(1, show.GetImage(i, jpeg.data()));
    list.emplace_back(show.subfiles[i].name, jpeg);
  }
  return list;
}

class Show : public testing::Test {
 protected:
  void TearDown() override {
    allocations.arm(0);
    containerCalls.arm(0);
    std::remove(path.c_str());
  }
  int add(SlideShow& show, int width, int height, const char* name) {
    Bytes jpeg = encode_own(width, height, 80);
    return show.AddImageToBuffer(jpeg.data(), static_cast<int>(jpeg.size()), name);
  }
  // Tests run side by side: each has a file of its own.
  std::string path = temp(testing::UnitTest::GetInstance()->current_test_info()->name());
};

TEST_F(Show, BytesOfACreatedContainer) {
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(path.c_str(), 480, 480));
  EXPECT_EQ(static_cast<size_t>(kHeader), read_file(path).size());
  show.interval = 7;
  show.loop = 1;
  ASSERT_EQ(1, add(show, 100, 60, "first"));
  ASSERT_EQ(1, add(show, 60, 100, nullptr));
  const Bytes file = read_file(path);
  const int a = number(file, kHeader + 532);
  const int b = number(file, static_cast<size_t>(kHeader + a + 532));
  EXPECT_EQ(static_cast<size_t>(kHeader + a + b + kMark), file.size());
  EXPECT_STREQ(path.c_str(), reinterpret_cast<const char*>(file.data()));
  for (const auto& [at, value] : {std::pair{512, 7}, {524, 1}, {532, 480}, {536, 480}, {540, 0}, {544, 2}, {548, kHeader}, {552, kHeader + a}, {556, 0}}) {
    EXPECT_EQ(value, number(file, static_cast<size_t>(at))) << at;
  }
  EXPECT_STREQ("first", reinterpret_cast<const char*>(file.data() + kHeader));
  for (const auto& [at, value] : {std::pair{512, 1}, {516, 0}, {520, 100}, {524, 60}, {528, 0}, {536, kHeader}}) {
    EXPECT_EQ(value, number(file, static_cast<size_t>(kHeader + at))) << at;
  }
  EXPECT_EQ(0xFF, file[kHeader + kSubfile]);
  EXPECT_EQ(0xD8, file[kHeader + kSubfile + 1]);
  const Bytes mark(file.end() - kMark, file.end());
  EXPECT_EQ((Bytes{'v', 's', 's', 'f', 0x10, 0x27, 0, 0, 0, 0, 0, 0}), mark);
}

TEST_F(Show, DisplaySizesFollowTheLongerSide) {
  struct { int showWidth, showHeight, width, height, shownWidth, shownHeight; } const cases[] = {
      {480, 480, 1600, 1200, 480, 360}, {480, 480, 1200, 1600, 360, 480}, {480, 480, 300, 200, 300, 200},
      {480, 320, 100, 500, 64, 320},    {480, 320, 600, 500, 480, 400},  {480, 480, 1000, 2, 480, 0}};
  for (const auto& c : cases) {
    SlideShow show;
    ASSERT_EQ(1, show.CreateShow(nullptr, c.showWidth, c.showHeight));
    show.subfileCount = 1;
    show.subfiles[0].width = c.width;
    show.subfiles[0].height = c.height;
    EXPECT_EQ(c.shownWidth, show.GetSubWidth(0));
    EXPECT_EQ(c.shownHeight, show.GetSubHeight(0));
    EXPECT_EQ(0, show.GetSubWidth(1));
  }
}

TEST_F(Show, EditsReopenInOrder) {
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(path.c_str(), 120, 120));
  ASSERT_EQ(1, add(show, 400, 300, "A"));
  ASSERT_EQ(1, add(show, 50, 40, "B"));
  Bytes jpeg = encode_own(90, 200, 80);
  const int size = static_cast<int>(jpeg.size());
  EXPECT_EQ(0, show.InsertImageToBuffer(jpeg.data(), size, "x", -1));
  EXPECT_EQ(0, show.InsertImageToBuffer(jpeg.data(), size, "x", 3));
  const auto before = contents(show);
  ASSERT_EQ(1, show.InsertImageToBuffer(jpeg.data(), size, "C", 0));
  ASSERT_EQ(1, show.InsertImageToBuffer(jpeg.data(), size, "D", 2));
  ASSERT_EQ(1, show.InsertImageToBuffer(jpeg.data(), size, "E", 4));
  SlideShow again;
  ASSERT_EQ(1, again.OpenShow(path.c_str(), 1, 1));
  const auto after = contents(again);
  ASSERT_EQ(5u, after.size());
  const char* order[] = {"C", "A", "D", "B", "E"};
  for (size_t i = 0; i < 5; ++i) {
    EXPECT_EQ(order[i], after[i].first);
    EXPECT_EQ(show.subfiles[i].offset, again.subfiles[i].offset);
    EXPECT_EQ(2, again.subfiles[i].state);
  }
  EXPECT_EQ(before[0].second, after[1].second);
  EXPECT_EQ(before[1].second, after[3].second);
  EXPECT_EQ(120, again.width);
  EXPECT_EQ(120, again.GetSubWidth(1));
  EXPECT_EQ(90, again.GetSubHeight(1));
  while (again.subfileCount < 20) ASSERT_EQ(1, add(again, 8, 8, "fill"));
  EXPECT_EQ(0, add(again, 8, 8, "over"));
  EXPECT_EQ(20, again.subfileCount);
}

TEST_F(Show, DrawsFittedOnTransparentBlack) {
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(path.c_str(), 480, 480));
  ASSERT_EQ(1, add(show, 64, 48, "A"));
  std::vector<uint32_t> pixels(100 * 100, 7);
  ASSERT_EQ(1, show.GetDrawble(0, pixels.data(), 100, 100));
  EXPECT_EQ(0, show.lastIndex);
  for (int y = 0; y < 100; ++y) {
    for (int x = 0; x < 100; ++x) {
      const bool inside = x >= 18 && x < 82 && y >= 26 && y < 74;
      ASSERT_EQ(inside ? 0xFFu : 0u, pixels[static_cast<size_t>(100 * y + x)] >> 24) << x << " " << y;
    }
  }
  EXPECT_EQ(0, show.GetDrawble(1, pixels.data(), 10, 10));
  EXPECT_EQ(0, show.GetDrawble(0, nullptr, 10, 10));
  EXPECT_EQ(0, show.GetDrawble(0, pixels.data(), 65536, 65536));
  EXPECT_EQ(0, show.GetDrawbleToBuffer(pixels.data(), 10, pixels.data(), 10, 10));
}

TEST_F(Show, MemoryModeNotesAndDrawsFromSources) {
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(nullptr, 480, 480));
  Bytes jpeg = encode_own(640, 20, 80);
  write_file(path, jpeg);
  ASSERT_EQ(1, show.AddImageToFile(path.c_str(), "file"));
  ASSERT_EQ(1, show.AddImageToBuffer(jpeg.data(), static_cast<int>(jpeg.size()), nullptr));
  EXPECT_EQ(0, show.AddImageToFile(temp("missing").c_str(), "x"));
  EXPECT_EQ(0, show.AddImageToFile(testing::TempDir().c_str(), "x"));
  EXPECT_EQ(0, show.writeVssHeader("r+b"));
  std::vector<uint32_t> pixels(480 * 15);
  char buffer[256];
  EXPECT_EQ(0, show.GetLastInformation(buffer));
  EXPECT_EQ(1, show.GetDrawble(0, pixels.data(), 480, 15));
  EXPECT_EQ(static_cast<int>(path.size()), show.GetLastInformation(buffer));
  EXPECT_EQ(0, show.GetDrawble(1, pixels.data(), 480, 15));
  EXPECT_EQ(1, show.GetDrawbleToBuffer(jpeg.data(), static_cast<int>(jpeg.size()), pixels.data(), 480, 15));
}

TEST_F(Show, ArgumentsAtTheirLimits) {
  SlideShow show;
  EXPECT_EQ(0, show.CreateShow(path.c_str(), 0, 480));
  EXPECT_EQ(0, show.CreateShow("", 480, 480));
  EXPECT_EQ(0, show.CreateShow(std::string(256, 'a').c_str(), 480, 480));
  EXPECT_EQ(SlideShow::kGeneralFailure, show.OpenShow(path.c_str(), 0, 1));
  EXPECT_EQ(SlideShow::kGeneralFailure, show.OpenShow(nullptr, 1, 1));
  EXPECT_EQ(SlideShow::kGeneralFailure, show.OpenShow(temp("missing").c_str(), 1, 1));
  ASSERT_EQ(1, show.CreateShow(path.c_str(), 480, 480));
  EXPECT_EQ(SlideShow::kNotContainer, SlideShow().OpenShow(path.c_str(), 1, 1));
  ASSERT_EQ(1, add(show, 20, 20, std::string(300, 'n').c_str()));
  EXPECT_EQ(255u, std::string(show.subfiles[0].name).size());
  EXPECT_EQ(1, show.DeleteShow());
  EXPECT_EQ(SlideShow::kFree, show.mode);
  EXPECT_EQ(0, add(show, 20, 20, "x"));
}

// Every field at its extremes, every cut, every flipped byte: a code or a usable show, never a crash.
TEST_F(Show, DamagedContainersAreRefusedOrUsable) {
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(path.c_str(), 480, 480));
  ASSERT_EQ(1, add(show, 16, 16, "A"));
  ASSERT_EQ(1, add(show, 16, 16, "B"));
  const Bytes good = read_file(path);
  const auto open = [&](const Bytes& bytes) {
    write_file(path, bytes);
    SlideShow victim;
    const int result = victim.OpenShow(path.c_str(), 1, 1);
    if (result == 1) {
      std::vector<uint32_t> pixels(16 * 16);
      for (int i = 0; i < victim.subfileCount; ++i) victim.GetDrawble(i, pixels.data(), 16, 16);
    } else {
      EXPECT_EQ(SlideShow::kFree, victim.mode);
    }
    return result;
  };
  EXPECT_EQ(1, open(good));
  for (size_t length = 0; length < good.size(); length += 7) {
    EXPECT_NE(1, open(Bytes(good.begin(), good.begin() + static_cast<ptrdiff_t>(length)))) << length;
  }
  for (size_t at = 512; at + 4 <= good.size(); at += at < 1200 ? 4 : 41) {
    for (const uint32_t value : {0u, 1u, 21u, 539u, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu}) {
      Bytes bad = good;
      set_number(bad, at, value);
      open(bad);
    }
  }
  for (const size_t field : {size_t{544}, size_t{540}, size_t{kHeader + 532}}) {
    for (const uint32_t value : {21u, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu}) {
      Bytes bad = good;
      set_number(bad, field, value);
      EXPECT_EQ(SlideShow::kGeneralFailure, open(bad)) << field << " " << value;
    }
  }
  Bytes version = good;
  version[good.size() - 8] ^= 1;
  EXPECT_EQ(SlideShow::kWrongVersion, open(version));
  // No terminator in the recorded path.
  Bytes path255 = good;
  std::fill(path255.begin(), path255.begin() + 256, 'p');
  open(path255);
}

// Whichever file call fails, object and file are as before, and the next edit works.
TEST_F(Show, EveryFileCallFailingLeavesTheOldShow) {
  for (const int position : {0, 1, 2}) {
    SlideShow show;
    ASSERT_EQ(1, show.CreateShow(path.c_str(), 480, 480));
    ASSERT_EQ(1, add(show, 40, 40, "A"));
    ASSERT_EQ(1, add(show, 24, 24, "B"));
    const auto before = contents(show);
    Bytes jpeg = encode_own(position == 1 ? 8 : 64, 32, 80);
    int result = 0;
    long k = 1;
    for (; result == 0 && k < 500; ++k) {
      containerCalls.arm(k);
      result = show.InsertImageToBuffer(jpeg.data(), static_cast<int>(jpeg.size()), "C", position);
      containerCalls.arm(0);
      ASSERT_EQ(nullptr, show.file);
      if (result == 1) break;
      ASSERT_EQ(2, show.subfileCount) << k;
      SlideShow again;
      ASSERT_EQ(1, again.OpenShow(path.c_str(), 1, 1)) << position << " " << k;
      ASSERT_EQ(before, contents(again)) << position << " " << k;
      ASSERT_EQ(before, contents(show)) << position << " " << k;
    }
    EXPECT_EQ(1, result);
    EXPECT_GT(k, 20);
    SlideShow again;
    ASSERT_EQ(1, again.OpenShow(path.c_str(), 1, 1));
    EXPECT_EQ("C", contents(again)[static_cast<size_t>(position)].first);
  }
}

TEST_F(Show, MemoryRunsOutAtEveryAllocation) {
  Bytes jpeg = encode_own(64, 32, 80);
  int result = 0;
  for (long k = 1; result == 0 && k < 300; ++k) {
    SlideShow show;
    std::vector<uint32_t> pixels(64 * 32);
    allocations.arm(k);
    const int created = show.CreateShow(path.c_str(), 480, 480);
    result = created == 1 && show.AddImageToBuffer(jpeg.data(), static_cast<int>(jpeg.size()), "A") == 1 &&
             show.GetDrawble(0, pixels.data(), 64, 32) == 1 && allocations.calls < k;
    allocations.arm(0);
    if (created == 1 && show.subfileCount == 1) {
      SlideShow again;
      EXPECT_EQ(1, again.OpenShow(path.c_str(), 1, 1));
    }
  }
  EXPECT_EQ(1, result);
}

}  // namespace
}  // namespace tests

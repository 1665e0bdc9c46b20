// The file: its bytes against a builder of the test's own, foreign and damaged ones.
#include <gtest/gtest.h>

#include <algorithm>

#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

// Two small pictures behind some music.
ContainerImage small_container(const TempFile& file) {
  ContainerImage image;
  image.path = file.path();
  image.musicPath = "tune";
  image.music = Bytes(100, 'm');
  image.pictures = {{"A", "a.jpg", 16, 16, 0, encode_own(16, 16, 80)},
                    {"B", "", 8, 24, 3, encode_own(8, 24, 80)}};
  return image;
}

int open(const TempFile& file, const Bytes& bytes) {
  file.write(bytes);
  SlideShow show;
  const int result = show.OpenShow(file.c_str(), 1, 1);
  if (result != 1) {
    EXPECT_EQ(SlideShow::kFree, show.mode);
    return result;
  }
  std::vector<uint32_t> pixels(16 * 16);
  for (int i = 0; i < show.subfileCount; ++i) show.GetDrawble(i, pixels.data(), 16, 16);
  char text[256];
  EXPECT_LE(show.GetLastInformation(text), 255);
  return result;
}

TEST(Container, EditsWriteTheFormatByteForByte) {
  const TempFile file, source(".jpg");
  source.write(encode_own(100, 60, 80));
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 320));
  ContainerImage image;
  image.path = file.path();
  image.height = 320;
  Bytes expected = image.bytes();
  expected.resize(kHeaderBytes);  // no end mark before the first picture
  ASSERT_EQ(expected, file.read());

  show.interval = image.interval = 7;
  show.effectType = image.effectType = -2;
  show.shuffle = image.shuffle = 1;
  show.screenDirection = image.screenDirection = 1;
  ASSERT_EQ(1, show.AddImageToFile(source.c_str(), "first"));
  ASSERT_EQ(1, add_sample(show, 1000, 500, nullptr));
  const Contents stored = contents(show);
  image.pictures = {{"first", source.path(), 100, 60, 0, stored[0].second},
                    {"", "", 480, 240, 0, stored[1].second}};
  ASSERT_EQ(image.bytes(), file.read());

  ASSERT_EQ(1, add_sample(show, 30, 30, "front", 0));
  image.pictures.insert(image.pictures.begin(), {"front", "", 30, 30, 0, contents(show)[0].second});
  image.staleMarks = 1;
  EXPECT_EQ(image.bytes(), file.read());
}

TEST(Container, OpensWhatTheFormatAllows) {
  const TempFile file;
  ContainerImage image = small_container(file);
  image.staleMarks = 2;
  image.width = 300;
  Bytes bytes = image.bytes();
  // Recorded offsets are not trusted: pictures are found by their sizes.
  const size_t first = image.music.size() + kHeaderBytes;
  set_number(bytes, image.music.size() + 548 + 19 * 4, 77);
  set_number(bytes, first + 536, 0x7FFFFFFF);
  file.write(bytes);

  SlideShow show;
  ASSERT_EQ(1, show.OpenShow(file.c_str(), 9, 9));
  EXPECT_EQ((Contents{{"A", image.pictures[0].jpeg}, {"B", image.pictures[1].jpeg}}), contents(show));
  EXPECT_EQ(static_cast<int>(first), show.subfileOffsets[0]);
  EXPECT_EQ(0, show.subfileOffsets[19]);
  EXPECT_EQ(2, show.subfiles[1].state);
  EXPECT_EQ(300, show.width);
  EXPECT_EQ(100, show.GetMusicSize());
  // An insertion behind the music leaves it alone.
  ASSERT_EQ(1, add_sample(show, 16, 8, "C", 1));
  const Contents three = reopened(file);
  ASSERT_EQ(3u, three.size());
  EXPECT_EQ(image.pictures[1].jpeg, three[2].second);
  EXPECT_EQ(image.music, Bytes(bytes.begin(), bytes.begin() + 100));
}

TEST(Container, RefusesWhatContradictsItself) {
  const TempFile file;
  const Bytes good = small_container(file).bytes();
  ASSERT_EQ(1, open(file, good));
  constexpr size_t kHeaderAt = 100, kFirst = kHeaderAt + kHeaderBytes;
  const size_t mark = good.size() - kMarkBytes;
  const struct {
    size_t at;
    std::vector<uint32_t> values;
    int result;
  } cases[] = {
      {mark, {0, 0xFFFFFFFF}, SlideShow::kNotContainer},
      {mark + 4, {0, 9999, 10001, 0xFFFFFFFF}, SlideShow::kWrongVersion},
      {mark + 8, {99, 101, 0x7FFFFFFF, 0x80000000, 0xFFFFFFFF}, SlideShow::kGeneralFailure},
      {kHeaderAt + 540, {0, 99, 0x7FFFFFFF, 0x80000000, 0xFFFFFF9C}, SlideShow::kGeneralFailure},
      {kHeaderAt + 544, {3, 20, 21, 0x7FFFFFFF, 0x80000000, 0xFFFFFFFB}, SlideShow::kGeneralFailure},
      {kFirst + 532, {0, 1, 539, 0x7FFFFFFF, 0x80000000, 0xFFFFFFFF}, SlideShow::kGeneralFailure},
  };
  for (const auto& c : cases) {
    for (const uint32_t value : c.values) {
      Bytes bad = good;
      set_number(bad, c.at, value);
      EXPECT_EQ(c.result, open(file, bad)) << c.at << " " << value;
    }
  }
  for (size_t length = 0; length < good.size(); ++length) {
    const int expected = length < kMarkBytes ? SlideShow::kGeneralFailure : SlideShow::kNotContainer;
    EXPECT_EQ(expected, open(file, Bytes(good.begin(), good.begin() + static_cast<ptrdiff_t>(length))));
  }
  // A last picture that reaches into the end mark, and one without data: that opens but shows nothing.
  Bytes reaching = good;
  reaching.erase(reaching.begin() + static_cast<ptrdiff_t>(mark) - 1);
  EXPECT_EQ(SlideShow::kGeneralFailure, open(file, reaching));
  ContainerImage empty = small_container(file);
  empty.pictures[1].jpeg.clear();
  ASSERT_EQ(1, open(file, empty.bytes()));
  SlideShow show;
  ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
  uint32_t pixel = 0;
  EXPECT_EQ(0, show.GetSizeOfSubfile(1));
  EXPECT_EQ(0, show.GetDrawble(1, &pixel, 1, 1));
  EXPECT_EQ(0, add_sample(show, 8, 8, "in front", 1));
  EXPECT_EQ(empty.bytes(), file.read());
}

// Any byte wrong, any number extreme: a refusal or a usable show.
TEST(Container, SurvivesDamage) {
  const TempFile file;
  const Bytes good = small_container(file).bytes();
  for (size_t at = 0; at < good.size(); ++at) {
    Bytes bad = good;
    bad[at] ^= 0xFF;
    open(file, bad);
  }
  const size_t second = static_cast<size_t>(number_at(good, 100 + 552));
  for (const size_t start : {size_t{100 + 512}, size_t{100 + 628 + 512}, second + 512}) {
    for (size_t at = start; at < start + 36; at += 4) {
      for (const uint32_t value : {0u, 1u, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu}) {
        Bytes bad = good;
        set_number(bad, at, value);
        open(file, bad);
      }
    }
  }
  // Texts without a terminator.
  Bytes endless = good;
  for (const size_t at : {size_t{100}, size_t{100 + 256}, second, second + 256}) {
    std::fill_n(endless.begin() + static_cast<ptrdiff_t>(at), 256, uint8_t{'t'});
  }
  open(file, endless);
}

}  // namespace
}  // namespace tests

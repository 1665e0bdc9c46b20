// Shows in use: creating, adding, inserting, drawing, in a file and in memory.
#include <gtest/gtest.h>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <unistd.h>

#include <climits>
#include <cstring>

#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

TEST(Show, CreatingReplacesTheFile) {
  const TempFile file;
  file.write(Bytes(5000, 'x'));
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  ASSERT_EQ(1, add_sample(show, 20, 20, "old"));
  // The object's own path as the argument, and a show in use: the new one starts empty.
  ASSERT_EQ(1, show.CreateShow(show.pathName, 100, 50));
  EXPECT_EQ(0, show.subfileCount);
  EXPECT_EQ(-1, show.lastIndex);
  ASSERT_EQ(1, add_sample(show, 20, 20, "new"));
  ASSERT_EQ(1, show.OpenShow(show.pathName, 1, 1));
  EXPECT_EQ("new", contents(show)[0].first);
  EXPECT_EQ(100, show.width);
}

TEST(Show, RefusedArgumentsAndPaths) {
  const TempFile file;
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(nullptr, 480, 480));
  EXPECT_EQ(0, show.CreateShow(file.c_str(), 0, 480) + show.CreateShow(file.c_str(), 480, -1));
  EXPECT_EQ(0, show.CreateShow("", 480, 480));
  EXPECT_EQ(0, show.CreateShow(std::string(256, 'a').c_str(), 480, 480));
  EXPECT_EQ(SlideShow::kMemoryMode, show.mode);
  EXPECT_EQ(SlideShow::kGeneralFailure, show.CreateShow((file.path() + "/none").c_str(), 480, 480));
  EXPECT_EQ(SlideShow::kFree, show.mode);

  // 255 bytes are a path.
  const std::string folder = testing::TempDir();
  const std::string longest = folder + std::string(255 - folder.size() - 2, '/') + "tv";
  ASSERT_EQ(255u, longest.size());
  ASSERT_EQ(1, show.CreateShow(longest.c_str(), 480, 480));
  EXPECT_EQ(longest, show.pathName);
  unlink(longest.c_str());

  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  ASSERT_EQ(1, add_sample(show, 20, 20, "A"));
  const std::string missing = file.path() + "none";
  for (const char* path : {static_cast<const char*>(nullptr), "", missing.c_str(), folder.c_str()}) {
    EXPECT_EQ(SlideShow::kGeneralFailure, SlideShow().OpenShow(path, 1, 1));
  }
  EXPECT_EQ(SlideShow::kGeneralFailure, show.OpenShow(file.c_str(), 0, 480));
  EXPECT_EQ(SlideShow::kFree, show.mode);
  EXPECT_EQ(0, add_sample(show, 20, 20, "free"));
}

TEST(Show, SettingsAndPathReachTheHeader) {
  const TempFile file, moved(".moved");
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  ASSERT_EQ(1, add_sample(show, 20, 20, "A"));
  moved.write(file.read());
  show.interval = 9;
  ASSERT_EQ(1, show.SetPathName(moved.c_str()));
  EXPECT_EQ(1, number_at(file.read(), 512));
  EXPECT_EQ(9, number_at(moved.read(), 512));
  EXPECT_STREQ(moved.c_str(), reinterpret_cast<const char*>(moved.read().data()));
  EXPECT_EQ(1, show.SetPathName(show.pathName));
  EXPECT_EQ(0, show.SetPathName(std::string(256, 'a').c_str()));
  // The path stays set when nothing is there to write to.
  EXPECT_EQ(0, show.SetPathName((file.path() + ".none").c_str()));
  EXPECT_EQ(file.path() + ".none", show.pathName);
  // An opened copy leads to the file that its header names.
  file.write(moved.read());
  ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
  EXPECT_EQ(moved.path(), show.pathName);
}

TEST(Show, AWriterFindsTheStreamTaken) {
  const TempFile file;
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  ASSERT_EQ(1, add_sample(show, 20, 20, "A"));
  char byte = 0;
  show.file = stdin;
  EXPECT_EQ(0, show.writeVssHeader("r+b"));
  EXPECT_EQ(0, show.writeSubfileHeader() + show.writeEndMark() + show.writeSubfile(0, &byte));
  EXPECT_EQ(0, show.GetSubfile(0, &byte));
  EXPECT_EQ(stdin, show.file);
  show.file = nullptr;
}

// Counts how often a file is opened: each opening is followed by its close before the next one.
class Openings {
 public:
  explicit Openings(const TempFile& file) : queue_(inotify_init1(IN_NONBLOCK)) {
    inotify_add_watch(queue_, file.c_str(), IN_OPEN | IN_CLOSE);
  }
  ~Openings() { close(queue_); }
  Openings(const Openings&) = delete;
  Openings& operator=(const Openings&) = delete;

  int since_last() const {
    uint32_t words[256];  // an event of one file: its watch, mask, cookie and the length 0 of a name
    const ssize_t bytes = ::read(queue_, words, sizeof words);
    int count = 0;
    for (ssize_t i = 0; i < bytes / 16; ++i) count += (words[4 * i + 1] & IN_OPEN) != 0;
    return count;
  }

 private:
  int queue_;
};

// What is measured is what is stored, whoever replaces the files meanwhile. A cut opens the file by its
// path.
TEST(Show, AnEditOpensItsFilesOnce) {
  const TempFile file, source(".jpg");
  source.write(encode_own(64, 48, 80));
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  const Openings container(file), picture(source);
  const auto openings = [&](int result) {
    EXPECT_EQ(1, result);
    return std::pair(container.since_last(), picture.since_last());
  };
  EXPECT_EQ(std::pair(1, 1), openings(show.AddImageToFile(source.c_str(), "A")));
  EXPECT_EQ(std::pair(1, 1), openings(show.InsertImageToFile(source.c_str(), "B", 0)));
  EXPECT_EQ(std::pair(2, 1), openings(show.AddMusic(source.c_str())));
  EXPECT_EQ(std::pair(2, 0), openings(show.RemoveMusic()));
  ASSERT_EQ(1, show.RemoveImage(0));
  EXPECT_EQ(std::pair(2, 0), openings(show.RemoveSubfile()));
}

TEST(Show, EditsKeepOrderAndLimits) {
  const TempFile file;
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 120, 120));
  ASSERT_EQ(1, add_sample(show, 400, 300, "A"));
  ASSERT_EQ(1, add_sample(show, 50, 40, std::string(300, 'B').c_str()));
  ASSERT_EQ(1, add_sample(show, 90, 200, "C", 0));
  ASSERT_EQ(1, add_sample(show, 10, 10, "D", 2));
  ASSERT_EQ(1, add_sample(show, 11, 11, "E", 4));
  const Bytes before = file.read();
  EXPECT_EQ(0, add_sample(show, 10, 10, "x", 6));
  Bytes text{'n', 'o', ' ', 'p', 'i', 'c', 't', 'u', 'r', 'e'};
  for (const int position : {-1, 1}) {
    EXPECT_EQ(0, show.InsertImageToBuffer(text.data(), 10, "x", position));
  }
  EXPECT_EQ(0, show.AddImageToBuffer(text.data(), 0, "x"));
  EXPECT_EQ(0, show.AddImageToBuffer(nullptr, 10, "x"));
  const std::string folder = testing::TempDir();
  const TempFile pipe(".pipe");
  ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
  for (const char* path :
       {static_cast<const char*>(nullptr), "", folder.c_str(), pipe.c_str(), "/dev/zero"}) {
    EXPECT_EQ(0, show.AddImageToFile(path, "x"));
  }
  EXPECT_EQ(0, add_sample(show, 1000, 2, "too thin to show"));
  EXPECT_EQ(before, file.read());

  const Contents after = reopened(file);
  ASSERT_EQ(5u, after.size());
  EXPECT_EQ(contents(show), after);
  const std::string names[] = {"C", "A", "D", std::string(255, 'B'), "E"};
  for (size_t i = 0; i < 5; ++i) EXPECT_EQ(names[i], after[i].first);
  while (show.subfileCount < 20) ASSERT_EQ(1, add_sample(show, 8, 8, "fill"));
  EXPECT_EQ(0, add_sample(show, 8, 8, "over"));
  EXPECT_EQ(0, add_sample(show, 8, 8, "over", 0));
}

TEST(Show, DisplaySizesFollowTheLongerSide) {
  const struct {
    int showWidth, showHeight, width, height, shownWidth, shownHeight;
  } cases[] = {{480, 480, 1600, 1200, 480, 360},       {480, 480, 1200, 1600, 360, 480},
               {480, 480, 300, 200, 300, 200},         {480, 320, 100, 500, 64, 320},
               {480, 320, 600, 500, 480, 400},         {480, 480, 1000, 2, 480, 0},
               {480, 480, INT_MAX, INT_MAX, 480, 480}, {INT_MAX, 1, INT_MAX - 1, INT_MAX, 0, 1}};
  for (const auto& c : cases) {
    SlideShow show;
    ASSERT_EQ(1, show.CreateShow(nullptr, c.showWidth, c.showHeight));
    show.subfileCount = 1;
    show.subfiles[0].width = c.width;
    show.subfiles[0].height = c.height;
    EXPECT_EQ(c.shownWidth, show.GetSubWidth(0)) << c.width << "x" << c.height;
    EXPECT_EQ(c.shownHeight, show.GetSubHeight(0)) << c.width << "x" << c.height;
    EXPECT_EQ(0, show.GetSubWidth(1));
  }
}

TEST(Show, DrawsFittedOnTransparentBlack) {
  const TempFile file;
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  ASSERT_EQ(1, add_sample(show, 64, 48, "A"));
  std::vector<uint32_t> pixels(100 * 100, 7);
  EXPECT_EQ(0, show.GetDrawble(1, pixels.data(), 10, 10));
  EXPECT_EQ(0, show.GetDrawble(0, nullptr, 10, 10));
  EXPECT_EQ(0, show.GetDrawble(0, pixels.data(), 0, 10));
  EXPECT_EQ(0, show.GetDrawble(0, pixels.data(), 65536, 65536));
  EXPECT_EQ(-1, show.lastIndex);
  EXPECT_EQ(7u, pixels[0]);
  ASSERT_EQ(1, show.GetDrawble(0, pixels.data(), 100, 100));
  EXPECT_EQ(0, show.lastIndex);
  for (int y = 0; y < 100; ++y) {
    for (int x = 0; x < 100; ++x) {
      const bool inside = x >= 18 && x < 82 && y >= 26 && y < 74;
      ASSERT_EQ(inside ? 0xFFu : 0u, pixels[static_cast<size_t>(100 * y + x)] >> 24) << x << " " << y;
    }
  }
}

TEST(Show, MemoryModeNotesAndDrawsFromSources) {
  const TempFile source(".jpg");
  SlideShow show;
  ASSERT_EQ(1, show.CreateShow(nullptr, 480, 480));
  Bytes jpeg = encode_own(640, 20, 80);
  const int size = static_cast<int>(jpeg.size());
  source.write(jpeg);
  ASSERT_EQ(1, show.AddImageToFile(source.c_str(), "file"));
  ASSERT_EQ(1, show.InsertImageToBuffer(jpeg.data(), size, "buffer", 0));
  EXPECT_EQ(0, show.AddImageToFile((source.path() + "none").c_str(), "x"));
  EXPECT_EQ(0, show.writeVssHeader("r+b"));
  EXPECT_EQ(0, show.GetImage(1, jpeg.data()));
  EXPECT_EQ(640, show.subfiles[1].width);

  std::vector<uint32_t> pixels(480 * 15, 7);
  char text[256];
  EXPECT_EQ(0, show.GetLastInformation(text));
  EXPECT_EQ(0, show.GetDrawble(0, pixels.data(), 480, 15));  // its bytes are gone
  EXPECT_EQ(7u, pixels[0]);
  EXPECT_EQ(1, show.GetDrawble(1, pixels.data(), 480, 15));
  EXPECT_EQ(static_cast<int>(source.path().size()), show.GetLastInformation(text));
  EXPECT_STREQ(source.c_str(), text);
  EXPECT_EQ(1, show.GetDrawbleToBuffer(jpeg.data(), size, pixels.data(), 480, 15));
  Bytes unknown(64, 'x');
  EXPECT_EQ(0, show.GetDrawbleToBuffer(unknown.data(), 64, pixels.data(), 480, 15));
  EXPECT_EQ(0u, pixels[0]);  // cleared all the same

  while (show.subfileCount < 1024) ASSERT_EQ(1, show.AddImageToBuffer(jpeg.data(), size, nullptr));
  EXPECT_EQ(0, show.AddImageToBuffer(jpeg.data(), size, nullptr));
}

}  // namespace
}  // namespace tests

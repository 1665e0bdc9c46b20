// Music: whole files against a builder of the test's own, and every failing file call.
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <fstream>
#include <numeric>
#include <optional>

#include "tests/slideshow/show_state.h"

namespace tests {
namespace {

using pelo::faults::allocations;
using pelo::faults::containerCalls;

// Three pictures without music, the second marked for removal in memory.
class MusicEntry : public StoredShow {
 protected:
  MusicEntry() : StoredShow({40, 8, 64}) {
    image.loop = 1;
    open({1});
  }
  Bytes tune(size_t size) {
    Bytes bytes(size);
    std::iota(bytes.begin(), bytes.end(), static_cast<uint8_t>(size));
    for (size_t i = 256; i < size; i += 256) bytes[i] ^= static_cast<uint8_t>(i >> 8);
    source.write(bytes);
    return bytes;
  }
  // Every picture header tells the state in memory.
  ContainerImage written() const {
    ContainerImage after = image;
    after.staleMarks = 0;
    for (auto& picture : after.pictures) picture.state = 2;
    after.pictures[1].state = 3;
    return after;
  }
  // The file with that music. Of the old end marks stays what the data, now longer, does not reach.
  Bytes with(const Bytes& music) const {
    ContainerImage after = written();
    after.music = music;
    after.musicPath = source.path();
    Bytes bytes = after.bytes();
    const Bytes before = image.bytes();
    const size_t end = std::min(bytes.size() - kMarkBytes, before.size());
    bytes.insert(bytes.end() - kMarkBytes, before.begin() + static_cast<ptrdiff_t>(end), before.end());
    return bytes;
  }
  // The same without it: whatever followed the pictures follows them still, and a mark is added.
  Bytes without(const Bytes& with, size_t size) const {
    Bytes bytes = written().bytes();
    bytes.resize(bytes.size() - kMarkBytes);
    bytes.insert(bytes.end(), with.begin() + static_cast<ptrdiff_t>(size + bytes.size()), with.end());
    const Bytes mark = image.bytes();
    bytes.insert(bytes.end(), mark.end() - kMarkBytes, mark.end());
    return bytes;
  }

  TempFile source{".tune"};
};

TEST_F(MusicEntry, GoesInAndOutByteForByte) {
  const size_t whole = image.bytes().size();
  for (const size_t size :
       {size_t{1}, size_t{5}, size_t{12}, size_t{13}, size_t{100}, size_t{628}, size_t{1000}, whole - 12,
        whole, whole + 1, size_t{131071}, size_t{131072}, size_t{131073}, size_t{300000}}) {
    open({1});
    const Bytes expected = with(tune(size));
    ASSERT_EQ(1, show.AddMusic(source.c_str())) << size;
    ASSERT_EQ(expected, file.read()) << size;
    EXPECT_EQ(static_cast<int>(size), show.GetMusicSize());
    EXPECT_EQ(contents(show), reopened(file));
    char text[256];
    EXPECT_EQ(static_cast<int>(source.path().size()), show.GetMusic(text));
    EXPECT_EQ(source.path(), text);
    ASSERT_EQ(0, show.AddMusic(source.c_str()));  // no second one
    ASSERT_EQ(expected, file.read());

    ASSERT_EQ(1, show.RemoveMusic()) << size;
    ASSERT_EQ(without(expected, size), file.read()) << size;
    EXPECT_EQ(0, show.GetMusicSize());
    EXPECT_EQ(0, show.GetMusic(text));
    EXPECT_EQ(contents(show), reopened(file));
  }
}

TEST_F(MusicEntry, RefusalsLeaveShowAndFileAlone) {
  const State state(show);
  tune(0);
  const std::string missing = source.path() + ".none", folder = testing::TempDir();
  const TempFile pipe(".pipe"), link(".link");
  ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
  ASSERT_EQ(0, symlink(pipe.c_str(), link.c_str()));
  for (const char* path : {static_cast<const char*>(nullptr), "", missing.c_str(), folder.c_str(),
                           "/dev/null", pipe.c_str(), link.c_str(), source.c_str()}) {
    EXPECT_EQ(0, show.AddMusic(path));
  }
  EXPECT_EQ(0, show.AddMusic(std::string(256, 'a').c_str()));
  EXPECT_EQ(0, show.RemoveMusic());
  EXPECT_TRUE(state == State(show));
  EXPECT_EQ(image.bytes(), file.read());
}

TEST_F(MusicEntry, OfAShowThatHoldsNothingElse) {
  const Bytes music = tune(5);
  ASSERT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
  ASSERT_EQ(1, show.AddMusic(source.c_str()));
  ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
  EXPECT_EQ(5, show.GetMusicSize());
  // The container itself, whole, as its own music.
  ASSERT_EQ(1, show.RemoveMusic());
  ASSERT_EQ(1, add_sample(show, 16, 16, "A"));
  const Bytes before = file.read();
  ASSERT_EQ(1, show.AddMusic(file.c_str()));
  Bytes after = file.read();
  after.resize(before.size());
  EXPECT_EQ(before, after);
  EXPECT_EQ(1u, reopened(file).size());
}

TEST_F(MusicEntry, IsOnlyNotedInMemory) {
  tune(1000);
  ASSERT_EQ(1, show.CreateShow(nullptr, 480, 480));
  ASSERT_EQ(1, show.AddMusic(source.c_str()));
  EXPECT_EQ(1000, show.GetMusicSize());
  EXPECT_EQ(0, show.AddMusic(source.c_str()));
  ASSERT_EQ(1, show.RemoveMusic());
  EXPECT_EQ(0, show.GetMusicSize());
  EXPECT_STREQ("", show.musicName);
  EXPECT_EQ(0, show.RemoveMusic());
  // 2 GiB and more, without a byte on the disk.
  for (const long long size : {0x7FFFFFFFLL, 0x80000000LL, 5LL << 30}) {
    if (sizeof(off_t) < sizeof size && size > 0x7FFFFFFF) continue;
    ASSERT_EQ(0, truncate(source.c_str(), static_cast<off_t>(size)));
    const bool fits = size == 0x7FFFFFFF;
    EXPECT_EQ(fits, show.AddMusic(source.c_str())) << size;
    if (fits) {
      EXPECT_EQ(1, add_sample(show, 8, 8, "B"));
      ASSERT_EQ(1, show.RemoveMusic());
    }
  }
  open({1});
  ASSERT_EQ(0, truncate(source.c_str(), 0x7FFFFFFF));
  EXPECT_EQ(0, show.AddMusic(source.c_str()));  // no room for the pictures behind it
  EXPECT_EQ(image.bytes(), file.read());
}

// The k-th file call fails: the old file or the new one, and an object that agrees. Going out, a call
// that fails twice may cost the music but no picture.
TEST_F(MusicEntry, GoesInAndOutDespiteAFailingCall) {
  for (const long count : {1, 2, 3}) {
    for (const size_t size : {size_t{5}, size_t{1000}, size_t{9000}, size_t{140000}}) {
      image.staleMarks = size == 9000 ? 500 : 0;  // more than is copied into memory
      const Bytes bare = image.bytes(), full = with(tune(size)), after = without(full, size);
      std::optional<State> state;
      const auto prepare = [&](const Bytes& bytes) {
        file.write(bytes);
        ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
        ASSERT_EQ(1, show.RemoveImage(1));
        state.emplace(show);
      };
      fail_at_each(
          containerCalls, std::min(count, 2L), [&] { prepare(bare); },
          [&] { return show.AddMusic(source.c_str()); },
          [&](int result) {
            ASSERT_EQ(result == 1 ? full : bare, file.read()) << size;
            ASSERT_TRUE(result == 1 || *state == State(show)) << size;
            ASSERT_EQ(contents(show), reopened(file)) << size;
          });
      EXPECT_EQ(full, file.read());
      fail_at_each(
          containerCalls, count, [&] { prepare(full); }, [&] { return show.RemoveMusic(); },
          [&](int result) {
            Bytes expected = result == 1 ? after : full, left = file.read();
            if (result != 1 && count > 1 && left.size() == full.size()) {
              std::copy_n(left.begin(), size, expected.begin());
            }
            ASSERT_EQ(expected, left) << size;
            ASSERT_TRUE(result == 1 || *state == State(show)) << size;
            ASSERT_EQ(contents(show), reopened(file)) << size;
          });
      EXPECT_EQ(after, file.read());
    }
  }
}

// What stands behind the pictures is kept for the way back, but not in memory.
TEST_F(MusicEntry, HoldsNoCopyOfALongFile) {
  constexpr off_t kLong = 32 << 20;
  const Bytes bytes = image.bytes();
  ASSERT_EQ(0, truncate(file.c_str(), kLong));
  std::ofstream(file.path(), std::ios::app)
      .write(reinterpret_cast<const char*>(bytes.data() + bytes.size() - kMarkBytes), kMarkBytes);
  ASSERT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
  tune(1);
  ASSERT_EQ(0, truncate(source.c_str(), kLong));
  const auto peak = [] {
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return usage.ru_maxrss;  // KiB
  };
  const long before = peak();
  ASSERT_EQ(1, show.AddMusic(source.c_str()));
  EXPECT_LT(peak() - before, 8 << 10);
  EXPECT_EQ(3u, reopened(file).size());
}

TEST_F(MusicEntry, NeedsItsMemory) {
  const Bytes bare = image.bytes(), full = with(tune(1000));
  for (const bool goesIn : {true, false}) {
    const State state(show);
    const auto edit = [&] { return goesIn ? show.AddMusic(source.c_str()) : show.RemoveMusic(); };
    fail_at_each(
        allocations, 1, [] {}, edit,
        [&](int result) {
          if (result == 1) return;
          ASSERT_TRUE(state == State(show));
          ASSERT_EQ(goesIn ? bare : full, file.read());
        });
    EXPECT_EQ(goesIn ? full : without(full, 1000), file.read());
  }
}

}  // namespace
}  // namespace tests

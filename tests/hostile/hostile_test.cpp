// Every entry for foreign bytes on cut, damaged and hostile input, in memory that runs out, and stopped
// by the caller: each run ends, inside its buffers, and gives everything back.
#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/samples.h"

namespace tests {
namespace {

Decode run(const Entry& e, TAVIRPELO_DECINFO* d, const Request& r) {
  if (d == nullptr) return {};
  GuardedPixels pixels(r.width, r.height, r.format);
  const int answer = e.run(d, pixels.data(), r);
  EXPECT_TRUE(answer != 0 || d->pFormatInfo == nullptr) << "a failed decode is still there";
  TAVIRPELOI_AbortPNGIter(d);
  TAVIRPELOI_AborAGIF(d);
  TAVIRPELOI_AbortBMPIter(d);
  return {answer, pixels.content()};
}

// On a copy, since decoders may write into their source, in a block of exactly its size.
Decode run(const Entry& e, Bytes file, const Request& r, TAVIRPELO_CHECKFN check = nullptr) {
  const DecInfo d = open_memory(file, r.format, r.option);
  if (d != nullptr) d->CheckFn = check;
  return run(e, d.get(), r);
}

// Sizes, formats and options of every kind, by the place of the damage.
Request any_request(size_t i) {
  std::mt19937 random(static_cast<uint32_t>(i));
  const auto below = [&](int n) { return static_cast<int>(random() % static_cast<uint32_t>(n)); };
  constexpr int kFormats[] = {0, 1, 5, 6, 7, 8, 10, 11};
  return {1 + below(64), 1 + below(64), kFormats[below(8)], static_cast<uint32_t>(random()) & 0x37FF,
          1 + below(40)};
}

// Rows of RGB888 that a decode wrote as the whole decode does; the others must be untouched.
int rows_written(const Bytes& got, const Bytes& whole, int width) {
  const size_t rowBytes = bytes_of(1, width, 1);
  int written = 0;
  for (size_t at = 0; at < got.size(); at += rowBytes) {
    const Bytes row = prefix(suffix(got, at), rowBytes);
    const bool untouched = row == Bytes(rowBytes, kFill);
    EXPECT_TRUE(untouched || row == prefix(suffix(whole, at), rowBytes)) << at / rowBytes;
    written += !untouched;
  }
  return written;
}

class Hostile : public QuietTest, public testing::WithParamInterface<Entry> {
 protected:
  // use(a sample that the entry reads), each.
  template <class Use>
  void each_sample(Use use) {
    for (const Sample& sample : samples()) {
      if (!sample.reads(entry_)) continue;
      SCOPED_TRACE(sample.name);
      use(sample);
    }
  }
  const Entry entry_ = GetParam();
};
INSTANTIATE_TEST_SUITE_P(Entry, Hostile, testing::ValuesIn(entries().begin(), entries().end()),
                         [](const auto& p) { return std::string(p.param.name); });

TEST_P(Hostile, EveryTruncation) {
  each_sample([&](const Sample& sample) {
    const Request r = sample.whole();
    const Decode whole = run(entry_, sample.file, r);
    if (entry_.pixels) EXPECT_EQ(1, whole.answer);
    const size_t step = entry_.pixels || sample.file.size() < 700 ? 1 : 7;
    const bool rows = entry_.pixels && !sample.interlaced && !sample.name.starts_with("jpeg");
    int accepted = 0;
    every_truncation(
        sample.file,
        [&](const Bytes& cut) {
          const Decode part = run(entry_, cut, r);
          if (entry_.name == std::string_view(entry_.format))
            EXPECT_LE(accepted, part.answer) << "a longer part is refused";
          accepted = part.answer != 0;
          run(entry_, cut, any_request(cut.size()));
          if (rows) rows_written(part.pixels, whole.pixels, r.width);
        },
        0, step);
  });
}

TEST_P(Hostile, EveryFlippedByte) {
  each_sample([&](const Sample& sample) {
    const size_t step = sample.file.size() / 600 + 1;
    every_flip(
        sample.file, {0x01, 0x80, 0xFF},
        [&](Bytes damaged, size_t at) {
          if (at % 5 != 0) repair_checksums(damaged);
          run(entry_, damaged, any_request(at));
        },
        1, step);
  });
}

// Sizes, counts, factors, offsets: whatever stands in the file, in either byte order.
TEST_P(Hostile, FieldsAtTheirExtremes) {
  const std::string_view name = entry_.name;  // the others read a file's head as these do
  if (name != entry_.format && name != "gif_frames" && name != "jpeg_exif") return;
  std::vector<Bytes> values;
  for (const uint8_t v : {0, 2, 4, 0x11, 0x44, 0x7F, 0xFE, 0xFF}) values.push_back({v});
  for (const uint32_t v : {0u, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu}) {
    for (const bool big : {false, true}) values.push_back(ByteWriter(big).u32(v));
  }
  each_sample([&](const Sample& sample) {
    for (size_t at = 2; at < std::min<size_t>(sample.file.size(), 640); at += at < 200 ? 1 : 3) {
      for (const Bytes& value : values) {
        Bytes damaged = overwritten(sample.file, at, value);
        repair_checksums(damaged);
        run(entry_, damaged, any_request(at));
      }
    }
  });
}

TEST_P(Hostile, AnyRequest) {
  each_sample([&](const Sample& sample) {
    for (size_t i = 0; i < 300; ++i) run(entry_, sample.file, any_request(i));
  });
}

TEST_P(Hostile, MemoryRunsOutAtEveryAllocation) {
  each_sample([&](const Sample& sample) {
    for (const Request& r : {Request{19, 27, 1, 0x700}, {30, 11, 1, 0x1304}}) {
      // What can be left out, a thumbnail or a later scan, may be missing and the run go on.
      fail_each_allocation([&] { return run(entry_, sample.file, r).answer; },
                           [](int answer) { EXPECT_LE(answer, 4); });
    }
  });
}

// ---- decodes that write pixels ----

TEST_P(Hostile, EverySourceGivesTheSame) {
  if (!entry_.pixels) return;
  each_sample([&](const Sample& sample) {
    const Request r = sample.whole();
    const Decode whole = run(entry_, sample.file, r);
    from_every_source(sample.file, r.format, r.option,
                      [&](TAVIRPELO_DECINFO* d) {
                        const bool refused =
                            sample.name.find("bmp") < 2 && d->pIO->ioType == TAVIRPELO_IO_STREAM;
                        const Decode got = run(entry_, d, r);
                        EXPECT_EQ(refused ? 0 : whole.answer, got.answer);
                        if (!refused) EXPECT_EQ(whole.pixels, got.pixels);
                      },
                      {INT_MAX, 1000, 3, 1});
  });
}

// ---- CheckFn, which JPEG's own tests look at more closely ----

TAVIRPELO_DECINFO* asking;
std::vector<int> rows;  // that it was asked about
int last;               // the one at which a decode is ended

int note(TAVIRPELO_DECINFO* d, int row, int counter) {
  EXPECT_EQ(asking, d);
  EXPECT_EQ(row, counter);
  rows.push_back(row);
  return row != last;
}

// Asked before each step of rows: a row of the file or of the output, whichever there are fewer of.
TEST(RowProgress, EveryFormatAsksAndStops) {
  constexpr uint32_t kStretch = TAVIRPELO_FIT_STRETCH, kGather = 0x1000;
  const struct {
    const char *entry, *sample;
    Size box;
    size_t steps;
    uint32_t option = 0;
    bool passes = false;  // rows are written several times
  } cases[] = {
      {"png", "png, truecolour", {31, 33}, 33},
      {"png", "png, truecolour", {9, 40}, 40, kStretch},
      {"png_by_lines", "png, truecolour", {31, 33}, 33},
      {"png_by_blocks", "png, truecolour", {31, 33}, 33},
      // Rows of the seven passes: 5 + 5 + 4 + 9 + 8 + 17 + 16.
      {"png", "png, alpha, interlaced", {31, 33}, 64, 0, true},
      {"png", "png, alpha, interlaced", {9, 40}, 40, kStretch | kGather},
      {"gif", "gif", {23, 19}, 19},
      {"gif", "gif, interlaced", {23, 19}, 19},
      {"gif", "gif", {23, 70}, 19, kStretch},
      {"gif", "gif", {17, 11}, 11, kStretch},
      {"gif_by_lines", "gif", {23, 19}, 19},
      {"gif_by_lines", "gif, interlaced", {23, 19}, 19},
      {"gif_in_batches", "gif", {23, 19}, 19},
      {"gif_in_batches", "gif", {17, 11}, 11, kStretch},
      {"bmp", "bmp", {21, 14}, 14},
      {"bmp_by_lines", "bmp", {7, 8}, 8, kStretch},
      {"wbmp", "wbmp", {21, 14}, 14},
      {"wbmp", "wbmp", {8, 5}, 5, kStretch},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(std::string(c.entry) + " of " + c.sample);
    Bytes file = sample(c.sample).file;
    const Request r{c.box.width, c.box.height, 1, c.option};
    const DecInfo d = open_memory(file, r.format, r.option);
    const auto run_to = [&](int lastRow) {
      asking = d.get(), last = lastRow, rows.clear();
      d->CheckFn = note;
      return run(entry(c.entry), d.get(), r);
    };
    const Decode whole = run_to(-1);
    EXPECT_EQ(1, whole.answer);
    ASSERT_EQ(c.steps, rows.size());
    EXPECT_EQ(0, rows[0]);
    EXPECT_GT(c.box.height, rows.back());
    const std::vector<int> asked = rows;
    for (size_t i = 1; i < asked.size(); ++i) EXPECT_GE(asked[i], asked[i - 1] + (c.passes ? 0 : 1));
    for (const int k : {0, asked[asked.size() / 2], asked.back()}) {
      const Decode part = run_to(k);
      TAVIRPELO_ERROR error;
      EXPECT_EQ(0, part.answer) << k;
      EXPECT_EQ(1, TAVIRPELO_LastError(&error));
      EXPECT_EQ(TAVIRPELO_REASON_CANCELLED, error.reason);
      EXPECT_EQ(k, rows.back());
      if (!c.passes || k == 0) EXPECT_EQ(k, rows_written(part.pixels, whole.pixels, c.box.width));
    }
  }
}

}  // namespace
}  // namespace tests

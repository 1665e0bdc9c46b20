// Every entry for foreign bytes on cut, damaged and hostile input, in memory that runs out, and stopped
// by the caller: each run ends, inside its buffers, and gives everything back.
#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/samples.h"

namespace tests {
namespace {

Decode run(const Entry& e, TAVIRPELO_DECINFO* d, const Request& r) {
  if (d == nullptr) return {};
  TAVIRPELO_SetDecMode(d, r.mode);
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
          1 + below(40), below(5)};
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

// Whether an entry refuses files without their end; the others show what is there.
bool needs_all(const Entry& e) {
  const std::string_view format = e.format;
  return format == "png" || format == "wbmp" || std::string_view(e.name).starts_with("gif_frames");
}

TEST_P(Hostile, EveryTruncation) {
  each_sample([&](const Sample& sample) {
    const Request r = sample.whole();
    const Decode whole = run(entry_, sample.file, r);
    if (entry_.pixels) EXPECT_EQ(1, whole.answer);
    const bool jpeg = sample.name.starts_with("jpeg");
    const bool inOneCall = entry_.name == std::string_view(entry_.format);
    const bool rows = entry_.pixels && !sample.interlaced && !jpeg;
    const size_t step = entry_.pixels || sample.file.size() < 700 ? 1 : 7;
    int accepted = 0;
    const auto use = [&](const Bytes& cut) {
      const Decode part = run(entry_, cut, r);
      if (needs_all(entry_)) EXPECT_EQ(0, part.answer) << cut.size();
      if (inOneCall) EXPECT_LE(accepted, part.answer) << "a longer part is refused";
      if (rows && !inOneCall) EXPECT_EQ(run(entry(entry_.format), cut, r).answer, part.answer);
      accepted = part.answer != 0;
      if (inOneCall && sample.name.starts_with("png")) {
        from_every_source(cut, r.format, r.option,
                          [&](TAVIRPELO_DECINFO* d) { EXPECT_EQ(0, run(entry_, d, r).answer); });
      }
      run(entry_, cut, any_request(cut.size()));
      if (rows) rows_written(part.pixels, whole.pixels, r.width);
    };
    every_truncation(sample.file, use, 0, step);
    if (inOneCall) EXPECT_EQ(!needs_all(entry_), accepted);
    // Without EOI alone nothing is lost.
    if (inOneCall && jpeg)
      EXPECT_EQ(whole.pixels, run(entry_, prefix(sample.file, sample.file.size() - 2), r).pixels);
  });
}

TEST_P(Hostile, EveryFlippedByte) {
  each_sample([&](const Sample& sample) {
    const size_t step = sample.file.size() / 600 + 1;
    const bool checked = entry_.format == std::string_view("png");
    const auto use = [&](Bytes damaged, size_t at) {
      const int answer = run(entry_, damaged, any_request(at)).answer;
      if (!checked) return;
      EXPECT_EQ(0, answer) << "no checksum notices byte " << at;
      repair_checksums(damaged);
      run(entry_, damaged, any_request(at));
    };
    every_flip(sample.file, {0x01, 0x80, 0xFF}, use, 1, step);
  });
}

// Sizes, counts, factors, offsets: whatever stands in the file, in either byte order.
TEST_P(Hostile, FieldsAtTheirExtremes) {
  const std::string_view name = entry_.name;  // the others read a file's head as these do
  if (name != entry_.format && name != "gif_frames" && name != "jpeg_exif") return;
  std::vector<Bytes> bytes, values;
  for (int v = 0; v < 256; ++v) bytes.push_back({static_cast<uint8_t>(v)});
  for (const size_t v : {0, 2, 4, 0x11, 0x44, 0x7F, 0xFE, 0xFF}) values.push_back(bytes[v]);
  for (const bool big : {false, true}) {
    for (const int v : {1, 22, 24, 255, 256, 4095, 32767}) values.push_back(ByteWriter(big).u16(v));
    for (const uint32_t v : {0u, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu})
      values.push_back(ByteWriter(big).u32(v));
  }
  each_sample([&](const Sample& sample) {
    const auto try_all = [&](size_t at, const std::vector<Bytes>& replacements) {
      for (const Bytes& value : replacements) {
        Bytes damaged = overwritten(sample.file, at, value);
        repair_checksums(damaged);
        run(entry_, damaged, any_request(at));
      }
    };
    for (size_t at = 2; at < std::min<size_t>(sample.file.size(), 640); ++at) {
      try_all(at, values);
      // The heads of a GIF are mostly flags.
      if (at < 90 && entry_.format == std::string_view("gif")) try_all(at, bytes);
    }
  });
}

TEST_P(Hostile, AnyRequest) {
  each_sample([&](const Sample& sample) {
    for (size_t i = 0; i < 300; ++i) run(entry_, sample.file, any_request(i));
  });
}

// A JPEG's thumbnail or later scan may be left out and the run go on; other pictures fail.
TEST_P(Hostile, MemoryRunsOutAtEveryAllocation) {
  each_sample([&](const Sample& sample) {
    const int lines = sample.whole().lines;
    for (const Request& r : {Request{19, 27, 1, 0x700, lines}, {30, 11, 1, 0x1304, lines, 4}}) {
      const int good = run(entry_, sample.file, r).answer;
      const int most = entry_.pixels && !sample.name.starts_with("jpeg") ? 0 : 4;
      EXPECT_EQ(good, fail_each_allocation([&] { return run(entry_, sample.file, r).answer; },
                                           [&](int answer) { EXPECT_LE(answer, most); }));
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
      {"gif_frames", "gif, framed", {30, 20}, 20},
      {"gif_frames_in_batches", "gif, framed", {30, 9}, 9, kStretch},
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
    EXPECT_TRUE(whole.answer == 1 || whole.answer == 3);
    EXPECT_EQ(sample(c.sample).size.width, d->imageWidth);
    EXPECT_EQ(sample(c.sample).size.height, d->imageHeight);
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

// Decodes by lines, blocks, batches, bands and frames: the same pixels as in one call, whatever the
// split, and another request ends what is under way.
#include <functional>

#include "codec/formats/format.h"
#include "tests/support/gif_builder.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/samples.h"

namespace tests {
namespace {

Bytes pixels_of(const Entry& e, Bytes file, const Request& r) {
  const DecInfo d = open_memory(file, r.format, r.option);
  GuardedPixels pixels(r.width, r.height, r.format);
  const int answer = e.run(d.get(), pixels.data(), r);
  EXPECT_TRUE(answer == 1 || answer == 3) << e.name << " " << answer;
  EXPECT_EQ(nullptr, d->pFormatInfo);
  return pixels.content();
}

constexpr uint32_t kStretch = TAVIRPELO_FIT_STRETCH | TAVIRPELO_THUMBNAIL_NEVER;

class Pieces : public testing::TestWithParam<Entry> {};
INSTANTIATE_TEST_SUITE_P(Entry, Pieces, testing::ValuesIn([] {
                           std::vector<Entry> split;
                           for (const Entry& e : entries()) {
                             if (e.pixels && e.name != std::string_view(e.format)) split.push_back(e);
                           }
                           return split;
                         }()),
                         [](const auto& p) { return std::string(p.param.name); });

// Whether lines of a picture come as from one call: not from files that hold them in another order, and
// a GIF made smaller on both sides is averaged in one call, sampled by lines.
bool alike(const Entry& e, const Sample& sample, const Request& r) {
  const std::string_view name = e.name;
  if (name == "png_by_lines")
    return !sample.interlaced || std::min(r.lines, r.height) == sample.size.height;
  if (name == "gif_by_lines") return r.width >= sample.size.width || r.height >= sample.size.height;
  return true;
}

TEST_P(Pieces, EqualTheWhole) {
  const Entry& e = GetParam();
  for (const Sample& sample : samples()) {
    if (!sample.reads(e)) continue;
    const auto [width, height] = sample.size;
    for (const Size size : {sample.size,
                            Size{width / 2, height / 2},
                            {width - 7, height / 4},
                            {2 * width + 5, 3 * height},
                            {width / 3, height + 11},
                            {1, 1}}) {
      for (const int format : {0, 1, 7}) {
        Request r{size.width, size.height, format, kStretch};
        const Bytes whole = pixels_of(entry(e.format), sample.file, r);
        for (const int lines : {1, 2, 3, 7, 16, size.height, 1000}) {
          r.lines = lines;
          if (!alike(e, sample, r)) continue;
          ASSERT_EQ(whole, pixels_of(e, sample.file, r))
              << sample.name << " " << size.width << "x" << size.height << " " << format << " " << lines;
        }
      }
    }
  }
}

// ---- what ends a decode that is under way ----

template <auto Decode, int kLines = 5>
int lines(TAVIRPELO_DECINFO* d, void* pixels, int width, int height) {
  return Decode(d, pixels, width, height, kLines);
}

struct Step {
  const char* sample;
  Decoder step, whole;
  int (*abort)(TAVIRPELO_DECINFO*);
  Decoder noLines = nullptr;  // the same for an impossible number of them
};
constexpr Step kSteps[] = {
    {"png, truecolour", lines<TAVIRPELOI_DecodePNGLine>, TAVIRPELOI_DecodePNG, TAVIRPELOI_AbortPNGIter,
     lines<TAVIRPELOI_DecodePNGLine, -1>},
    {"png, truecolour", TAVIRPELOI_DecodePNGIter, TAVIRPELOI_DecodePNG, TAVIRPELOI_AbortPNGIter},
    {"gif", lines<TAVIRPELOI_DecodeGIFLine>, TAVIRPELOI_DecodeGIF, TAVIRPELOI_AborAGIF,
     lines<TAVIRPELOI_DecodeGIFLine, 0>},
    {"gif", TAVIRPELOI_DecodeGIFIter, TAVIRPELOI_DecodeGIF, TAVIRPELOI_AbortGIFIter},
    {"gif", TAVIRPELOI_DecodeAGIF, TAVIRPELOI_DecodeGIF, TAVIRPELOI_AborAGIF},
    {"gif", TAVIRPELOI_DecodeAGIFIter, TAVIRPELOI_DecodeGIF, TAVIRPELOI_AborAGIF},
    {"bmp", lines<TAVIRPELOI_DecodeBMPLine>, TAVIRPELOI_DecodeBMP, TAVIRPELOI_AbortBMPIter},
};

TEST(PiecesEnded, ByAnotherRequestOrTheCaller) {
  for (const Step& s : kSteps) {
    SCOPED_TRACE(&s - kSteps);
    const auto [width, height] = sample(s.sample).size;
    Bytes file = sample(s.sample).file;
    GuardedPixels pixels(width + 1, height, 7);
    DecInfo object;
    TAVIRPELO_DECINFO* d = nullptr;
    const auto step = [&](int w, int h) { return s.step(d, pixels.data(), w, h); };
    const auto start = [&] {
      object = open_memory(file, 7);
      d = object.get();
      ASSERT_NE(0, step(width, height));
      ASSERT_NE(nullptr, d->pFormatInfo);
    };
    // Each differs in one thing.
    const std::function<int()> others[] = {
        [&] { return step(width, height - 1); },
        [&] { return step(width + 1, height); },
        [&] { return d->outFormat = 1, step(width, height); },
        [&] { return d->option = TAVIRPELO_ROTATE_90, step(width, height); },
    };
    for (const auto& other : others) {
      start();
      EXPECT_EQ(0, other()) << &other - others;
      EXPECT_EQ(nullptr, d->pFormatInfo) << &other - others;
    }
    start();
    EXPECT_EQ(0, step(width, -5));
    EXPECT_EQ(0, s.step(d, nullptr, width, height));
    if (s.noLines != nullptr) EXPECT_EQ(0, s.noLines(d, pixels.data(), width, height));
    EXPECT_NE(nullptr, d->pFormatInfo) << "what is no request changes nothing";
    EXPECT_EQ(1, s.whole(d, pixels.data(), 10, 10)) << "a decode in one call starts afresh";
    EXPECT_EQ(nullptr, d->pFormatInfo);
    start();
    EXPECT_EQ(1, s.abort(d));
    EXPECT_EQ(nullptr, d->pFormatInfo);
    EXPECT_EQ(0, s.abort(nullptr));
    // Another decoder's state is left alone.
    pelo::FormatState foreign{s.sample[0] == 'g' ? pelo::FormatKind::kBmp : pelo::FormatKind::kGif};
    d->pFormatInfo = &foreign;
    const Bytes before = pixels.content();
    EXPECT_EQ(0, step(8, 8));
    EXPECT_EQ(0, s.whole(d, pixels.data(), 8, 8));
    EXPECT_EQ(0, s.abort(d));
    EXPECT_EQ(&foreign, d->pFormatInfo);
    EXPECT_EQ(before, pixels.content());
    d->pFormatInfo = nullptr;
  }
}

TEST(PiecesEnded, ByADecodeOfAnotherKind) {
  constexpr Decoder kKinds[] = {lines<TAVIRPELOI_DecodeGIFLine>, TAVIRPELOI_DecodeGIFIter,
                                TAVIRPELOI_DecodeAGIF};
  Bytes file = sample("gif").file;
  GuardedPixels pixels(23, 19, 7);
  for (const Decoder kind : kKinds) {
    for (const Decoder other : kKinds) {
      if (kind == other) continue;
      const DecInfo d = open_memory(file, 7);
      ASSERT_NE(0, kind(d.get(), pixels.data(), 23, 19));
      EXPECT_EQ(0, other(d.get(), pixels.data(), 23, 19));
      EXPECT_EQ(nullptr, d->pFormatInfo);
    }
  }
}

// What each call answers, the rows that it leaves alone, and when the decode ends.
TEST(PiecesOfRows, CallsAndAnswers) {
  const struct {
    const char* sample;
    int (*decode)(TAVIRPELO_DECINFO*, void*, int, int, int);
    int more;  // answer of a call that is not the last
  } cases[] = {{"png, truecolour", TAVIRPELOI_DecodePNGLine, 4},
               {"gif", TAVIRPELOI_DecodeGIFLine, 1},
               {"gif, interlaced", TAVIRPELOI_DecodeGIFLine, 1}};
  for (const auto& c : cases) {
    const auto [width, height] = sample(c.sample).size;
    Bytes file = sample(c.sample).file;
    for (const Size size : {Size{width, height}, {width + 3, 2 * height}, {width, height / 3}}) {
      for (int rows = 1; rows <= size.height + 1; ++rows) {
        const DecInfo d = open_memory(file, 7, kStretch);
        for (int row = 0; row < size.height; row += rows) {
          GuardedPixels band(size.width, rows, 7);
          const bool last = row + rows >= size.height;
          ASSERT_EQ(last ? 1 : c.more, c.decode(d.get(), band.data(), size.width, size.height, rows));
          ASSERT_EQ(last, d->pFormatInfo == nullptr) << rows << " from " << row;
          const int used = std::min(rows, size.height - row);
          const Bytes rest = suffix(band.content(), bytes_of(7, size.width, used));
          EXPECT_EQ(Bytes(rest.size(), kFill), rest);
        }
      }
    }
  }
  // A GIF in batches of sixteen of its rows, behind a first call that only begins.
  for (const int height : {15, 16, 17, 48}) {
    Bytes file = sample_gif(10, height, 3).bytes();
    const DecInfo d = open_memory(file, 7);
    GuardedPixels pixels(10, height, 7);
    int calls = 1;
    while (TAVIRPELOI_DecodeGIFIter(d.get(), pixels.data(), 10, height) == 4) ++calls;
    EXPECT_EQ(1 + (height + 15) / 16, calls);
  }
}

// Made smaller on both sides, lines of a GIF are sampled, not averaged, and turned requests come
// unturned: alike whatever the split.
TEST(PiecesOfRows, ReducedLinesOfAGif) {
  const auto by_lines = [](int rows, uint32_t option) {
    return pixels_of(entry("gif_by_lines"), sample("gif").file, {15, 11, 7, option, rows});
  };
  for (const int rows : {2, 7}) {
    EXPECT_EQ(by_lines(11, 0x700), by_lines(rows, 0x700));
    EXPECT_EQ(by_lines(11, 0x700), by_lines(rows, 0x704));
  }
}

// Each frame of an animation in batches, which a decode in one call may take over.
TEST(PiecesEnded, FramesGoOnInEitherForm) {
  GifFile file = sample_gif(40, 50, 4);
  for (int i = 0; i < 2; ++i) file.images.push_back(sample_gif(40, 50, 3, i == 0).images[0]);
  for (const Request& r : {Request{40, 50, 7, 0}, {17, 99, 7, 0x700}, {60, 60, 7, 0xC}}) {
    Bytes bytes = file.bytes();
    const DecInfo whole = open_memory(bytes, 7, r.option), parts = open_memory(bytes, 7, r.option);
    for (int frame = 0; frame < 3; ++frame) {
      GuardedPixels want(r.width, r.height, 7), got(r.width, r.height, 7);
      const int answer = frame < 2 ? 1 : 3;
      ASSERT_EQ(answer, TAVIRPELOI_DecodeAGIF(whole.get(), want.data(), r.width, r.height));
      int part = 4, calls = 0;
      for (; part == 4; ++calls) {
        const Decoder form =
            frame == 1 && calls == 2 ? TAVIRPELOI_DecodeAGIF : TAVIRPELOI_DecodeAGIFIter;
        part = form(parts.get(), got.data(), r.width, r.height);
      }
      EXPECT_EQ(answer, part);
      EXPECT_LT(2, calls);
      EXPECT_EQ(want.content(), got.content()) << frame;
    }
    EXPECT_EQ(nullptr, parts->pFormatInfo);
  }
}

}  // namespace
}  // namespace tests

// Decodes in several calls: the same pixels as in one, whatever the split, and no mixing of requests.
#include <functional>

#include "codec/formats/format.h"
#include "codec/formats/gif/record.h"
#include "tests/gif/gif_decode.h"

namespace tests {
namespace {

struct Request {
  int width, height;
  uint32_t option;
};

std::vector<GifFile> pictures() {
  std::vector<GifFile> files;
  for (const bool interlaced : {false, true}) {
    files.push_back(sample_gif(53, 41, 5, interlaced));
    GifImage smaller = sample_gif(20, 24, 3, interlaced).images[0];
    smaller.left = 9, smaller.top = 8, smaller.control = GifControl{0, 0, 2};
    files.push_back({53, 41, sample_palette(8), {smaller}});
  }
  return files;
}

// Lines are delivered at the top of each call's buffer; rows above and below the image are untouched.
Bytes by_lines(const GifFile& file, const Request& r, int lines, int format = 7) {
  Bytes bytes = file.bytes(), all;
  const DecInfo decInfo = open_memory(bytes, format, r.option);
  for (int row = 0; row == 0 || row < decInfo->outHeight; row += lines) {
    GuardedPixels pixels(r.width, lines, format);
    EXPECT_EQ(1, TAVIRPELOI_DecodeGIFLine(decInfo.get(), pixels.data(), r.width, r.height, lines));
    EXPECT_EQ(row + lines < decInfo->outHeight, decInfo->pFormatInfo != nullptr) << row << " " << lines;
    const size_t used = bytes_of(format, r.width, std::min(lines, decInfo->outHeight - row));
    const Bytes rest = suffix(pixels.content(), used);
    EXPECT_EQ(Bytes(rest.size(), kFill), rest);
    append(all, prefix(pixels.content(), used));
  }
  return all;
}

TEST(GifResume, LinesInAnySplit) {
  for (const GifFile& file : pictures()) {
    const Request requests[] = {
        {53, 41, 0}, {61, 41, 0}, {53, 20, 0x700}, {80, 90, 0x700}, {53, 41, 0x100}};
    for (const Request& r : requests) {
      for (const int format : {1, 7}) {
        const Bytes whole = decode_gif(file.bytes(), r.width, r.height, format, r.option).pixels;
        for (int lines = 1; lines <= r.height + 1; ++lines) {
          ASSERT_EQ(whole, by_lines(file, r, lines, format)) << r.width << " " << lines;
        }
      }
    }
    // Reduced on both sides, lines are sampled, not averaged; turned requests come unturned.
    const Bytes reduced = by_lines(file, {20, 15, 0x700}, 4);
    EXPECT_EQ(reduced, by_lines(file, {20, 15, 0x700}, 15));
    EXPECT_EQ(reduced, by_lines(file, {20, 15, 0x704}, 7));
  }
}

TEST(GifResume, BatchesOfSixteenRows) {
  for (const GifFile& file : pictures()) {
    for (const Request& r : {Request{53, 41, 0}, {20, 15, 0}, {53, 15, 0x700}, {60, 60, 0x4}}) {
      Bytes bytes = file.bytes();
      const DecInfo decInfo = open_memory(bytes, 7, r.option);
      GuardedPixels pixels(r.width, r.height, 7);
      std::vector<int> answers;
      do {
        answers.push_back(TAVIRPELOI_DecodeGIFIter(decInfo.get(), pixels.data(), r.width, r.height));
      } while (answers.back() == 4 && answers.size() < 100);
      EXPECT_EQ(1, answers.back());
      EXPECT_EQ(static_cast<size_t>(1 + (file.images[0].height + 15) / 16), answers.size());
      EXPECT_EQ(nullptr, decInfo->pFormatInfo);
      EXPECT_EQ(decode_gif(bytes, r.width, r.height, 7, r.option).pixels, pixels.content());
    }
  }
}

TEST(GifResume, FramesInBatches) {
  GifFile file = sample_gif(40, 50, 4);
  file.images.push_back(pictures()[3].images[0]);
  file.images.push_back(file.images[0]);
  file.images[2].interlaced = true;
  for (const Request& r : {Request{40, 50, 0}, {17, 99, 0x700}, {60, 60, 0xC}}) {
    const GifFrames whole = decode_frames(file.bytes(), r.width, r.height, 7, r.option);
    ASSERT_EQ(3u, whole.frames.size());
    Bytes bytes = file.bytes();
    const DecInfo decInfo = open_memory(bytes, 7, r.option);
    for (size_t i = 0; i < 3; ++i) {
      GuardedPixels pixels(r.width, r.height, 7);
      int answer, calls = 0;
      do {
        answer = TAVIRPELOI_DecodeAGIFIter(decInfo.get(), pixels.data(), r.width, r.height);
        // The one-call form takes over in the middle of a frame.
        if (i == 1 && ++calls == 2) {
          answer = TAVIRPELOI_DecodeAGIF(decInfo.get(), pixels.data(), r.width, r.height);
        }
      } while (answer == 4);
      EXPECT_EQ(i < 2 ? 1 : 3, answer);
      EXPECT_EQ(whole.frames[i], pixels.content()) << i;
    }
    EXPECT_EQ(nullptr, decInfo->pFormatInfo);
  }
}

TEST(GifResume, AnotherRequestEndsTheDecode) {
  Bytes bytes = sample_gif(30, 30, 4).bytes(), output(30 * 40 * 4);
  const DecInfo decInfo = open_memory(bytes, 7);
  TAVIRPELO_DECINFO* d = decInfo.get();
  const auto lines = [&](int width, int height) {
    return TAVIRPELOI_DecodeGIFLine(d, output.data(), width, height, 5);
  };
  const auto started = [&] { return lines(30, 30) == 1 && d->pFormatInfo != nullptr; };
  const std::function<int()> others[] = {
      [&] { return lines(30, 40); },
      [&] { return lines(29, 30); },
      [&] { return d->outFormat = 1, lines(30, 30); },
      [&] { return d->option = 4, lines(30, 30); },
      [&] { return TAVIRPELOI_DecodeGIFIter(d, output.data(), 30, 30); },
      [&] { return TAVIRPELOI_DecodeAGIF(d, output.data(), 30, 30); },
  };
  for (const auto& other : others) {
    ASSERT_TRUE(started());
    EXPECT_EQ(0, other());
    EXPECT_EQ(nullptr, d->pFormatInfo);
    d->outFormat = 7;
    d->option = 0;
  }
  ASSERT_TRUE(started());
  EXPECT_EQ(0, TAVIRPELOI_DecodeGIFLine(d, output.data(), 30, 30, 0));
  EXPECT_NE(nullptr, d->pFormatInfo) << "a call for no rows changes nothing";
  EXPECT_EQ(0, TAVIRPELOI_DecodeGIFLine(d, nullptr, 30, 30, 5));
  EXPECT_EQ(0, lines(-1, 30));
  EXPECT_EQ(1, TAVIRPELOI_DecodeGIF(d, output.data(), 10, 10)) << "a whole decode starts afresh";
  EXPECT_EQ(nullptr, d->pFormatInfo);
  ASSERT_TRUE(started());
  EXPECT_EQ(1, TAVIRPELOI_AborAGIF(d));
  EXPECT_EQ(nullptr, d->pFormatInfo);
  EXPECT_EQ(1, TAVIRPELOI_AbortGIFIter(d));
  EXPECT_EQ(0, TAVIRPELOI_AbortGIFIter(nullptr));
  // Another decoder's state is left alone.
  pelo::FormatState foreign{pelo::FormatKind::kBmp};
  d->pFormatInfo = &foreign;
  const Bytes before = output;
  EXPECT_EQ(0, TAVIRPELOI_DecodeGIF(d, output.data(), 8, 8));
  EXPECT_EQ(0, lines(8, 8));
  EXPECT_EQ(0, TAVIRPELOI_DecodeGIFIter(d, output.data(), 8, 8));
  EXPECT_EQ(0, TAVIRPELOI_DecodeAGIF(d, output.data(), 8, 8));
  EXPECT_EQ(0, TAVIRPELOI_AbortGIFIter(d));
  EXPECT_EQ(&foreign, d->pFormatInfo);
  EXPECT_EQ(before, output);
  d->pFormatInfo = nullptr;
}

TEST(GifResume, EverySourceGivesTheSame) {
  GifFile file = sample_gif(120, 90, 8);
  file.images.push_back(file.images[0]);
  const Bytes want = decode_gif(file.bytes(), 120, 90).pixels;
  from_every_source(file.bytes(), 7, 0,
                    [&](TAVIRPELO_DECINFO* decInfo) {
                      EXPECT_EQ(want, decode(TAVIRPELOI_DecodeGIF, decInfo, 120, 90).pixels);
                      Bytes frame(want.size());
                      for (const int answer : {1, 3})
                        EXPECT_EQ(answer, TAVIRPELOI_DecodeAGIF(decInfo, frame.data(), 120, 90));
                      EXPECT_EQ(want, frame);
                    },
                    {INT_MAX, 1000, 1});
}

}  // namespace
}  // namespace tests

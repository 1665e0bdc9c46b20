// Damaged, cut and contradictory files, and memory that runs out: every decode ends inside its buffers.
#include "tests/gif/gif_decode.h"
#include "tests/support/failures.h"

namespace tests {
namespace {

// A source that claims to be longer than it is has not simply ended.
TEST(GifHostile, ShorterThanItSays) {
  MemoryStream stream{prefix(animated_gif().bytes(), 120)};
  const DecInfo decInfo = open_stream(stream, 7);
  decInfo->pIO->size = 300;
  EXPECT_EQ(0, decode(TAVIRPELOI_DecodeGIF, decInfo.get(), 23, 19).answer);
}

// Where each image's data begin and end, found without the library in a file of sub-blocks, extensions
// and images.
std::vector<std::pair<size_t, size_t>> image_data_places(const Bytes& file) {
  const auto table = [](int flags) { return flags & 0x80 ? size_t{6} << (flags & 7) : 0; };
  const auto behind_sub_blocks = [&](size_t at) {
    while (file[at] != 0) at += file[at] + 1u;
    return at + 1;
  };
  std::vector<std::pair<size_t, size_t>> places;
  for (size_t at = 13 + table(file[10]); file[at] != 0x3B;) {
    const bool image = file[at] == 0x2C;
    const size_t data = at + (image ? 11 + table(file[at + 9]) : 2);
    at = behind_sub_blocks(data);
    if (image) places.emplace_back(data, at);
  }
  return places;
}

// Data with any byte in them, trailers and separators too: only the file's own trailer ends it with 3.
TEST(GifHostile, AnimationsCutAnywhere) {
  GifFile file = sample_gif(40, 30);
  for (int i = 1; i < 4; ++i) {
    file.images.push_back(file.images[0]);
    file.images.back().indices = sample_indices(40, 30, 256, 77u + static_cast<uint32_t>(i));
  }
  const Bytes bytes = file.bytes();
  const GifFrames all = decode_frames(bytes, 40, 30);
  EXPECT_EQ(3, all.answer);
  const auto places = image_data_places(bytes);
  ASSERT_EQ(4u, places.size());
  every_truncation(bytes, [&](const Bytes& cut) {
    const auto starts = [&](const auto& place) { return place.first <= cut.size(); };
    const auto frames = std::max<size_t>(1, std::count_if(places.begin(), places.end(), starts));
    from_every_source(cut, 7, 0, [&](TAVIRPELO_DECINFO* decInfo) {
      if (decInfo == nullptr) return;
      for (size_t i = 0; i < frames; ++i) {
        Bytes frame(40 * 30 * 4);
        ASSERT_EQ(i + 1 < frames ? 1 : 0, TAVIRPELOI_DecodeAGIF(decInfo, frame.data(), 40, 30))
            << cut.size() << " " << i;
        if (places[i].second <= cut.size()) ASSERT_EQ(all.frames[i], frame) << cut.size();
      }
    });
  });
}

// More data than the image has pixels, none, and a sub-block that ends it without an end code.
TEST(GifHostile, TooMuchAndTooLittleData) {
  GifFile file = animated_gif();
  const auto second = [&] { return decode_frames(file.bytes(), 23, 19); };
  const Bytes expected = second().frames[1];
  for (const auto& [width, height] : {std::pair(23, 18), {23, 1}, {23, 0}, {0, 19}}) {
    GifFile less = file;
    less.images[0].width = width, less.images[0].height = height;
    EXPECT_EQ(1, decode_gif(less.bytes(), 23, 19).answer);
    EXPECT_EQ(3, decode_frames(less.bytes(), 23, 19).answer) << "surplus data are not taken for blocks";
  }
  file.images[0].lzw.endCode = false;
  EXPECT_EQ(expected, second().frames[1]);
  for (const Bytes& data : {Bytes{3, 0}, Bytes{3, 2, 0x08, 0x3B, 3, 0x3B, 0x2C, 0x3B, 0}}) {
    file.images[0].data = data;
    EXPECT_EQ(3, second().answer);
  }
}

// Sizes that the header claims are not taken from memory: what is refused stays within a few megabytes.
TEST(GifHostile, HugeSizes) {
  GifFile file{65535, 65535, {}, {{.width = 65535, .height = 65535, .interlaced = true}}};
  file.images[0].data = Bytes{2, 2, 0x44, 0x01, 0};
  const Bytes bytes = file.bytes();
  const long before = peak_kib("VmPeak");
  EXPECT_EQ(1, decode_gif(bytes, 40, 40).answer);
  EXPECT_EQ(0, decode_frames(bytes, 40, 40).answer);
  EXPECT_LT(peak_kib("VmPeak") - before, 64 * 1024);
  // Every index of a large screen out of little data: counted, not written.
  file.images[0].interlaced = false;
  GifCodes codes{{4, 3}, {1, 3}};
  int width = 3;
  for (int next = 6; next < 4096; ++next) {
    codes.emplace_back(next, width);
    if (next + 1 == 1 << width && width < 12) ++width;
  }
  codes.insert(codes.end(), 50000, {4095, 12});
  file.images[0].data = image_data(2, pack_codes(codes));
  EXPECT_EQ(1, decode_gif(file.bytes(), 7, 7).answer);
}

// The largest canvas: what no image paints takes no memory.
TEST(GifHostile, EmptyScreens) {
  GifFile file{8191, 8191, {}, {{.width = 8191, .height = 8191}, {.width = 1, .height = 1}}};
  for (GifImage& image : file.images) image.data = Bytes{2, 1, 0x05, 0};
  const long before = peak_kib("VmHWM");
  EXPECT_EQ(3, decode_frames(file.bytes(), 40, 40).answer);
#ifdef __SANITIZE_ADDRESS__
  constexpr long kShadow = 32 * 1024;  // an eighth of the canvas
#else
  constexpr long kShadow = 0;
#endif
  EXPECT_LT(peak_kib("VmHWM") - before, kShadow + 10 * 1024);
}

}  // namespace
}  // namespace tests

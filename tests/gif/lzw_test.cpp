// Code streams that no encoder writes, and the steps of the translation table.
#include "codec/formats/gif/gif_abi.h"
#include "tests/gif/gif_decode.h"

namespace tests {
namespace {

// A file of one image with the given codes.
GifFile coded(int width, int height, int minimumCodeSize, const GifCodes& codes) {
  GifFile file{width, height, sample_palette(256), {{.width = width, .height = height}}};
  file.images[0].data = image_data(minimumCodeSize, pack_codes(codes));
  return file;
}

// The red channel tells the index; -1 where nothing was written.
std::vector<int> decoded(const GifFile& file, int answer = 1) {
  const Decode result = decode_gif(file.bytes(), file.width, file.height);
  EXPECT_EQ(answer, result.answer);
  std::vector<int> indices;
  for (size_t i = 0; i < result.pixels.size(); i += 4) {
    indices.push_back(result.pixels[i + 3] == kFill ? -1 : 255 - result.pixels[i]);
  }
  return indices;
}

TEST(GifLzw, StartsAndEnds) {
  struct {
    const char* what;
    GifCodes codes;
    std::vector<int> indices;  // none: nothing is written
  } const cases[] = {
      {"the end code first", {{5, 3}}, {}},
      {"after clear codes", {{4, 3}, {4, 3}, {5, 3}}, {}},
      {"no data", {}, {}},
      {"no clear code", {{1, 3}, {2, 3}, {3, 3}, {5, 4}}, {1, 2, 3}},
      {"no end code", {{4, 3}, {1, 3}, {2, 3}, {3, 3}}, {1, 2, 3}},
      {"an unfinished row", {{4, 3}, {1, 3}, {2, 3}, {5, 3}}, {}},
      {"its own prefix", {{4, 3}, {1, 3}, {6, 3}, {5, 3}}, {1, 1, 1}},
      {"beyond the next code", {{1, 3}, {7, 3}, {5, 3}}, {1, 1, 1}},
      {"a first code is an index", {{4, 3}, {6, 3}, {1, 3}, {2, 3}}, {6, 1, 2}},
      {"no string before: ends quietly", {{7, 3}, {7, 3}, {1, 3}}, {}},
      {"two rows", {{1, 3}, {2, 3}, {6, 3}, {7, 4}}, {1, 2, 1, 2, 2, 1}},
      {"ended after one", {{1, 3}, {2, 3}, {3, 3}, {5, 4}, {1, 4}}, {1, 2, 3}},
  };
  for (const auto& c : cases) {
    std::vector<int> want = c.indices;
    want.resize(6, -1);
    EXPECT_EQ(want, decoded(coded(3, 2, 2, c.codes))) << c.what;
  }
  EXPECT_EQ(0, decode_gif(coded(3, 1, 12, {{1, 13}}).bytes(), 3, 1).answer);
}

// An animation goes on with code 0 where a still ends.
TEST(GifLzw, AnimationsGoOnWithoutAStringBefore) {
  const GifFile file = coded(5, 1, 2, {{7, 3}, {7, 3}, {1, 3}, {2, 4}, {5, 4}});
  const GifFrames result = decode_frames(file.bytes(), 5, 1, 1);
  EXPECT_EQ(3, result.answer);
  std::vector<int> indices;
  for (size_t i = 0; i < 15; i += 3) indices.push_back(255 - result.frames[0][i]);
  EXPECT_EQ((std::vector<int>{7, 0, 0, 1, 2}), indices);
}

// Minimum sizes of 9 to 11 bits have indices above 255, of which the low byte counts.
TEST(GifLzw, LargeMinimumCodeSizes) {
  for (int n = 9; n <= 11; ++n) {
    const GifFile file =
        coded(4, 1, n, {{1 << n, n + 1}, {300, n + 1}, {511, n + 1}, {(1 << n) + 2, n + 1}});
    EXPECT_EQ((std::vector<int>{44, 255, 44, 255}), decoded(file)) << n;
  }
  for (const int n : {0, 1}) {  // whatever they mean, they end
    for (const uint8_t byte : {0x00, 0x55, 0xAA, 0xFF, 0x1B}) {
      GifFile file = coded(300, 9, n, {});
      file.images[0].data = image_data(n, Bytes(900, byte));
      decode_gif(file.bytes(), 300, 9);
      decode_gif(file.bytes(), 30, 9);
      decode_frames(file.bytes(), 300, 9);
    }
  }
}

TEST(GifLzw, StepsThatOtherCallersUse) {
  static pelo::gif::TranslationTable table;
  EXPECT_EQ(0, PELOI_InitializeTransTBL(12, &table));
  ASSERT_EQ(1, PELOI_InitializeTransTBL(3, &table));
  uint8_t line[16];
  int error = 0;
  PELOI_AddToTranslationTable(5, 0, 10, &table);
  EXPECT_EQ(5, PELOI_TranslateCode(10, &table, 3, line, &error));
  EXPECT_EQ(0, line[4] + error);
  PELOI_TranslateCode(4096, &table, 0, line, &error);
  EXPECT_EQ(1, error);
  const uint8_t corners[4][3] = {{0, 10, 255}, {100, 10, 255}, {0, 20, 255}, {100, 20, 255}};
  _interpolate_rgb888(corners[0], corners[1], corners[2], corners[3], 128, 64, line);
  EXPECT_EQ((Bytes{50, 13, 255}), Bytes(line, line + 3));
}

// Any version letter, the fields of a graphic control, blocks of no meaning between images.
TEST(GifParse, HeaderAndExtensions) {
  GifFile file = sample_gif(4, 4, 2);
  for (const auto& [version, answer] :
       {std::pair("87a", 1), {"12Z", 1}, {"8xa", 0}, {"891", 0}, {"89{", 0}}) {
    file.version = version;
    EXPECT_EQ(answer, decode_gif(file.bytes(), 4, 4).answer) << version;
  }
  file.version = "89a";
  file.images[0].control = GifControl{3, 7, 255};
  Bytes bytes = file.bytes();
  const DecInfo decInfo = open_memory(bytes, 7);
  uint8_t output[64];
  pelo::gif::Record* record = PELOI_InitializeGIF(decInfo.get(), 4, 4, 0, output);
  ASSERT_NE(nullptr, record);
  EXPECT_EQ(1, PELOI_SeekImageData(decInfo->pIO, record));
  EXPECT_EQ(70, record->control.delay);
  EXPECT_EQ(3, record->control.disposal);
  PELOI_DelGIFDecoderInfo(record);
  constexpr size_t kBlocks = 13 + 12;  // behind the header and four colours
  ASSERT_EQ(0xF9, bytes[kBlocks + 1]);
  for (const auto& [at, value] : {std::pair<size_t, uint8_t>(2, 5), {2, 3}, {7, 1}})  // size, terminator
    EXPECT_EQ(0, decode_gif(overwritten(bytes, kBlocks + at, {value}), 4, 4).answer);
  // Bytes of no meaning, an unknown extension of which only the label goes, plain text.
  const Bytes odd{0, 0x77, 0x21, 0xFA, 5, 0x21, 0x01, 2, 0x2C, 0x3B, 0};
  bytes.insert(bytes.begin() + ptrdiff_t{kBlocks}, odd.begin(), odd.end());
  EXPECT_EQ(1, decode_gif(bytes, 4, 4).answer);
  EXPECT_EQ(decode_gif(file.bytes(), 4, 4).pixels, decode_gif(bytes, 4, 4).pixels);
  file.images.clear();
  EXPECT_EQ(0, decode_gif(file.bytes(), 4, 4).answer) << "no image";
}

}  // namespace
}  // namespace tests

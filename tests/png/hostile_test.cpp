// Damaged and contradictory files: refused or decoded as far as they go, never beyond any buffer.
#include "tests/png/png_decode.h"
#include "tests/support/failures.h"

namespace {
int externalStatus = 0, timesAsked = 0;
}

// Linked in place of the library's.
extern "C" void __wrap_TAVIRPELO_CheckExStatus(int* status) {
  ++timesAsked;
  *status = externalStatus;
}

namespace tests {
namespace {

PngImage small(uint8_t type = 2, bool interlaced = false) {
  return random_png_image(9, type, 8, 12, 10, interlaced, type == 3);
}

int answer(const Bytes& file, int format = 7) {
  return decode_png(file, 20, 20, format).answer;
}

// With a chunk replaced, and its checksum right.
Bytes with_chunk(const Bytes& file, const std::string& type, const Bytes& data) {
  auto chunks = png_chunks(file);
  for (PngChunk& chunk : chunks) {
    if (chunk.type == type) chunk.data = data;
  }
  return join_png(chunks);
}
Bytes with_stream(const Bytes& zlib) {
  return build_png(small(), zlib);
}
Bytes lines_of(const PngImage& image) {
  return png_scanlines(image, [](size_t) { return 0; });
}

TEST(PngHostile, HeaderFields) {
  const Bytes file = build_png(small());
  const Bytes good = png_chunks(file)[0].data;
  const auto with = [&](size_t at, const Bytes& bytes) {
    return answer(with_chunk(file, "IHDR", overwritten(good, at, bytes)));
  };
  EXPECT_EQ(1, answer(file));
  for (const size_t side : {0u, 4u}) {
    for (const uint32_t value : {0u, 0x80000000u, 0xFFFFFFFFu})
      EXPECT_EQ(0, with(side, ByteWriter().u32(value)));
  }
  EXPECT_EQ(0, with(0, {0x7F, 0xFF, 0xFF, 0xFF, 0x7F, 0xFF, 0xFF, 0xFF}));    // rows of gigabytes
  const Bytes wide = with_chunk(file, "IHDR", overwritten(good, 0, {0x04}));  // more than is held
  EXPECT_EQ(0, decode_png(wide, 9, 9, 1, TAVIRPELO_FIT_STRETCH).answer);
  // Depth and type: exactly the standard's combinations.
  const std::vector<int> depths[9] = {{1, 2, 4, 8, 16}, {}, {8, 16}, {1, 2, 4, 8}, {8, 16}, {}, {8, 16}};
  const Bytes lines = zlib_stored(Bytes(20000, 0));
  for (int depth = 0; depth < 20; ++depth) {
    for (size_t type = 0; type < 9; ++type) {
      const Bytes header = overwritten(good, 8, {uint8_t(depth), uint8_t(type)});
      auto chunks = png_chunks(with_chunk(with_stream(lines), "IHDR", header));
      chunks.insert(chunks.begin() + 1, {"PLTE", Bytes(6)});
      const auto accepted = std::count(depths[type].begin(), depths[type].end(), depth);
      EXPECT_EQ(accepted, answer(join_png(chunks))) << depth << " " << type;
    }
  }
  for (const size_t method : {10u, 11u}) EXPECT_EQ(0, with(method, {1}));
  EXPECT_EQ(0, with(12, {2}));
  EXPECT_EQ(0, answer(with_chunk(file, "IHDR", prefix(good, 12))));
}

TEST(PngHostile, PaletteAndTransparency) {
  const Bytes file = build_png(small(3));
  for (const auto& [type, length, expected] : {std::tuple("PLTE", 768, 1),
                                               {"PLTE", 771, 0},
                                               {"PLTE", 100, 0},
                                               {"tRNS", 200, 1},
                                               {"tRNS", 201, 0}}) {  // more than the palette
    EXPECT_EQ(expected, answer(with_chunk(file, type, Bytes(length, 7)))) << type << length;
  }
  auto chunks = png_chunks(file);
  chunks.erase(chunks.begin() + 1);
  EXPECT_EQ(0, answer(join_png(chunks)));  // tRNS without PLTE
  chunks.erase(chunks.begin() + 1);
  EXPECT_EQ(0, answer(join_png(chunks)));  // indices without PLTE
  // An image with alpha may have none.
  auto alpha = png_chunks(build_png(small(6)));
  alpha.insert(alpha.begin() + 1, {"tRNS", Bytes(6)});
  EXPECT_EQ(0, answer(join_png(alpha)));
  // A second header voids what the first gave a meaning to.
  chunks = png_chunks(file);
  chunks.insert(chunks.end() - 2, chunks[0]);
  EXPECT_EQ(0, answer(join_png(chunks)));
}

TEST(PngHostile, ChunkTable) {
  const PngImage image = random_png_image(1, 6, 8, 32, 32, false, false);
  const Bytes lines = zlib_stored(lines_of(image));
  const Bytes file = build_png(image, lines, 2);
  ASSERT_LT(2048u, png_chunks(file).size());
  const Bytes want = decode_png(build_png(image, lines), 32, 32, 7).pixels;
  from_every_source(file, 7, 0, [&](TAVIRPELO_DECINFO* decInfo) {
    const Decode got = decode(TAVIRPELOI_DecodePNG, decInfo, 32, 32);
    EXPECT_EQ(1, got.answer);
    EXPECT_EQ(want, got.pixels);
  });
  // A stream of more chunks than the size that it claims has room for.
  MemoryStream endless{file};
  const DecInfo decInfo = open_stream(endless, 7);
  decInfo->pIO->size = 1000;
  EXPECT_EQ(0, decode(TAVIRPELOI_DecodePNG, decInfo.get(), 32, 32).answer);
  // No data at all; an empty chunk ends the file wherever it stands.
  EXPECT_EQ(0, answer(build_png(image, {})));
  auto chunks = png_chunks(file);
  chunks.insert(chunks.begin() + 1, {"tEXt", {}});
  EXPECT_EQ(0, answer(join_png(chunks)));
}

// ---- the compressed data ----

TEST(PngHostile, ZlibHeader) {
  Bytes zlib = zlib_fixed(lines_of(small()));
  const auto with = [&](uint8_t method, uint8_t flags) {
    return answer(with_stream(overwritten(zlib, 0, {method, flags})));
  };
  EXPECT_EQ(1, with(0x78, 0x55));  // the check value is not looked at
  EXPECT_EQ(1, with(0x08, 0x01));
  EXPECT_EQ(0, with(0x88, 0x01));  // window
  EXPECT_EQ(0, with(0x79, 0x01));  // method
  EXPECT_EQ(0, with(0x78, 0x21));  // dictionary
  for (int i = 0; i < 4; ++i) {    // the checksum may be wrong or missing
    zlib.pop_back();
    EXPECT_EQ(1, answer(with_stream(zlib)));
  }
  zlib.pop_back();
  EXPECT_EQ(0, answer(with_stream(zlib)));
}

TEST(PngHostile, RowsTooFewOrTooMany) {
  const Bytes lines = lines_of(small());
  const auto pixels = [](const Bytes& l) {
    const Decode got = decode_png(with_stream(zlib_fixed(l)), 12, 10, 7);
    EXPECT_EQ(1, got.answer);
    return got.pixels;
  };
  Bytes expected = pixels(lines), more = lines;
  more.insert(more.end(), 100000, 1);
  EXPECT_EQ(expected, pixels(more));
  // What is missing keeps what the buffer held; the answer is that of a complete stream.
  std::fill(expected.begin() + 5 * 48, expected.end(), kFill);
  EXPECT_EQ(expected, pixels(prefix(lines, 5 * 37 + 20)));
}

// A code of one's own: lengths as 4-bit numbers without repeats, then symbols.
class DynamicBlock {
 public:
  DynamicBlock(size_t literals, size_t distances)
      : literals_(literals), lengths_(literals + distances) {}
  DynamicBlock& literal(size_t symbol, uint8_t length) {
    lengths_[symbol] = length;
    return *this;
  }
  DynamicBlock& distance(size_t symbol, uint8_t length) {
    lengths_[literals_ + symbol] = length;
    return *this;
  }
  // The stream up to the first symbol.
  void write(DeflateWriter& out) const {
    out.zlib_header();
    out.block(true, 2);
    out.bits(static_cast<uint32_t>(literals_ - 257), 5);
    out.bits(static_cast<uint32_t>(lengths_.size() - literals_ - 1), 5);
    out.bits(19 - 4, 4);
    const uint8_t order[19] = {16, 17, 18, 0, 8, 7, 9, 6, 10, 5, 11, 4, 12, 3, 13, 2, 14, 1, 15};
    for (const uint8_t symbol : order) out.bits(symbol < 16 ? 4 : 0, 3);
    for (const uint8_t length : lengths_) out.code(length, 4);
  }

 private:
  size_t literals_;
  Bytes lengths_;
};

// Literal 0 is bit 0; the end of block and symbol `extra` are 10 and 11.
DynamicBlock simple(size_t extra, size_t literals = 286, size_t distances = 30) {
  DynamicBlock block(literals, distances);
  block.literal(0, 1).literal(256, 2).literal(extra, 2);
  return block;
}

int decode_symbols(const DynamicBlock& block, const std::vector<std::pair<uint32_t, int>>& codes) {
  DeflateWriter writer;
  block.write(writer);
  for (const auto& [code, length] : codes) writer.code(code, length);
  return answer(with_stream(writer.take()));
}

TEST(PngHostile, PrefixCodes) {
  const std::pair<uint32_t, int> kZero{0, 1}, kEnd{2, 2}, kExtra{3, 2};
  // Lengths 3 to 10 need the distance code; the only one has length 1, its other code is unassigned.
  EXPECT_EQ(1, decode_symbols(simple(257).distance(0, 1), {kZero, kExtra, {0, 1}, kEnd}));
  EXPECT_EQ(0, decode_symbols(simple(257).distance(0, 1), {kZero, kExtra, {1, 1}, kEnd}));
  EXPECT_EQ(0, decode_symbols(simple(257), {kZero, kExtra, {0, 1}, kEnd}));  // no distance at all
  EXPECT_EQ(1, decode_symbols(simple(257), {kZero, kEnd}));                  // nor is one needed
  EXPECT_EQ(0, decode_symbols(simple(286, 288).distance(0, 1), {kZero, kExtra, {0, 1}, kEnd}));
  EXPECT_EQ(0, decode_symbols(simple(257, 286, 32).distance(31, 1), {kZero, kExtra, {0, 1}, kEnd}));
  EXPECT_EQ(1, decode_symbols(simple(257, 288, 32).distance(3, 1), {kZero, kExtra, {0, 1}, kEnd}));
  EXPECT_EQ(0, decode_symbols(simple(257).literal(1, 1), {kZero, kEnd}));  // over-subscribed
  EXPECT_EQ(0, decode_symbols(simple(257).distance(0, 1).distance(1, 1).distance(2, 1), {kZero, kEnd}));
  EXPECT_EQ(0, decode_symbols(DynamicBlock(257, 1), {{0, 16}}));  // no code at all
  // 15 bits, through the second table.
  DynamicBlock deep(257, 1);
  for (size_t i = 0; i < 14; ++i) deep.literal(i, static_cast<uint8_t>(i + 1));
  deep.literal(100, 15).literal(256, 15);
  EXPECT_EQ(1, decode_symbols(deep, {{0x7FFE, 15}, {0x3FFE, 14}, {0, 1}, {0x7FFF, 15}}));
}

// Bytes before the start read as the stream's first byte.
TEST(PngHostile, DistancesBeforeTheStart) {
  DeflateWriter writer;
  writer.zlib_header();
  writer.block(true, 1);
  writer.fixed_symbol(0);  // filter type of the first row
  writer.fixed_match(36, 32768);
  writer.fixed_symbol(0);
  writer.fixed_symbol(9);
  writer.fixed_match(3, 30000);
  writer.fixed_match(258, 1);
  writer.fixed_symbol(256);
  const Decode got = decode_png(with_stream(writer.take()), 12, 10, 1);
  EXPECT_EQ(1, got.answer);
  Bytes expected(12 * 3, 0);
  expected.push_back(9);
  expected.resize(12 * 6, 0);
  EXPECT_EQ(expected, prefix(got.pixels, expected.size()));
}

TEST(PngHostile, StoredBlocks) {
  const Bytes lines = lines_of(small());
  const Decode whole = decode_png(with_stream(zlib_stored(lines)), 12, 10, 7);
  EXPECT_EQ(1, whole.answer);
  for (const size_t size : {1u, 36u, 100u}) {
    EXPECT_EQ(whole.pixels, decode_png(with_stream(zlib_stored(lines, size)), 12, 10, 7).pixels);
  }
  Bytes wrong = zlib_stored(lines);
  wrong[5] ^= 1;  // the complement of the length
  EXPECT_EQ(0, answer(with_stream(wrong)));
  EXPECT_EQ(0, answer(with_stream({0x78, 0x01, 0x07, 0, 0, 0})));  // reserved block type
  // Stored after coded: the block begins at the next byte, of which some are already read.
  DeflateWriter writer;
  writer.zlib_header();
  writer.block(false, 1);
  for (size_t i = 0; i < 100; ++i) writer.fixed_symbol(lines[i]);
  writer.fixed_symbol(256);
  writer.stored(true, suffix(lines, 100));
  EXPECT_EQ(whole.pixels, decode_png(with_stream(writer.take()), 12, 10, 7).pixels);
}

TEST(PngHostile, UnknownFilterKeepsTheRow) {
  const PngImage image = small();
  Bytes lines = lines_of(image);
  lines[37] = 5;
  const Decode got = decode_png(build_png(image, zlib_stored(lines)), 12, 10, 1);
  EXPECT_EQ(1, got.answer);
  EXPECT_EQ(0, got.pixels[36]);
  EXPECT_EQ(lines[39], got.pixels[37]);
}

TEST(PngHostile, CancelledFromOutside) {
  for (const bool interlaced : {false, true}) {
    for (const auto& [side, option] : {std::pair(12, 0u), {7, 0x700u}, {7, 0x1700u}}) {
      from_every_source(build_png(small(2, interlaced)), 7, option, [&](TAVIRPELO_DECINFO* decInfo) {
        for (const int status : {0, 5, -1}) {
          externalStatus = status, timesAsked = 0;
          EXPECT_EQ(status >= 0, decode(TAVIRPELOI_DecodePNG, decInfo, side, side).answer);
          EXPECT_TRUE(status < 0 ? timesAsked == 1 : timesAsked >= std::min(side, 10)) << timesAsked;
        }
      });
    }
  }
  externalStatus = 0;
}

}  // namespace
}  // namespace tests

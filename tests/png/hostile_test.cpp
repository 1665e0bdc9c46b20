// Damaged and contradictory files: refused or decoded as far as they go, never beyond any buffer.
#include <random>

#include "platform/fault_injection.h"
#include "tests/png/png_decode.h"

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

TEST(PngHostile, EveryTruncation) {
  for (const uint8_t type : {2, 3}) {
    const Bytes file = build_png(small(type));
    for (size_t size = 1; size < file.size(); ++size) {
      const Bytes cut(file.begin(), file.begin() + static_cast<ptrdiff_t>(size));
      EXPECT_EQ(0, answer(cut)) << size;
      MemoryStream stream{cut};
      GuardedPixels pixels(20, 20, 7);
      EXPECT_EQ(0, TAVIRPELOI_DecodePNG(open_stream(stream, 7).get(), pixels.data(), 20, 20)) << size;
    }
  }
}

// Any flipped bit is noticed by a checksum; but for the bytes after the empty chunk's type.
TEST(PngHostile, EveryFlippedByte) {
  const Bytes file = build_png(small(3));
  for (size_t at = 0; at < file.size(); ++at) {
    for (const uint8_t bit : {0x01, 0x80}) {
      Bytes damaged = file;
      damaged[at] ^= bit;
      EXPECT_EQ(0, answer(damaged)) << at;
    }
  }
}

// Data whose checksum was made right again: everything behind the checksum meets any byte.
TEST(PngHostile, EveryFlippedByteOfTheData) {
  for (const bool interlaced : {false, true}) {
    const Bytes file = build_png(small(3, interlaced));
    for (const PngChunk& chunk : png_chunks(file)) {
      for (size_t at = 0; at < chunk.data.size(); ++at) {
        for (const uint8_t flip : {0x01, 0x10, 0x80, 0xFF}) {
          Bytes data = chunk.data;
          data[at] ^= flip;
          const int got = answer(with_chunk(file, chunk.type, data), at % 2 ? 0 : 8);
          EXPECT_TRUE(got == 0 || got == 1);
        }
      }
    }
  }
}

TEST(PngHostile, HeaderFields) {
  const Bytes file = build_png(small());
  const Bytes good = png_chunks(file)[0].data;
  const auto with = [&](size_t at, Bytes bytes) {
    Bytes data = good;
    std::copy(bytes.begin(), bytes.end(), data.begin() + static_cast<ptrdiff_t>(at));
    return answer(with_chunk(file, "IHDR", data));
  };
  EXPECT_EQ(1, answer(file));
  for (const size_t side : {0u, 4u}) {
    EXPECT_EQ(0, with(side, {0, 0, 0, 0}));
    EXPECT_EQ(0, with(side, {0x80, 0, 0, 0}));
    EXPECT_EQ(0, with(side, {0xFF, 0xFF, 0xFF, 0xFF}));
  }
  EXPECT_EQ(0, with(0, {0x7F, 0xFF, 0xFF, 0xFF, 0x7F, 0xFF, 0xFF, 0xFF}));  // rows of gigabytes
  Bytes wide = good;
  wide[0] = 0x04;  // rows of 2^26 pixels: more than is held
  const PngResult refused = decode_png(with_chunk(file, "IHDR", wide), 9, 9, 1, TAVIRPELO_FIT_STRETCH);
  EXPECT_EQ(0, refused.answer);
  // Depth and type: exactly the standard's combinations.
  const auto accepted = [](int depth, int type) {
    switch (type) {
      case 0:
        return depth == 1 || depth == 2 || depth == 4 || depth == 8 || depth == 16;
      case 3:
        return depth == 1 || depth == 2 || depth == 4 || depth == 8;
      case 2:
      case 4:
      case 6:
        return depth == 8 || depth == 16;
      default:
        return false;
    }
  };
  const Bytes lines = zlib_stored(Bytes(20000, 0));
  for (int depth = 0; depth < 20; ++depth) {
    for (int type = 0; type < 9; ++type) {
      Bytes data = good;
      data[8] = static_cast<uint8_t>(depth);
      data[9] = static_cast<uint8_t>(type);
      auto chunks = png_chunks(with_chunk(with_stream(lines), "IHDR", data));
      chunks.insert(chunks.begin() + 1, {"PLTE", Bytes(6)});
      EXPECT_EQ(accepted(depth, type), answer(join_png(chunks)) == 1) << depth << " " << type;
    }
  }
  for (const size_t method : {10u, 11u}) EXPECT_EQ(0, with(method, {1}));
  EXPECT_EQ(0, with(12, {2}));
  EXPECT_EQ(0, answer(with_chunk(file, "IHDR", Bytes(good.begin(), good.end() - 1))));
}

TEST(PngHostile, PaletteAndTransparency) {
  const PngImage image = small(3);
  const Bytes file = build_png(image);
  const auto plte = [&](size_t length) { return answer(with_chunk(file, "PLTE", Bytes(length, 7))); };
  EXPECT_EQ(1, plte(768));
  EXPECT_EQ(0, plte(771));
  EXPECT_EQ(0, plte(100));
  const auto trns = [&](size_t length) { return answer(with_chunk(file, "tRNS", Bytes(length, 7))); };
  EXPECT_EQ(1, trns(200));
  EXPECT_EQ(0, trns(201));  // more than the palette
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
  const Bytes lines = zlib_stored(png_scanlines(image, [](size_t) { return 0; }));
  const Bytes file = build_png(image, lines, 2);
  ASSERT_LT(2048u, png_chunks(file).size());
  EXPECT_EQ(0, decode_png(file, 32, 32, 7).answer);
  EXPECT_EQ(1, decode_png(build_png(image, lines, 3), 32, 32, 7).answer);
  // No data at all; an empty chunk ends the file wherever it stands.
  EXPECT_EQ(0, answer(build_png(image, {})));
  auto chunks = png_chunks(file);
  chunks.insert(chunks.begin() + 1, {"tEXt", {}});
  EXPECT_EQ(0, answer(join_png(chunks)));
}

// ---- the compressed data ----

Bytes lines_of(const PngImage& image) {
  return png_scanlines(image, [](size_t) { return 0; });
}

TEST(PngHostile, ZlibHeader) {
  Bytes zlib = zlib_fixed(lines_of(small()));
  const auto with = [&](uint8_t method, uint8_t flags) {
    Bytes changed = zlib;
    changed[0] = method;
    changed[1] = flags;
    return answer(with_stream(changed));
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
  const PngImage image = small();
  const Bytes lines = lines_of(image);
  const PngResult full = decode_png(build_png(image, zlib_fixed(lines)), 12, 10, 7);
  Bytes more = lines;
  more.insert(more.end(), 100000, 1);
  EXPECT_EQ(full.pixels, decode_png(build_png(image, zlib_fixed(more)), 12, 10, 7).pixels);
  // What is missing keeps what the buffer held; the answer is that of a complete stream.
  const Bytes fewer(lines.begin(), lines.begin() + 5 * 37 + 20);
  const PngResult part = decode_png(build_png(image, zlib_fixed(fewer)), 12, 10, 7);
  EXPECT_EQ(1, part.answer);
  Bytes expected = full.pixels;
  std::fill(expected.begin() + 5 * 48, expected.end(), uint8_t{0x33});
  EXPECT_EQ(expected, part.pixels);
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

int decode_symbols(const DynamicBlock& block, const std::vector<std::pair<uint32_t, int>>& codes,
                   Bytes* pixels = nullptr) {
  DeflateWriter writer;
  block.write(writer);
  for (const auto& [code, length] : codes) writer.code(code, length);
  const PngResult result = decode_png(with_stream(writer.take()), 12, 10, 7);
  if (pixels != nullptr) *pixels = result.pixels;
  return result.answer;
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
  writer.fixed_literal(0);  // filter type of the first row
  writer.fixed_match(36, 32768);
  writer.fixed_literal(0);
  writer.fixed_literal(9);
  writer.fixed_match(3, 30000);
  writer.fixed_match(258, 1);
  writer.fixed_symbol(256);
  const PngResult got = decode_png(with_stream(writer.take()), 12, 10, 1);
  EXPECT_EQ(1, got.answer);
  Bytes expected(12 * 3, 0);
  expected.push_back(9);
  expected.resize(12 * 6, 0);
  EXPECT_TRUE(std::equal(expected.begin(), expected.end(), got.pixels.begin()));
}

TEST(PngHostile, StoredBlocks) {
  const Bytes lines = lines_of(small());
  const PngResult whole = decode_png(with_stream(zlib_stored(lines)), 12, 10, 7);
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
  for (size_t i = 0; i < 100; ++i) writer.fixed_literal(lines[i]);
  writer.fixed_symbol(256);
  writer.stored(true, Bytes(lines.begin() + 100, lines.end()));
  EXPECT_EQ(whole.pixels, decode_png(with_stream(writer.take()), 12, 10, 7).pixels);
}

TEST(PngHostile, UnknownFilterKeepsTheRow) {
  const PngImage image = small();
  Bytes lines = lines_of(image);
  lines[37] = 5;
  const PngResult got = decode_png(build_png(image, zlib_stored(lines)), 12, 10, 1);
  EXPECT_EQ(1, got.answer);
  EXPECT_EQ(0, got.pixels[36]);
  EXPECT_EQ(lines[39], got.pixels[37]);
}

TEST(PngHostile, ShortMemoryAtEveryStep) {
  for (const bool interlaced : {false, true}) {
    const Bytes file = build_png(random_png_image(2, 6, 8, 20, 20, interlaced, false));
    const auto decode = [&] { return decode_png(file, 9, 9, 7, 0x1000); };
    const PngResult whole = decode();
    ASSERT_EQ(1, whole.answer);
    for (int k = 1;; ++k) {
      pelo::faults::allocations.arm(k);
      const PngResult got = decode();
      const bool reached = pelo::faults::allocations.calls >= k;
      pelo::faults::allocations.arm(0);
      if (!reached) break;
      EXPECT_EQ(0, got.answer) << k;
    }
  }
}

TEST(PngHostile, MissingArguments) {
  Bytes file = build_png(small());
  const DecInfo decInfo = open_memory(file, 7);
  uint8_t pixels[4];
  EXPECT_EQ(0, TAVIRPELOI_DecodePNG(nullptr, pixels, 1, 1));
  EXPECT_EQ(0, TAVIRPELOI_DecodePNG(decInfo.get(), nullptr, 1, 1));
  EXPECT_EQ(0, TAVIRPELOI_DecodePNG(decInfo.get(), pixels, -1, 1));
  EXPECT_EQ(0, TAVIRPELOI_DecodePNGLine(decInfo.get(), pixels, 1, 1, -1));
  EXPECT_EQ(0, TAVIRPELOI_DecodePNGIter(decInfo.get(), pixels, 1, -5));
}

}  // namespace
}  // namespace tests

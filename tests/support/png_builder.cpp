#include "tests/support/png_builder.h"

#include <algorithm>
#include <random>

namespace tests {
namespace {

// The checksum by its definition, a bit at a time.
uint32_t crc32(const Bytes& data) {
  uint32_t crc = 0xFFFFFFFF;
  for (uint8_t byte : data) {
    crc ^= byte;
    for (int i = 0; i < 8; ++i) crc = (crc >> 1) ^ ((crc & 1) ? 0xEDB88320u : 0);
  }
  return ~crc;
}

uint8_t to_byte(uint16_t v, int depth) {
  if (depth == 1) return v ? 255 : 0;
  if (depth == 16) return static_cast<uint8_t>(v >> 8);
  return static_cast<uint8_t>(v << (8 - depth) | ((1 << (8 - depth)) - 1));
}

Bytes pack_row(const PngImage& image, uint32_t y, uint32_t firstColumn, uint32_t step) {
  Bytes row;
  int used = 8;
  for (uint32_t x = firstColumn; x < image.width; x += step) {
    for (int c = 0; c < image.channels(); ++c) {
      const uint16_t v = image.sample(x, y, c);
      if (image.depth == 16) row.push_back(static_cast<uint8_t>(v >> 8));
      if (image.depth >= 8) {
        row.push_back(static_cast<uint8_t>(v));
        continue;
      }
      if (used == 8) row.push_back(0), used = 0;
      used += image.depth;
      row.back() = static_cast<uint8_t>(row.back() | v << (8 - used));
    }
  }
  return row;
}

uint8_t predictor(int type, int a, int b, int c) {
  const int p = a + b - c, pa = std::abs(p - a), pb = std::abs(p - b), pc = std::abs(p - c);
  const int paeth = pa <= pb && pa <= pc ? a : pb <= pc ? b : c;
  return static_cast<uint8_t>(std::array{0, a, b, (a + b) / 2, paeth}.at(static_cast<size_t>(type)));
}

Bytes filter_row(const Bytes& row, const Bytes& above, int type, size_t bpp) {
  Bytes out{static_cast<uint8_t>(type)};
  for (size_t i = 0; i < row.size(); ++i) {
    const int a = i < bpp ? 0 : row[i - bpp], b = above.empty() ? 0 : above[i];
    const int c = i < bpp || above.empty() ? 0 : above[i - bpp];
    out.push_back(static_cast<uint8_t>(row[i] - predictor(type, a, b, c)));
  }
  return out;
}

struct Pass {
  uint32_t x, xStep, y, yStep;
};
constexpr Pass kWhole[] = {{0, 1, 0, 1}};
constexpr Pass kAdam7[] = {{0, 8, 0, 8}, {4, 8, 0, 8}, {0, 4, 4, 8}, {2, 4, 0, 4},
                           {0, 2, 2, 4}, {1, 2, 0, 2}, {0, 1, 1, 2}};

}  // namespace

int PngImage::channels() const {
  return type == 2 ? 3 : type == 4 ? 2 : type == 6 ? 4 : 1;
}

uint16_t PngImage::sample(uint32_t x, uint32_t y, int channel) const {
  return samples[(size_t{y} * width + x) * static_cast<size_t>(channels()) +
                 static_cast<size_t>(channel)];
}

Rgba PngImage::rgba(int column, int row) const {
  const auto x = static_cast<uint32_t>(column), y = static_cast<uint32_t>(row);
  const auto value = [&](int c) { return to_byte(sample(x, y, c), depth); };
  if (type == 3) {
    const size_t i = sample(x, y, 0);
    const uint8_t alpha = hasTrns && i < trns.size() ? trns[i] : 255;
    if (3 * i + 2 >= palette.size()) return {0, 0, 0, alpha};
    return {palette[3 * i], palette[3 * i + 1], palette[3 * i + 2], alpha};
  }
  if (type == 4) return {value(0), value(0), value(0), value(1)};
  if (type == 6) return {value(0), value(1), value(2), value(3)};
  const int ignored = depth == 16 ? 8 : 0;  // of 16 bits the upper half counts
  bool transparent = hasTrns;
  for (size_t c = 0; hasTrns && c < (type == 0 ? 1 : 3); ++c) {
    const int key = trns[2 * c] << 8 | trns[2 * c + 1];
    transparent &= key >> ignored == sample(x, y, static_cast<int>(c)) >> ignored;
  }
  return {value(0), value(type / 2), value(type), static_cast<uint8_t>(transparent ? 0 : 255)};
}

PngImage random_png_image(uint32_t seed, uint8_t type, uint8_t depth, uint32_t width, uint32_t height,
                          bool interlaced, bool trns) {
  std::mt19937 random(seed);
  PngImage image{width, height, depth, type, interlaced, {}, trns, {}, {}};
  const uint32_t entries = std::min(200u, 1u << depth);
  const uint32_t top = type == 3 ? entries - 1 : (1u << depth) - 1;
  if (type == 3) {
    image.palette = random_bytes(3 * entries, seed);
    if (trns) image.trns = random_bytes((entries + 1) / 2, seed + 1);
  }
  // Few values, so that neighbours repeat and the colour key occurs.
  const size_t count = size_t{width} * height * static_cast<size_t>(image.channels());
  for (size_t i = 0; i < count; ++i) {
    image.samples.push_back(
        static_cast<uint16_t>(random() % 4 ? (random() % 3) * top / 2 : random() % (top + 1)));
  }
  ByteWriter key;
  for (int c = 0; c < (type == 0 ? 1 : 3); ++c) key.u16(image.sample(0, 0, c));
  if (trns && type != 3) image.trns = key;
  return image;
}

Bytes png_scanlines(const PngImage& image, const std::function<int(size_t)>& filter) {
  const size_t bpp = static_cast<size_t>((image.depth + 7) / 8 * image.channels());
  Bytes out;
  size_t index = 0;
  const Pass* pass = image.interlaced ? kAdam7 : kWhole;
  for (int n = image.interlaced ? 7 : 1; n > 0; --n, ++pass) {
    Bytes above;
    if (pass->x >= image.width) continue;
    for (uint32_t y = pass->y; y < image.height; y += pass->yStep) {
      Bytes row = pack_row(image, y, pass->x, pass->xStep);
      append(out, filter_row(row, above, filter(index++), bpp));
      above = std::move(row);
    }
  }
  return out;
}

Bytes png_chunk(const std::string& type, const Bytes& data) {
  const Bytes checked = ByteWriter().text(type).block(data);
  return ByteWriter().u32(static_cast<uint32_t>(data.size())).block(checked).u32(crc32(checked));
}

namespace {
const Bytes kSignature{137, 'P', 'N', 'G', 13, 10, 26, 10};
}

Bytes png_header(const PngImage& image) {
  const Bytes data = ByteWriter()
                         .u32(image.width)
                         .u32(image.height)
                         .block({image.depth, image.type, 0, 0, image.interlaced});
  return ByteWriter().block(kSignature).block(png_chunk("IHDR", data));
}

std::vector<PngChunk> png_chunks(const Bytes& file) {
  std::vector<PngChunk> chunks;
  for (size_t at = 8; at + 12 <= file.size();) {
    const size_t length =
        size_t{file[at]} << 24 | size_t{file[at + 1]} << 16 | size_t{file[at + 2]} << 8 | file[at + 3];
    const auto data = file.begin() + static_cast<ptrdiff_t>(at) + 8;
    chunks.push_back({std::string(data - 4, data), Bytes(data, data + static_cast<ptrdiff_t>(length))});
    at += 12 + length;
    if (length == 0) break;
  }
  return chunks;
}

Bytes join_png(const std::vector<PngChunk>& chunks) {
  Bytes out = kSignature;
  for (const PngChunk& chunk : chunks) append(out, png_chunk(chunk.type, chunk.data));
  return out;
}

Bytes build_png(const PngImage& image, const Bytes& zlib, size_t idatSize) {
  Bytes out = png_header(image);
  if (!image.palette.empty()) append(out, png_chunk("PLTE", image.palette));
  if (image.hasTrns) append(out, png_chunk("tRNS", image.trns));
  for (size_t at = 0; at < zlib.size(); at += std::min(idatSize, zlib.size() - at))
    append(out, png_chunk("IDAT", prefix(suffix(zlib, at), std::min(idatSize, zlib.size() - at))));
  append(out, png_chunk("IEND", {}));
  return out;
}

Bytes build_png(const PngImage& image) {
  return build_png(image, zlib_fixed(png_scanlines(image, [](size_t row) { return row % 5; })));
}

// ---- DEFLATE ----

void DeflateWriter::bits(uint32_t value, int count) {
  for (int i = 0; i < count; ++i) {
    pending_ |= (value >> i & 1) << count_;
    if (++count_ == 8) align();
  }
}

void DeflateWriter::code(uint32_t code, int length) {
  for (int i = length - 1; i >= 0; --i) bits(code >> i & 1, 1);
}

void DeflateWriter::align() {
  if (count_ > 0) bytes_.push_back(static_cast<uint8_t>(pending_));
  pending_ = 0;
  count_ = 0;
}

void DeflateWriter::stored(bool last, const Bytes& data) {
  block(last, 0);
  align();
  const auto size = static_cast<uint32_t>(data.size());
  bits(size, 16);
  bits(~size & 0xFFFF, 16);
  for (uint8_t b : data) byte(b);
}

void DeflateWriter::fixed_symbol(uint32_t symbol) {
  if (symbol < 144) return code(0x30 + symbol, 8);
  if (symbol < 256) return code(0x190 + symbol - 144, 9);
  if (symbol < 280) return code(symbol - 256, 7);
  code(0xC0 + symbol - 280, 8);
}

void DeflateWriter::fixed_match(uint32_t length, uint32_t distance) {
  // Bases by adding up the spans that the extra bits cover.
  uint32_t base = 3, symbol = 257;
  for (int i = 0; length != 258; ++i, ++symbol) {
    const int extra = i < 8 ? 0 : i / 4 - 1;
    if (length < base + (1u << extra)) {
      fixed_symbol(symbol);
      bits(length - base, extra);
      break;
    }
    base += 1u << extra;
  }
  if (length == 258) fixed_symbol(285);
  base = 1;
  for (uint32_t i = 0;; ++i) {
    const int extra = i < 4 ? 0 : static_cast<int>(i / 2 - 1);
    if (distance < base + (1u << extra)) {
      code(i, 5);
      bits(distance - base, extra);
      return;
    }
    base += 1u << extra;
  }
}

namespace {

uint32_t adler32(const Bytes& data) {
  uint32_t a = 1, b = 0;
  for (uint8_t byte : data) a = (a + byte) % 65521, b = (b + a) % 65521;
  return b << 16 | a;
}

size_t match_length(const Bytes& data, size_t at, size_t end, size_t distance) {
  size_t n = 0;
  while (n < 258 && at + n < end && data[at + n] == data[at + n - distance]) ++n;
  return n;
}

}  // namespace

Bytes zlib_stored(const Bytes& data, size_t blockSize) {
  DeflateWriter writer;
  writer.zlib_header();
  size_t at = 0;
  do {
    const size_t count = std::min(blockSize, data.size() - at);
    writer.stored(at + count == data.size(), prefix(suffix(data, at), count));
    at += count;
  } while (at < data.size());
  return ByteWriter().block(writer.take()).u32(adler32(data));
}

Bytes zlib_fixed(const Bytes& data, size_t blockSize) {
  DeflateWriter writer;
  writer.zlib_header();
  size_t at = 0;
  do {
    const size_t end = at + std::min(blockSize, data.size() - at);
    writer.block(end == data.size(), 1);
    while (at < end) {
      size_t best = 0, distance = 0;
      for (size_t d = 1; d <= std::min<size_t>(at, 1024); d += d < 16 ? 1 : 13) {
        const size_t n = match_length(data, at, end, d);
        if (n > best) best = n, distance = d;
      }
      if (best >= 3) {
        writer.fixed_match(static_cast<uint32_t>(best), static_cast<uint32_t>(distance));
        at += best;
      } else {
        writer.fixed_symbol(data[at++]);
      }
    }
    writer.fixed_symbol(256);
  } while (at < data.size());
  return ByteWriter().block(writer.take()).u32(adler32(data));
}

}  // namespace tests

#include "tests/support/gif_builder.h"

#include <algorithm>
#include <bit>
#include <map>

namespace tests {
namespace {

void put16(Bytes& out, int value) {
  out.push_back(static_cast<uint8_t>(value));
  out.push_back(static_cast<uint8_t>(value >> 8));
}

void append(Bytes& out, const Bytes& more) {
  out.insert(out.end(), more.begin(), more.end());
}

// The flag and size bits of a palette's descriptor.
int table_flags(const Bytes& palette) {
  return palette.empty() ? 0 : 0x80 | (static_cast<int>(std::bit_width(palette.size() / 3)) - 2);
}

// A dictionary of (prefix code, index), the textbook way.
std::vector<std::pair<int, int>> lzw_codes(const Bytes& indices, const LzwStyle& style) {
  const int clear = 1 << style.minimumCodeSize;
  std::vector<std::pair<int, int>> codes;
  std::map<std::pair<int, int>, int> table;
  int next = clear + 2, width = style.minimumCodeSize + 1, since = 0;
  const auto emit = [&](int code) { codes.emplace_back(code, width); };
  const auto restart = [&] {
    emit(clear);
    table.clear();
    next = clear + 2;
    width = style.minimumCodeSize + 1;
    since = 0;
  };
  restart();
  int prefix = -1;
  for (const int index : indices) {
    if (prefix < 0) {
      prefix = index;
      continue;
    }
    const auto known = table.find({prefix, index});
    if (known != table.end()) {
      prefix = known->second;
      continue;
    }
    emit(prefix);
    ++since;
    if (next < 4096) {
      table[{prefix, index}] = next;
      // The decoder's table is one entry behind, so its codes widen one later.
      if (next == 1 << width && width < 12) ++width;
      ++next;
    } else if (!style.deferClear) {
      restart();
    }
    if (style.clearEvery > 0 && since >= style.clearEvery) restart();
    prefix = index;
  }
  if (prefix >= 0) {
    emit(prefix);
    if (next == 1 << width && width < 12) ++width;
  }
  if (style.endCode) emit(clear + 1);
  return codes;
}

Bytes in_pass_order(const GifImage& image) {
  if (!image.interlaced) return image.indices;
  Bytes rows;
  constexpr int kPasses[4][2] = {{0, 8}, {4, 8}, {2, 4}, {1, 2}};
  for (const auto& [first, step] : kPasses) {
    for (int y = first; y < image.height; y += step) {
      const auto row = image.indices.begin() + static_cast<ptrdiff_t>(y) * image.width;
      rows.insert(rows.end(), row, row + image.width);
    }
  }
  return rows;
}

void put_control(Bytes& out, const GifControl& control) {
  const int flags = control.disposal << 2 | (control.transparent >= 0 ? 1 : 0);
  append(out, {0x21, 0xF9, 4, static_cast<uint8_t>(flags)});
  put16(out, control.delay);
  append(out, {static_cast<uint8_t>(std::max(control.transparent, 0)), 0});
}

void put_image(Bytes& out, const GifImage& image) {
  if (image.control) put_control(out, *image.control);
  out.push_back(0x2C);
  for (const int value : {image.left, image.top, image.width, image.height}) put16(out, value);
  out.push_back(static_cast<uint8_t>(table_flags(image.palette) | (image.interlaced ? 0x40 : 0)));
  append(out, image.palette);
  if (image.data) {
    append(out, *image.data);
  } else {
    append(out,
           image_data(image.lzw.minimumCodeSize, pack_codes(lzw_codes(in_pass_order(image), image.lzw)),
                      image.lzw.blockBytes));
  }
}

uint32_t next_random(uint32_t& seed) {
  return (seed = seed * 1664525 + 1013904223) >> 8;
}

}  // namespace

Bytes pack_codes(const std::vector<std::pair<int, int>>& codes) {
  Bytes out;
  uint32_t bits = 0;
  int count = 0;
  for (const auto& [code, width] : codes) {
    bits |= static_cast<uint32_t>(code) << count;
    for (count += width; count >= 8; count -= 8, bits >>= 8) out.push_back(static_cast<uint8_t>(bits));
  }
  if (count > 0) out.push_back(static_cast<uint8_t>(bits));
  return out;
}

Bytes image_data(int minimumCodeSize, const Bytes& packed, int blockBytes) {
  Bytes out{static_cast<uint8_t>(minimumCodeSize)};
  for (size_t at = 0; at < packed.size(); at += static_cast<size_t>(blockBytes)) {
    const size_t count = std::min(packed.size() - at, static_cast<size_t>(blockBytes));
    out.push_back(static_cast<uint8_t>(count));
    const auto first = packed.begin() + static_cast<ptrdiff_t>(at);
    out.insert(out.end(), first, first + static_cast<ptrdiff_t>(count));
  }
  out.push_back(0);
  return out;
}

Bytes GifFile::bytes() const {
  Bytes out{'G', 'I', 'F'};
  for (const char c : version) out.push_back(static_cast<uint8_t>(c));
  put16(out, width);
  put16(out, height);
  append(out, {static_cast<uint8_t>(table_flags(palette) | 0x70), static_cast<uint8_t>(background), 0});
  append(out, palette);
  if (loops) {
    append(out, {0x21, 0xFF, 11, 'N', 'E', 'T', 'S', 'C', 'A', 'P', 'E', '2', '.', '0', 3, 1, 0, 0, 0});
    append(out, {0x21, 0xFE, 3, ';', ',', '!', 0});
  }
  for (const GifImage& image : images) put_image(out, image);
  if (trailer) out.push_back(0x3B);
  return out;
}

Bytes sample_indices(int width, int height, int colours, uint32_t seed) {
  Bytes out;
  const size_t size = static_cast<size_t>(width) * static_cast<size_t>(height);
  while (out.size() < size) {
    const uint32_t kind = next_random(seed) % 4;
    const size_t length = 1 + next_random(seed) % (kind == 0 ? 300 : 40);
    const auto colour = static_cast<int>(next_random(seed) % static_cast<uint32_t>(colours));
    const size_t back = out.size() > 200 ? 1 + next_random(seed) % 200 : 0;
    for (size_t i = 0; i < length && out.size() < size; ++i) {
      const int value = kind < 2 ? colour
                        : kind == 2 && back > 0
                            ? out[out.size() - back]
                            : static_cast<int>(next_random(seed) % static_cast<uint32_t>(colours));
      out.push_back(static_cast<uint8_t>(value));
    }
  }
  return out;
}

Bytes sample_palette(int colours, uint32_t seed) {
  Bytes out;
  for (int i = 0; i < colours; ++i) {
    const uint32_t other = next_random(seed);
    out.insert(out.end(), {static_cast<uint8_t>(255 - i), static_cast<uint8_t>(other),
                           static_cast<uint8_t>(other >> 8)});
  }
  return out;
}

GifFile sample_gif(int width, int height, int bits, bool interlaced) {
  GifFile file;
  file.width = width;
  file.height = height;
  file.palette = sample_palette(1 << bits);
  GifImage image;
  image.width = width;
  image.height = height;
  image.indices = sample_indices(width, height, 1 << bits);
  image.interlaced = interlaced;
  image.lzw.minimumCodeSize = std::max(bits, 2);
  file.images.push_back(image);
  return file;
}

}  // namespace tests

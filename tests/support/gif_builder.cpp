#include "tests/support/gif_builder.h"

#include <algorithm>
#include <bit>
#include <map>

namespace tests {
namespace {

// The flag and size bits of a palette's descriptor.
int table_flags(const Bytes& palette) {
  return palette.empty() ? 0 : 0x80 | (static_cast<int>(std::bit_width(palette.size() / 3)) - 2);
}

// A dictionary of (prefix code, index), the textbook way.
GifCodes lzw_codes(const Bytes& indices, const LzwStyle& style) {
  const int clear = 1 << style.minimumCodeSize;
  GifCodes codes;
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

void put_image(ByteWriter& out, const GifImage& image) {
  if (const auto& control = image.control) {
    const int flags = control->disposal << 2 | (control->transparent >= 0 ? 1 : 0);
    out.u24(0x04F921).u8(flags).u16(control->delay);
    out.u8(std::max(control->transparent, 0)).u8(0);
  }
  out.u8(0x2C);
  for (const int value : {image.left, image.top, image.width, image.height}) out.u16(value);
  out.u8(table_flags(image.palette) | (image.interlaced ? 0x40 : 0));
  const LzwStyle& lzw = image.lzw;
  out.block(image.palette)
      .block(image.data ? *image.data
                        : image_data(lzw.minimumCodeSize,
                                     pack_codes(lzw_codes(in_pass_order(image), lzw)), lzw.blockBytes));
}

uint32_t next_random(uint32_t& seed) {
  return (seed = seed * 1664525 + 1013904223) >> 8;
}

}  // namespace

Bytes pack_codes(const GifCodes& codes) {
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
    append(out, prefix(suffix(packed, at), count));
  }
  out.push_back(0);
  return out;
}

Bytes GifFile::bytes() const {
  ByteWriter out(false);
  out.text("GIF").text(version).u16(width).u16(height);
  out.u8(table_flags(palette) | 0x70).u8(background).u8(0);
  out.block(palette);
  if (loops)
    out.u24(0x0BFF21).text("NETSCAPE2.0").block({3, 1, 0, 0, 0, 0x21, 0xFE, 3, ';', ',', '!', 0});
  for (const GifImage& image : images) put_image(out, image);
  return out.u8(0x3B);
}

Rgba GifFile::pixel(int x, int y) const {
  const GifImage& image = images[0];
  const int index = image.indices[static_cast<size_t>((y - image.top) * image.width + x - image.left)];
  if (image.control && image.control->transparent == index) return {0, 0, 0, 0};
  const uint8_t* p = (image.palette.empty() ? palette : image.palette).data() + 3 * index;
  return {p[0], p[1], p[2], 255};
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
  const GifImage image{.width = width,
                       .height = height,
                       .indices = sample_indices(width, height, 1 << bits),
                       .interlaced = interlaced,
                       .lzw = {.minimumCodeSize = std::max(bits, 2)}};
  return {width, height, sample_palette(1 << bits), {image}};
}

GifFile animated_gif(bool interlaced) {
  GifFile file = sample_gif(23, 19, 3, interlaced);
  file.loops = true;
  file.images[0].control = GifControl{2, 4, 1};
  GifImage second = sample_gif(12, 9, 4, true).images[0];
  second.left = 5, second.top = 6;
  second.palette = sample_palette(16, 7);
  second.control = GifControl{3, 4, -1};
  file.images.push_back(second);
  return file;
}

}  // namespace tests

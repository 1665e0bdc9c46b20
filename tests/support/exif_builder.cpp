#include "tests/support/exif_builder.h"

#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

constexpr uint16_t kShort = 3, kLong = 4;

Bytes numbers(bool big, std::initializer_list<uint32_t> values, int bytes) {
  ByteWriter out(big);
  for (const uint32_t v : values) out.put(v, bytes);
  return out;
}

}  // namespace

size_t ExifBuilder::Directory::size() const {
  size_t bytes = 2 + 12 * entries.size() + 4;
  for (const Entry& e : entries) bytes += e.value.size() > 4 ? e.value.size() : 0;
  return bytes;
}

ExifBuilder& ExifBuilder::entry(Ifd ifd, uint16_t tag, uint16_t type, uint32_t count,
                                const Bytes& value) {
  at(ifd).entries.push_back({tag, type, count, value});
  return *this;
}
ExifBuilder& ExifBuilder::shorts(Ifd ifd, uint16_t tag, std::initializer_list<uint32_t> values) {
  return entry(ifd, tag, kShort, static_cast<uint32_t>(values.size()), numbers(big_, values, 2));
}
ExifBuilder& ExifBuilder::longs(Ifd ifd, uint16_t tag, std::initializer_list<uint32_t> values) {
  return entry(ifd, tag, kLong, static_cast<uint32_t>(values.size()), numbers(big_, values, 4));
}
ExifBuilder& ExifBuilder::rationals(Ifd ifd, uint16_t tag, std::initializer_list<uint32_t> parts,
                                    uint16_t type) {
  return entry(ifd, tag, type, static_cast<uint32_t>(parts.size() / 2), numbers(big_, parts, 4));
}
ExifBuilder& ExifBuilder::text(Ifd ifd, uint16_t tag, std::string_view text) {
  return bytes(ifd, tag, ByteWriter().text(text).u8(0), 2);
}
ExifBuilder& ExifBuilder::bytes(Ifd ifd, uint16_t tag, const Bytes& value, uint16_t type) {
  return entry(ifd, tag, type, static_cast<uint32_t>(value.size()), value);
}
ExifBuilder& ExifBuilder::thumbnail(const Bytes& jpeg) {
  thumbnail_ = jpeg;
  return *this;
}
ExifBuilder& ExifBuilder::successor(Ifd ifd, uint32_t offset) {
  at(ifd).successor = offset;
  return *this;
}

void ExifBuilder::put_directory(Bytes& out, const Directory& directory) const {
  ByteWriter head(big_), values(big_);
  size_t area = out.size() + 2 + 12 * directory.entries.size() + 4;
  head.u16(static_cast<uint32_t>(directory.entries.size()));
  for (const Entry& e : directory.entries) {
    head.u16(e.tag).u16(e.type).u32(e.count);
    if (e.value.size() > 4) {
      head.u32(static_cast<uint32_t>(area + values.size()));
      values.block(e.value);
    } else {
      head.block(e.value).block(Bytes(4 - e.value.size()));
    }
  }
  out = ByteWriter().block(out).block(head.u32(directory.successor)).block(values);
}

Bytes ExifBuilder::tiff() const {
  ExifBuilder whole = *this;
  const auto present = [&](Ifd ifd) { return !whole.at(ifd).entries.empty(); };
  // The pointers have their final size before their values are known.
  if (present(Ifd::kExif)) whole.longs(Ifd::k0, 34665, {0});
  if (present(Ifd::kGps)) whole.longs(Ifd::k0, 34853, {0});
  if (!thumbnail_.empty()) {
    whole.longs(Ifd::k1, 513, {0}).longs(Ifd::k1, 514, {static_cast<uint32_t>(thumbnail_.size())});
  }
  std::array<uint32_t, 5> start{8};
  for (size_t i = 0; i < 4; ++i) {
    const bool placed = i == 0 || !whole.directories_[i].entries.empty();
    start[i + 1] = start[i] + (placed ? static_cast<uint32_t>(whole.directories_[i].size()) : 0);
  }
  const auto point = [&](Ifd ifd, uint16_t tag, uint32_t offset) {
    for (Entry& e : whole.at(ifd).entries) {
      if (e.tag == tag && e.value == Bytes(4)) e.value = ByteWriter(big_).u32(offset);
    }
  };
  point(Ifd::k0, 34665, start[1]);
  point(Ifd::k0, 34853, start[2]);
  if (present(Ifd::k1)) whole.at(Ifd::k0).successor = start[3];
  if (!thumbnail_.empty()) point(Ifd::k1, 513, start[4]);

  Bytes out = ByteWriter(big_).text(big_ ? "MM" : "II").u16(42).u32(8);
  for (size_t i = 0; i < 4; ++i) {
    if (i == 0 || !whole.directories_[i].entries.empty())
      whole.put_directory(out, whole.directories_[i]);
  }
  return ByteWriter().block(out).block(thumbnail_);
}

Bytes ExifBuilder::segment() const {
  return tests::segment(0xE1, ByteWriter().text({"Exif\0\0", 6}).block(tiff()));
}

Bytes ExifBuilder::jpeg(const Bytes& plain) const {
  return ByteWriter().block(prefix(plain, 2)).block(segment()).block(suffix(plain, 2));
}

Bytes sample_thumbnail() {
  return encode_own(20, 12, 50);
}

Bytes full_exif_jpeg(bool big) {
  ExifBuilder e(big);
  const Ifd i0 = Ifd::k0, ex = Ifd::kExif, gps = Ifd::kGps, i1 = Ifd::k1;
  e.shorts(i0, 258, {8, 7, 6}).shorts(i0, 259, {6});
  e.text(i0, 271, "Abc").text(i0, 272, "Model of five words, outside");  // inside the entry; behind it
  e.shorts(i0, 274, {6}).rationals(i0, 282, {300, 1}).rationals(i0, 283, {301, 2}).shorts(i0, 296, {3});
  e.text(i0, 305, "soft 1.0").shorts(i0, 531, {2}).text(i0, 33432, "all rights");
  e.rationals(ex, 33434, {1, 125}).rationals(ex, 33437, {28, 10}).shorts(ex, 34855, {400});
  e.bytes(ex, 36864, {'0', '2', '3', '1'}, 7);
  e.text(ex, 36867, "2021:02:03 04:05:06").text(ex, 36868, "2022:03:04 05:06:07");
  e.rationals(ex, 37377, {0u - 7, 2}, 10).rationals(ex, 37380, {0u - 1, 3}, 10);
  e.shorts(ex, 37385, {16}).rationals(ex, 37386, {50, 1}).shorts(ex, 40961, {1});
  e.longs(ex, 40962, {70000}).shorts(ex, 40963, {48}).shorts(ex, 41986, {1}).shorts(ex, 41987, {1});
  e.rationals(ex, 41988, {3, 2}).bytes(gps, 0, {2, 3, 0, 0}, 1);
  e.text(gps, 1, "N").rationals(gps, 2, {48, 1, 8, 1, 1234, 100});
  e.text(gps, 3, "W").rationals(gps, 4, {11, 1, 34, 1, 56, 1});
  e.bytes(gps, 5, {1}, 1).rationals(gps, 6, {5195, 10}).rationals(gps, 7, {9, 1, 8, 1, 7, 1});
  e.text(gps, 18, "WGS-84").bytes(gps, 27, {'A', 'S', 'C', 'I', 'I', 0, 0, 0, 'G', 'P', 'S'}, 7);
  e.text(gps, 29, "2021:02:03").shorts(gps, 30, {1});
  e.shorts(i1, 262, {6}).shorts(i1, 284, {1}).shorts(i1, 4173, {9});
  return e.thumbnail(sample_thumbnail()).jpeg(encode_own(40, 24, 80));
}

}  // namespace tests

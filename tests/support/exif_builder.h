// EXIF segments for tests, entry by entry, in either byte order.
#pragma once

#include <array>

#include "tests/support/bytes.h"

namespace tests {

enum class Ifd { k0, kExif, kGps, k1 };

class ExifBuilder {
 public:
  explicit ExifBuilder(bool big) : big_(big) {}

  ExifBuilder& shorts(Ifd ifd, uint16_t tag, std::initializer_list<uint32_t> values);
  ExifBuilder& longs(Ifd ifd, uint16_t tag, std::initializer_list<uint32_t> values);
  // Numerators and denominators in turn; `type` 5, or 10 for signed ones.
  ExifBuilder& rationals(Ifd ifd, uint16_t tag, std::initializer_list<uint32_t> parts,
                         uint16_t type = 5);
  // With its terminator.
  ExifBuilder& text(Ifd ifd, uint16_t tag, std::string_view text);
  ExifBuilder& bytes(Ifd ifd, uint16_t tag, const Bytes& value, uint16_t type);
  // Anything: `value` is taken as it is, inside the entry up to four bytes.
  ExifBuilder& entry(Ifd ifd, uint16_t tag, uint16_t type, uint32_t count, const Bytes& value);
  // A JPEG thumbnail: 513, 514 and the bytes behind IFD1.
  ExifBuilder& thumbnail(const Bytes& jpeg);
  // What a directory other than IFD0 gives as the offset of its successor.
  ExifBuilder& successor(Ifd ifd, uint32_t offset);

  Bytes tiff() const;
  Bytes segment() const;                 // APP1, marker included
  Bytes jpeg(const Bytes& plain) const;  // `plain` with the segment behind its SOI

 private:
  struct Entry {
    uint16_t tag, type;
    uint32_t count;
    Bytes value;
  };
  struct Directory {
    std::vector<Entry> entries;
    uint32_t successor = 0;
    size_t size() const;
  };
  Directory& at(Ifd ifd) { return directories_[static_cast<size_t>(ifd)]; }
  void put_directory(Bytes& out, const Directory& directory) const;

  bool big_;
  std::array<Directory, 4> directories_;
  Bytes thumbnail_;
};

// Every field that the reader knows, in one JPEG; `big` for Motorola order.
Bytes full_exif_jpeg(bool big);
// The thumbnail inside it.
Bytes sample_thumbnail();

}  // namespace tests

// TIFF 6.0 structure in either byte order, as EXIF uses it: header, directories, entries, values.
#pragma once

#include <cstdint>
#include <optional>

#include "codec/base/byte_order.h"

namespace pelo::tiff {

enum class ByteOrder { kLittle, kBig };

constexpr uint32_t kHeaderSize = 8;  // bytes: order, 42, offset of IFD0
constexpr uint32_t kEntrySize = 12;  // bytes: tag, type, count, value or its offset

enum Type : uint16_t {
  kByte = 1,
  kAscii,
  kShort,
  kLong,
  kRational,
  kSignedByte,
  kUndefined,
  kSignedShort,
  kSignedLong,
  kSignedRational,
  kFloat,
  kDouble
};

constexpr uint16_t load16(const uint8_t* p, ByteOrder order) {
  return order == ByteOrder::kLittle ? load_le16(p) : load_be16(p);
}
constexpr uint32_t load32(const uint8_t* p, ByteOrder order) {
  return order == ByteOrder::kLittle ? load_le32(p) : load_be32(p);
}

struct Header {
  ByteOrder order;
  uint32_t ifd0;  // offset from the header's start
};

// The header's eight bytes; nothing when they are no TIFF header.
constexpr std::optional<Header> parse_header(const uint8_t* p) {
  if (p[0] != p[1] || (p[0] != 'I' && p[0] != 'M')) return std::nullopt;
  const ByteOrder order = p[0] == 'I' ? ByteOrder::kLittle : ByteOrder::kBig;
  if (load16(p + 2, order) != 42) return std::nullopt;
  return Header{order, load32(p + 4, order)};
}

// Bytes of one value of a type; 0 for a code that is not a type.
constexpr uint32_t type_size(uint16_t type) {
  switch (type) {
    case kByte:
    case kAscii:
    case kSignedByte:
    case kUndefined:
      return 1;
    case kShort:
    case kSignedShort:
      return 2;
    case kLong:
    case kSignedLong:
    case kFloat:
      return 4;
    case kRational:
    case kSignedRational:
    case kDouble:
      return 8;
    default:
      return 0;
  }
}

struct Entry {
  uint16_t tag;
  uint16_t type;
  uint32_t count;
  const uint8_t* field;  // the four bytes that hold the value or its offset
  ByteOrder order;

  // The first value, raw, when it stands in the field.
  constexpr std::optional<uint32_t> first_value() const {
    switch (type_size(type)) {
      case 1:
        return field[0];
      case 2:
        return load16(field, order);
      case 4:
        return load32(field, order);
      default:
        return std::nullopt;
    }
  }
};

// The twelve bytes of a directory entry, which must outlive it.
constexpr Entry parse_entry(const uint8_t* p, ByteOrder order) {
  return {load16(p, order), load16(p + 2, order), load32(p + 4, order), p + 8, order};
}

// A TIFF structure in memory. Offsets count from its header, and what they lead to is checked against
// its size; sums of offsets and lengths have 64 bits.
struct Structure {
  const uint8_t* data;
  uint32_t size;  // bytes
  ByteOrder order;
  uint32_t base;  // offset of the header in the source that the structure was read from

  constexpr bool holds(uint64_t offset, uint64_t length) const {
    return offset <= size && length <= size - offset;
  }
};

// A directory: 16-bit count, entries, offset of the next directory.
struct Directory {
  const uint8_t* entries;
  uint32_t count;
  uint32_t next;  // 0: none, or the structure ends before it

  constexpr const uint8_t* entry(uint32_t i) const { return entries + i * kEntrySize; }
};

// The directory at an offset; nothing when its entries do not fit in the structure.
constexpr std::optional<Directory> directory_at(const Structure& tiff, uint32_t offset) {
  if (!tiff.holds(offset, 2)) return std::nullopt;
  const uint32_t count = load16(tiff.data + offset, tiff.order);
  const uint64_t next = uint64_t{offset} + 2 + count * kEntrySize;
  if (next > tiff.size) return std::nullopt;
  return Directory{tiff.data + offset + 2, count,
                   tiff.holds(next, 4) ? load32(tiff.data + next, tiff.order) : 0};
}

}  // namespace pelo::tiff

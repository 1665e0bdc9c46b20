// Tables that tell which entry of a directory fills which member of a record, and how.
#pragma once

#include <cstring>
#include <span>

#include "codec/base/os_memory.h"
#include "codec/formats/jpeg/exif/exif_reader.h"

namespace pelo::jpeg {

using Field = PELOJ_EXIFFIELD;

// Types of TIFF values that an entry may have, one bit each.
enum TypeSet : uint32_t {
  kBytes = 1u << tiff::kByte,
  kAscii = 1u << tiff::kAscii,
  kShort = 1u << tiff::kShort,
  kLong = 1u << tiff::kLong,
  kShortOrLong = kShort | kLong,
  kRational = 1u << tiff::kRational,
  kUndefined = 1u << tiff::kUndefined,
  kSignedRational = 1u << tiff::kSignedRational
};
constexpr uint32_t kAnyCount = UINT32_MAX;

template <class Record>
struct Member {
  uint16_t tag;
  uint32_t types;
  uint32_t count;                                                                  // required
  bool (*store)(Record& record, const Field& field, const tiff::Structure& tiff);  // false: no memory
};

// A copy of the value with a NUL behind it, in place of an earlier one.
template <class T>
bool store_copy(T*& member, const Field& field) {
  OsBuffer<T> copy;
  if (!copy.allocate(size_t{field.length} + 1)) return false;
  if (field.length != 0) std::memcpy(copy.data(), field.value, field.length);
  os_free(member);
  member = copy.release();
  return true;
}

template <class Rational>
Rational load_rational(const uint8_t* value, tiff::ByteOrder order) {
  using Part = decltype(Rational::numerator);
  return {static_cast<Part>(tiff::load32(value, order)),
          static_cast<Part>(tiff::load32(value + 4, order))};
}

// ---- how a member is stored; the tables take their addresses ----

template <auto M, class Record>
bool number(Record& record, const Field& field, const tiff::Structure&) {
  record.*M = field.number;
  return true;
}
template <auto M, class Record>
bool shorts(Record& record, const Field& field, const tiff::Structure& tiff) {
  for (uint32_t i = 0; i < field.count; ++i) {
    (record.*M)[i] = tiff::load16(field.value + 2 * size_t{i}, tiff.order);
  }
  return true;
}
template <auto M, class Record>
bool rational(Record& record, const Field& field, const tiff::Structure& tiff) {
  using Value = std::remove_reference_t<decltype(record.*M)>;
  record.*M = load_rational<Value>(field.value, tiff.order);
  return true;
}
template <auto M, class Record>
bool rationals(Record& record, const Field& field, const tiff::Structure& tiff) {
  using Value = std::remove_reference_t<decltype((record.*M)[0])>;
  for (uint32_t i = 0; i < field.count; ++i) {
    (record.*M)[i] = load_rational<Value>(field.value + 8 * size_t{i}, tiff.order);
  }
  return true;
}
template <auto M, class Record>
bool copy(Record& record, const Field& field, const tiff::Structure&) {
  return store_copy(record.*M, field);
}
// A value that is a part of the record; as long as its required count.
template <auto M, class Record>
bool inplace(Record& record, const Field& field, const tiff::Structure&) {
  std::memcpy(&(record.*M), field.value, field.length);
  return true;
}

// Stores a field by the table; false when memory ran out. Fields that are not in it pass.
template <class Record>
[[nodiscard]] bool store_field(std::span<const Member<Record>> table, Record& record, const Field& field,
                               const tiff::Structure& tiff) {
  for (const Member<Record>& member : table) {
    if (member.tag != field.tag) continue;
    const bool matches = (member.types >> field.type & 1) != 0 &&
                         (member.count == kAnyCount || member.count == field.count);
    return !matches || member.store(record, field, tiff);
  }
  return true;
}

// Hands the entries of a directory to `take`, which stops the walk by false. Returns the offset of the
// next directory, 0 when there is none or the walk was stopped.
template <class Take>
uint32_t walk_directory(const tiff::Structure& tiff, uint32_t offset, Take take) {
  const auto directory = tiff::directory_at(tiff, offset);
  if (!directory) return 0;
  for (uint32_t i = 0; i < directory->count; ++i) {
    Field field;
    if (read_field(&tiff, directory->entry(i), &field) == 0) continue;
    if (!take(field)) return 0;
  }
  return directory->next;
}

}  // namespace pelo::jpeg

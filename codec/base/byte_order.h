// Integers on disk and on the wire, byte by byte: the same on every host, at any alignment.
#pragma once

#include <bit>
#include <cstdint>
#include <cstring>

namespace pelo {

constexpr uint16_t load_be16(const uint8_t* p) {
  return static_cast<uint16_t>(p[0] << 8 | p[1]);
}
constexpr uint32_t load_be32(const uint8_t* p) {
  return uint32_t{p[0]} << 24 | uint32_t{p[1]} << 16 | uint32_t{p[2]} << 8 | p[3];
}
constexpr uint64_t load_be64(const uint8_t* p) {
  return uint64_t{load_be32(p)} << 32 | load_be32(p + 4);
}
constexpr uint16_t load_le16(const uint8_t* p) {
  return static_cast<uint16_t>(p[1] << 8 | p[0]);
}
constexpr uint32_t load_le32(const uint8_t* p) {
  return uint32_t{p[3]} << 24 | uint32_t{p[2]} << 16 | uint32_t{p[1]} << 8 | p[0];
}
// One load where the host's order allows it.
inline uint64_t load_le64(const uint8_t* p) {
  if constexpr (std::endian::native == std::endian::little) {
    uint64_t word;
    std::memcpy(&word, p, sizeof word);
    return word;
  } else {
    return uint64_t{load_le32(p + 4)} << 32 | load_le32(p);
  }
}
constexpr void store_be16(uint8_t* p, uint32_t v) {
  p[0] = static_cast<uint8_t>(v >> 8);
  p[1] = static_cast<uint8_t>(v);
}
constexpr void store_be32(uint8_t* p, uint32_t v) {
  store_be16(p, v >> 16);
  store_be16(p + 2, v);
}

// One store where the host's order allows it, so that pixel loops vectorise.
inline void store_le16(uint8_t* p, uint32_t v) {
  if constexpr (std::endian::native == std::endian::little) {
    const auto word = static_cast<uint16_t>(v);
    std::memcpy(p, &word, sizeof word);
  } else {
    p[0] = static_cast<uint8_t>(v);
    p[1] = static_cast<uint8_t>(v >> 8);
  }
}
inline void store_le32(uint8_t* p, uint32_t v) {
  if constexpr (std::endian::native == std::endian::little) {
    std::memcpy(p, &v, sizeof v);
  } else {
    store_le16(p, v);
    store_le16(p + 2, v >> 16);
  }
}
inline void store_le64(uint8_t* p, uint64_t v) {
  if constexpr (std::endian::native == std::endian::little) {
    std::memcpy(p, &v, sizeof v);
  } else {
    store_le32(p, static_cast<uint32_t>(v));
    store_le32(p + 4, static_cast<uint32_t>(v >> 32));
  }
}

}  // namespace pelo

// The checksum of PNG chunks: ISO 3309, reflected polynomial 0xEDB88320.
#pragma once

#include <cstddef>
#include <cstdint>

#include "tavirpelo/api.h"

namespace pelo::png {

constexpr uint32_t kCrcPreset = 0xFFFFFFFF;

// The register after `size` more bytes. The checksum is the complement of the last register.
uint32_t crc32_update(uint32_t crc, const uint8_t* data, size_t size);

// The checksum of a byte array.
uint32_t crc32(const uint8_t* data, uint32_t length);

}  // namespace pelo::png

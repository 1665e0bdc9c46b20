// Helpers of the wireless bitmap decoder: its integers come in groups of seven bits.
#pragma once

#include <cstdint>

#include "tavirpelo/api.h"

namespace pelo::bmp {

// Packs the groups of the integer at *position, one after another from the highest bit of packed[0], so
// that n groups fill n bytes and end in n zero bits; moves *position behind them and stores n. Stops at
// `size` and after 20 groups, which is what packed must hold.
void collect_groups(const uint8_t* data, int size, int* position, int* groupCount, uint8_t* packed);

// The big-endian value of byteCount bytes, divided by 2 to the power of shift.
uint32_t number_of_groups(const uint8_t* packed, int byteCount, int shift);

// base to a power; 1 for exponents below 1.
uint64_t power(uint64_t base, int exponent);

}  // namespace pelo::bmp

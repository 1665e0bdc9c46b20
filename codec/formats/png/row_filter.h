// Undoing the filters of scanlines (ISO/IEC 15948, clause 9).
#pragma once

#include <cstddef>
#include <cstdint>

namespace pelo::png {

// Restores a scanline in place from its filter type and the restored row above it. An unknown type
// leaves the row as it is but for its first byte, which becomes 0.
void unfilter(uint8_t type, uint8_t* row, const uint8_t* above, size_t rowBytes, int bytesPerPixel);

}  // namespace pelo::png

// Counts the heap that the library holds: of all code in this program, not of shared libraries.
#pragma once

#include <cstddef>

namespace bench {

// Bytes held at the moment.
size_t heap_in_use();
// Highest value of heap_in_use since the last call of reset_heap_peak.
size_t heap_peak();
void reset_heap_peak();

}  // namespace bench

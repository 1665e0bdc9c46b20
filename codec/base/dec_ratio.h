// PELO_GetMaxDecRatio for budgets and needs beyond 31 bits.
#pragma once

#include <cstdint>

namespace pelo {

// Square root of needed / available, 1024 = 1.0 at the most; 0 when either makes no sense. `needed` is
// within 53 bits.
int max_dec_ratio(int64_t needed, int64_t available);

}  // namespace pelo

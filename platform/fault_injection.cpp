#include "platform/fault_injection.h"

namespace pelo::faults {

Counter allocations;
Counter containerCalls;

}  // namespace pelo::faults

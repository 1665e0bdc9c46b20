#include "platform/fault_injection.h"

#ifdef TAVIR_FAULT_HOOKS
namespace pelo::faults {

constinit Counter allocations;
constinit Counter containerCalls;

}  // namespace pelo::faults
#endif

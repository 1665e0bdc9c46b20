// The state that a row-wise or frame-wise decode leaves in an object's pFormatInfo. Every such record
// begins with its kind, so that no decoder takes another's for its own.
#pragma once

#include <cstdint>

#include "codec/base/os_memory.h"
#include "tavirpelo/decinfo.h"

namespace pelo {

enum class FormatKind : uint32_t { kPng = 0x504E4721, kGif = 0x47494621, kBmp = 0x424D5021 };

struct FormatState {
  FormatKind kind;
};

// The object's state when it is a T (a FormatState with a T::kKind), else null.
template <class T>
T* held_state(const TAVIRPELO_DECINFO& decInfo) {
  auto* state = static_cast<FormatState*>(decInfo.pFormatInfo);
  return state != nullptr && state->kind == T::kKind ? static_cast<T*>(state) : nullptr;
}

// Destroys the object's state when it is a T; false, with nothing touched, otherwise.
template <class T>
bool release_state(TAVIRPELO_DECINFO& decInfo) {
  T* state = held_state<T>(decInfo);
  if (state == nullptr) return false;
  OsDelete{}(state);
  decInfo.pFormatInfo = nullptr;
  return true;
}

}  // namespace pelo

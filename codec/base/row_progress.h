// The caller's say between the rows of a decode.
#pragma once

#include "codec/base/errors.h"
#include "tavirpelo/decinfo.h"

namespace pelo {

// Asks the object's CheckFn before more output rows are written; `finished` of them stand. False ends
// the decode. Nobody to ask is no objection.
inline bool caller_agrees(TAVIRPELO_DECINFO* decInfo, int finished) {
  if (decInfo == nullptr || decInfo->CheckFn == nullptr) return true;
  return decInfo->CheckFn(decInfo, finished, finished) != 0 ||
         refuse(Reason::kCancelled, "writing rows");
}

}  // namespace pelo

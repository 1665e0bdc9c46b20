// What the zoom engine needs of the ground: progress reports and the scale that a memory budget allows.
#include <algorithm>
#include <array>

#include "tavirpelo/decinfo.h"

namespace {

// floor(64 sqrt(i)) for i = 0..256, that is the integer square root of 4096 i.
constexpr std::array<int16_t, 257> make_roots() {
  std::array<int16_t, 257> roots{};
  int root = 0;
  for (int i = 0; i <= 256; ++i) {
    while ((root + 1) * (root + 1) <= 4096 * i) ++root;
    roots[static_cast<size_t>(i)] = static_cast<int16_t>(root);
  }
  return roots;
}
constexpr auto kRoots = make_roots();
static_assert(kRoots[1] == 64 && kRoots[2] == 90 && kRoots[256] == 1024);

int root_of(int64_t i) { return kRoots[static_cast<size_t>(std::min<int64_t>(i, 256))]; }

// Calls since the last report, process-wide.
unsigned callsSinceReport = 0;

int percent(const TAVIRPELO_DECINFO& decInfo, int row) {
  return decInfo.outHeight < 1 ? 0 : static_cast<int>(int64_t{row} * 100 / decInfo.outHeight);
}

}  // namespace

int TAVIRPELO_ZoomCheckFn(TAVIRPELO_DECINFO* decInfo, int row, int) {
  int status;
  TAVIRPELO_CheckExStatus(&status);
  if (status < 0) return 0;
  if (status > 0) TAVIRPELO_OsSleep(status);
  if (decInfo == nullptr || decInfo->pCallback == nullptr) return 1;
  const TAVIRPELO_CALLBACK& callback = *decInfo->pCallback;
  if (callsSinceReport == 3 && callback.function != nullptr && callback.argument != 0) {
    callback.function(callback.argument, percent(*decInfo, row));
    callsSinceReport = 0;
  }
  ++callsSinceReport;
  return 1;
}

int PELO_GetMaxDecRatio(int needed, int available) {
  if (needed < 0) return 0;
  if (needed > available) return 1024;
  if (available == 0) return 0;
  // Small ratios keep two more bits.
  if (available >= int64_t{64} * needed) return root_of(int64_t{needed} * 1024 / available) >> 1;
  return root_of(int64_t{needed} * 256 / available);
}

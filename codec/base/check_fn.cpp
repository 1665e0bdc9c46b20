// Progress functions that the library installs in decoder information objects.
#include "tavirpelo/decinfo.h"

namespace {

constexpr unsigned kCallsPerReport = 3;

// One counter serves every object of the process. A record without an argument never resets it.
unsigned callsSinceReport = 0;

int percent_done(const TAVIRPELO_DECINFO& decInfo, int row) {
  if (decInfo.outHeight < 1) return 0;  // no decode has set the height yet
  return static_cast<int>(int64_t{row} * 100 / decInfo.outHeight);
}

}  // namespace

int TAVIRPELO_CheckFn(TAVIRPELO_DECINFO*, int, int) {
  return 1;
}

int TAVIRPELO_ZoomCheckFn(TAVIRPELO_DECINFO* decInfo, int row, int) {
  int status = 0;
  TAVIRPELO_CheckExStatus(&status);
  if (status < 0) return 0;
  if (status > 0) TAVIRPELO_OsSleep(status);
  if (decInfo == nullptr || decInfo->pCallback == nullptr) return 1;

  const TAVIRPELO_CALLBACK& record = *decInfo->pCallback;
  if (callsSinceReport == kCallsPerReport && record.function != nullptr && record.argument != 0) {
    record.function(record.argument, percent_done(*decInfo, row));
    callsSinceReport = 0;
  }
  ++callsSinceReport;
  return 1;
}

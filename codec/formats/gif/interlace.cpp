#include "codec/formats/gif/interlace.h"

namespace pelo::gif {

bool advance_row(Record& record) {
  constexpr int kFirst[] = {0, 4, 2, 1};
  constexpr int kStep[] = {8, 8, 4, 2};
  int& pass = record.interlacePass;
  if (pass < 0 || pass > 4) return false;
  if (pass == 0) {
    ++record.currentRow;
    return true;
  }
  int row = record.currentRow - record.frame.top + kStep[pass - 1];
  // Low frames have no row in some passes.
  while (row >= record.frame.height && pass != 0) {
    pass = (pass + 1) % 5;
    if (pass != 0) row = kFirst[pass - 1];
  }
  record.currentRow = record.frame.top + row;
  return true;
}

}  // namespace pelo::gif

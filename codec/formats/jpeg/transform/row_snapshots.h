// Resuming a baseline scan at any row of MCUs. Where a row's codes begin, and what its DC values are
// predicted from, follows from every code before it: one pass notes both for each row.
#pragma once

#include "codec/formats/jpeg/transform/coefficient_source.h"

namespace pelo::jpeg {

// What decoding a row depends on.
struct RowSnapshot {
  BitState bits;
  std::array<uint32_t, kMaxComponents> lastDc;
  uint32_t restartsToGo;
  uint32_t sourcePosition;  // next unread byte
  uint8_t insufficient;
  uint8_t nextRestart;
  uint8_t unreadMarker;
};
using RowSnapshots = OsBuffer<RowSnapshot>;

// Reads the whole source once, DC only, and notes where each of its rows begins. False when memory is
// short, data fail or the progress function refuses.
int make_row_record(pelo::jpeg::CoefficientSource* source, pelo::jpeg::RowSnapshots* snapshots);

// Notes, and goes back to, the decoder's place. Load: 0 when the source cannot be moved there.
void init_partial(const PELOJ_JDINFO* jdInfo, pelo::jpeg::RowSnapshot* snapshot);
int load_partial(PELOJ_JDINFO* jdInfo, const pelo::jpeg::RowSnapshot* snapshot);

}  // namespace pelo::jpeg

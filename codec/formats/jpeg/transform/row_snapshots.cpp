#include "codec/formats/jpeg/transform/row_snapshots.h"

namespace pelo::jpeg {

void init_partial(const PELOJ_JDINFO* jdInfo, RowSnapshot* snapshot) {
  const EntropyState& entropy = *jdInfo->entropy.state;
  *snapshot = {entropy.bits,
               entropy.lastDc,
               entropy.restartsToGo,
               pelo::source_offset(*jdInfo->source),
               entropy.insufficient,
               jdInfo->marker->nextRestart,
               jdInfo->entropy.unreadMarker};
}

int load_partial(PELOJ_JDINFO* jdInfo, const RowSnapshot* snapshot) {
  if (!pelo::source_reposition(*jdInfo->source, snapshot->sourcePosition)) return 0;
  EntropyState& entropy = *jdInfo->entropy.state;
  entropy.bits = snapshot->bits;
  entropy.lastDc = snapshot->lastDc;
  entropy.restartsToGo = snapshot->restartsToGo;
  entropy.insufficient = snapshot->insufficient;
  jdInfo->marker->nextRestart = snapshot->nextRestart;
  jdInfo->entropy.unreadMarker = snapshot->unreadMarker;
  return 1;
}

int make_row_record(CoefficientSource* source, RowSnapshots* snapshots) {
  PELOJ_JDINFO& jd = source->decoder();
  const int rows = source->grid().down;
  if (!snapshots->allocate(static_cast<size_t>(rows))) return 0;
  for (int row = 0; row < rows; ++row) {
    if (!jd.checkFn(jd.decInfo, row, row)) {
      TAVIRPELO_PrintMessage("__ValorenJpgProcessDataSkip : pJDInfo->CheckFn fail");
      return 0;
    }
    init_partial(&jd, &(*snapshots)[static_cast<size_t>(row)]);
    if (!source->skip_row()) return 0;
  }
  return 1;
}

}  // namespace pelo::jpeg

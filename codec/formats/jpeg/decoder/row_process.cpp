#include "codec/formats/jpeg/decoder/row_process.h"

#include "codec/base/errors.h"
#include "codec/formats/jpeg/decoder/imcu_row.h"
#include "codec/formats/jpeg/decoder/progressive.h"
#include "codec/formats/jpeg/decoder/upsample.h"
#include "codec/formats/jpeg/header_scan.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

// One row function: how it decodes, and what it says.
struct RowDecoder {
  int (*decodeRow)(PELOJ_JDINFO*);
  const char* aborted;
  const char* failed;
};

// Decodes the next iMCU row into the sample rows. Returns its status, 201 for a failure.
int fill_sample_rows(PELOJ_JDINFO& jd, const RowDecoder& function) {
  if (jd.checkFn != nullptr && jd.checkFn(jd.decInfo, jd.output.emitted, jd.progress.rowsDone) == 0) {
    refuse(Reason::kCancelled, "JPEG decoder");
    log_error(function.aborted);
    return PELOJ_FAIL;
  }
  const int before = jd.progress.imcuRow;
  const int status = function.decodeRow(&jd);
  if (status == PELOJ_ROW_FAIL) {
    refuse(Reason::kDamaged, "JPEG decoder");
    log_error(function.failed);
    return PELOJ_FAIL;
  }
  jd.progress.lastImcuDecoded = status == PELOJ_IMAGE_DONE;
  jd.progress.bufferFull = jd.progress.imcuRow != before;
  jd.progress.rowGroup = 0;
  return status;
}

int process(PELOJ_JDINFO& jd, const RowDecoder& function, int* rowCounter, int rowsWanted) {
  int status = 0;
  if (!jd.progress.bufferFull) {
    status = fill_sample_rows(jd, function);
    if (status == PELOJ_FAIL || !jd.progress.bufferFull) return status;
  }
  (jd.progress.skipping ? skip_rows_unconverted : convert_rows)(&jd, rowCounter, rowsWanted);
  if (jd.progress.rowGroup < jd.sizes.scale.block_size()) return 0;
  jd.progress.bufferFull = 0;
  return jd.progress.lastImcuDecoded ? PELOJ_IMAGE_DONE : 0;
}

}  // namespace

RowFunction row_function(const PELOJ_JDINFO& jd) {
  const bool full = jd.sizes.scale == kFull;
  if (stores_coefficients(jd)) {
    return full ? process_progressive_rows : process_progressive_rows_scaled;
  }
  return full ? process_rows : process_rows_scaled;
}

int show_rows(PELOJ_JDINFO& jd) {
  const RowFunction process = row_function(jd);
  while (jd.progress.rowsDone < jd.sizes.used.height && jd.output.emitted < jd.output.bandEnd) {
    int rows = 0;
    const int status = process(&jd, &rows, 1);
    jd.progress.rowsDone += rows;
    if (status == PELOJ_FAIL || status == PELOJ_IMAGE_DONE) return status;
    if (rows == 0) break;
  }
  return jd.progress.rowsDone < jd.sizes.used.height && jd.output.emitted < jd.output.limit
             ? 0
             : PELOJ_IMAGE_DONE;
}

int process_rows(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted) {
  return process(*jdInfo,
                 {decode_imcu_row, "PELOJ_ProcessData : pJDInfo->CheckFn fail",
                  "PELOJ_ProcessData : PELOJ_DecodeSingleiMcu fail"},
                 rowCounter, rowsWanted);
}

int process_rows_scaled(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted) {
  return process(*jdInfo,
                 {decode_imcu_row_scaled, "PELOJ_ProcessData_resize : pJDInfo->CheckFn fail",
                  "PELOJ_ProcessData_resize : PELOJ_DecodeSingleiMcu_resize fail"},
                 rowCounter, rowsWanted);
}

int process_progressive_rows(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted) {
  return process(*jdInfo,
                 {decode_progressive_row, "PELOJ_ProgProcessData : pJDInfo->CheckFn fail",
                  "PELOJ_ProgCompleteProcessData : PELOJ_ProgIDct fail"},
                 rowCounter, rowsWanted);
}

int process_progressive_rows_scaled(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted) {
  return process(*jdInfo,
                 {decode_progressive_row, "PELOJ_ProgCompleteProcessData_resize : pJDInfo->CheckFn fail",
                  "PELOJ_ProgCompleteProcessData_resize : PELOJ_ProgIDct fail"},
                 rowCounter, rowsWanted);
}

}  // namespace pelo::jpeg

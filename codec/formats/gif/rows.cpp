#include "codec/formats/gif/rows.h"

#include <algorithm>
#include <climits>

#include "codec/base/io.h"
#include "codec/formats/gif/driver.h"
#include "codec/formats/gif/lzw.h"
#include "codec/formats/gif/output.h"

namespace pelo::gif {

namespace {

constexpr int kRowsOfBatch = 16;

int end_of_data(Record& record, Supply supply) {
  switch (supply) {
    case Supply::kEnded:
      skip_rest(record);
      return kDone;
    case Supply::kTerminated:
      return kDone;
    case Supply::kCut:  // a file that simply ends is decoded as far as it goes
      return tell_io(record.reader.io) == record.reader.io->size ? kDone : kFailure;
    default:
      return kFailure;
  }
}

// Hands the row in the line buffer on; `consumed` stays 0 when the row is needed again.
bool deliver_row(Record& record, void* output, int& consumed) {
  if (record.lines > 0) return write_output_row(&record, output, &consumed);
  if (record.animated && !compose_row(&record)) return false;
  return write_line(&record, output);
}

// The loop of every mode: goes on until `rowLimit` image rows or, by lines, the call's output rows are
// done. What it leaves in the record is all that the next call needs.
int decode_rows(Record& record, void* output, int rowLimit) {
  const int stop = rowLimit < INT_MAX - record.lzw.rows ? record.lzw.rows + rowLimit : INT_MAX;
  while (record.lzw.rows < record.frame.height) {
    if (record.lzw.rows >= stop) return kMore;
    if (record.lines > 0 && record.linesHere >= record.lines) return kMore;
    const bool wanted = row_is_wanted(record);
    const Supply supply = wanted ? fill_row(record) : skip_row(record);
    if (supply != Supply::kReady) return end_of_data(record, supply);
    int consumed = 1;
    if (!(wanted ? deliver_row(record, output, consumed) : advance_row(record))) return kFailure;
    if (consumed == 0) continue;
    if (wanted) record.lzw.start += record.frame.width;
    ++record.lzw.rows;
  }
  skip_rest(record);
  return kDone;
}

// Output rows that no image row is left for: from the plane, or untouched.
bool emit_plane_rows(Record& record, void* output) {
  const OutputGrid& grid = line_grid_of(record, output);
  for (; record.linesHere < record.lines && record.lineRow < record.picture.height; ++record.linesHere) {
    if (!may_write(record, 1)) return false;
    const int row = record.lineRow++;
    if (record.plane.painted && record.plane.painted[static_cast<size_t>(row)]) {
      write_plane_row(record, row, grid, record.linesHere);
    }
  }
  return true;
}

bool start_lines(Record& record, void* output) {
  if (!begin_image(record)) return false;
  record.imageDone = false;
  if (record.interlacePass == 0 || record.store == nullptr) return true;
  record.imageDone = true;
  return record.plane.allocate(record.picture) && decode_rows(record, output, INT_MAX) != kFailure;
}

}  // namespace

bool begin_image(Record& record) {
  if (record.frame.width == 0) record.frame.height = 0;
  record.currentRow = record.frame.top;
  record.lineRow = record.lines = record.linesHere = 0;
  if (!record.animated) record.rowsWritten = 0;
  set_palette(record);
  cover_frame(record.sampling, record.frame);
  return start_lzw(record);
}

int decode_image(TAVIRPELO_IO* source, Record* record, void* output) {
  record->reader.io = source;
  return begin_image(*record) ? decode_rows(*record, output, INT_MAX) : kFailure;
}

int decode_image_step(TAVIRPELO_IO* source, Record* record, void* output, int start) {
  record->reader.io = source;
  if (start == 1) return begin_image(*record) ? kMore : kFailure;
  return decode_rows(*record, output, kRowsOfBatch);
}

int decode_image_lines(TAVIRPELO_IO* source, Record* record, void* output, int lines, int start) {
  record->reader.io = source;
  if (start == 1 && !start_lines(*record, output)) return kFailure;
  record->lines = lines;
  record->linesHere = 0;
  if (!record->imageDone) {
    const int result = decode_rows(*record, output, INT_MAX);
    if (result == kFailure) return kFailure;
    record->imageDone = result == kDone;
  }
  if (record->imageDone && !emit_plane_rows(*record, output)) return kFailure;
  return record->lineRow < record->picture.height ? kMore : kDone;
}

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

#include "codec/formats/gif/output.h"

#include <algorithm>
#include <cstring>

#include "codec/base/dec_info.h"
#include "codec/base/errors.h"
#include "codec/formats/gif/rows.h"
#include "codec/pixel/quad_sampler.h"
#include "codec/pixel/row_stores.h"

namespace pelo::gif {
namespace {

// The picture columns that the frame covers, in one row of the picture.
RowSpan frame_span(const Sampling& sampling, const OutputGrid& grid, int row) {
  return grid.span(row, sampling.begin, sampling.end - sampling.begin);
}

// The indices of the current image row; [0] belongs to the frame's first column.
const uint8_t* indices_of(const Record& record) {
  return record.line.data() + record.lzw.start;
}

void write_sampled_row(const Record& record, const OutputGrid& grid, int row) {
  const RowSpan span = frame_span(record.sampling, grid, row);
  const uint8_t* indices = indices_of(record);
  const Rgba* palette = record.palette;
  if (!record.sampling.columns) {
    store_span(record.store, span, [=](int i) { return palette[indices[i]]; });
    return;
  }
  const uint16_t* columns = record.sampling.columns.data() + record.sampling.begin;
  const int left = record.frame.left;
  store_span(record.store, span, [=](int i) { return palette[indices[columns[i] - left]]; });
}

void write_into_plane(Record& record) {
  const Sampling& sampling = record.sampling;
  const OutputRows rows = rows_of(sampling, record.currentRow);
  const uint8_t* indices = indices_of(record);
  for (int row = rows.begin; row < rows.end; ++row) {
    record.plane.painted[static_cast<size_t>(row)] = 1;
    uint8_t* target = record.plane.row(row);
    if (row > rows.begin) {
      std::memcpy(target, record.plane.row(rows.begin), static_cast<size_t>(sampling.to.width));
      continue;
    }
    for (int k = sampling.begin; k < sampling.end; ++k) {
      const int column = sampling.columns ? sampling.columns[static_cast<size_t>(k)] : k;
      target[k] = indices[column - record.frame.left];
    }
  }
}

// How many output rows are made of the current row.
int rows_of_current(const Record& record) {
  if (record.currentRow >= record.screen.height) return 0;
  const OutputRows rows = rows_of(record.sampling, record.currentRow);
  return std::max(0, rows.end - rows.begin);
}

void clear_span(const Record& record, const RowSpan& span) {
  store_span(record.store, span, [](int) { return Rgba{}; });
}

// The output rows of the current row, left and right of what the frame covers.
void clear_beside_frame(Record& record, void* output) {
  const Sampling& sampling = record.sampling;
  const OutputGrid& grid = grid_of(record, output);
  const OutputRows rows = rows_of(sampling, record.currentRow);
  for (int row = rows.begin; row < rows.end; ++row) {
    record.plane.painted[static_cast<size_t>(row)] = 1;
    clear_span(record, grid.span(row, 0, sampling.begin));
    clear_span(record, grid.span(row, sampling.end, sampling.to.width - sampling.end));
  }
}

bool write_still_row(Record& record, void* output) {
  const int rows = rows_of_current(record);
  if (rows == 0) return true;
  if (!may_write(record, rows)) return false;
  if (record.plane.painted) clear_beside_frame(record, output);
  if (record.picture == record.screen) {
    write_row(&record, output);
  } else {
    write_sampled_rows(&record, output);
  }
  return true;
}

}  // namespace

bool may_write(Record& record, int rows) {
  if (rows < 1) return true;
  record.ended = !caller_agrees(record.decInfo, record.rowsWritten);
  record.rowsWritten += rows;
  return !record.ended;
}

void clear_unpainted_rows(Record& record, void* output) {
  const OsBuffer<uint8_t>& painted = record.plane.painted;
  const OutputGrid& grid = grid_of(record, output);
  for (size_t row = 0; row < painted.size(); ++row) {
    if (painted[row] == 0)
      clear_span(record, grid.span(static_cast<int64_t>(row), 0, record.picture.width));
  }
}

StoreRgba gif_storer(int format) {
  return format == TAVIRPELO_RGB565A8 ? nullptr : rgba_storer(format, Alpha::kIgnored);
}

void set_palette(Record& record) {
  for (int i = 0; i < 256; ++i) {
    const uint32_t lanes = record.colours[i];
    record.palette[i] = {static_cast<uint8_t>(lanes >> 20), static_cast<uint8_t>(lanes >> 10),
                         static_cast<uint8_t>(lanes), 255};
  }
  if (record.control.transparentIndex >= 0) record.palette[record.control.transparentIndex] = {};
}

bool row_is_wanted(const Record& record) {
  if (record.currentRow >= record.screen.height) return false;
  if (record.animated) return true;  // the canvas needs it
  if (record.store == nullptr) return false;
  const OutputRows rows = rows_of(record.sampling, record.currentRow);
  return rows.end > std::max(rows.begin, record.lineRow);
}

void write_plane_row(const Record& record, int planeRow, const OutputGrid& grid, int row) {
  const uint8_t* indices = record.plane.row(planeRow) + record.sampling.begin;
  const Rgba* palette = record.palette;
  store_span(record.store, frame_span(record.sampling, grid, row),
             [=](int i) { return palette[indices[i]]; });
}

bool write_screen_row(Record& record, void* output) {
  if (!may_write(record, rows_of_current(record))) return false;
  if (record.picture == record.screen) {
    write_screen_pixels(&record, output);
  } else {
    write_sampled_screen(&record, output);
  }
  return true;
}

int write_row(Record* record, void* output) {
  if (record->store == nullptr || record->currentRow >= record->screen.height) return 1;
  write_sampled_row(*record, grid_of(*record, output), record->currentRow);
  return 1;
}

int write_sampled_rows(Record* record, void* output) {
  if (record->store == nullptr || record->currentRow >= record->screen.height) return 1;
  const OutputGrid& grid = grid_of(*record, output);
  const OutputRows rows = rows_of(record->sampling, record->currentRow);
  for (int row = rows.begin; row < rows.end; ++row) write_sampled_row(*record, grid, row);
  return 1;
}

int write_screen_pixels(Record* record, void* output) {
  if (record->store == nullptr || record->currentRow >= record->screen.height) return 1;
  const RowSpan span = grid_of(*record, output).span(record->currentRow, 0, record->picture.width);
  store_colours(record->store, record->rowSource + span.skip, span.count, span.first, span.step);
  return 1;
}

int write_sampled_screen(Record* record, void* output) {
  if (record->store == nullptr || record->currentRow >= record->screen.height) return 1;
  if (!record->sampling.columns) return 1;  // an empty picture
  const OutputGrid& grid = grid_of(*record, output);
  const OutputRows rows = rows_of(record->sampling, record->currentRow);
  const uint16_t* columns = record->sampling.columns.data();
  const Rgba* source = record->rowSource;
  for (int row = rows.begin; row < rows.end; ++row) {
    const RowSpan span = grid.span(row, 0, record->picture.width);
    store_span(record->store, span, [=](int i) { return source[columns[i]]; });
  }
  return 1;
}

int write_line(Record* record, void* output) {
  bool goesOn = true;
  if (record->animated) {
    goesOn = write_screen_row(*record, output);
  } else if (record->plane.indices) {
    write_into_plane(*record);
  } else {
    goesOn = write_still_row(*record, output);
  }
  return goesOn && advance_row(*record);
}

int write_output_row(Record* record, void* output, int* consumed) {
  const OutputRows rows = rows_of(record->sampling, record->currentRow);
  if (record->lineRow < rows.end) {
    if (!may_write(*record, 1)) return 0;
    // Rows above the image keep what the buffer holds.
    if (record->lineRow >= rows.begin) {
      write_sampled_row(*record, line_grid_of(*record, output), record->linesHere);
    }
    ++record->lineRow;
    ++record->linesHere;
  }
  *consumed = record->lineRow >= rows.end;
  return *consumed == 0 || advance_row(*record);
}

// ---- averaging ----

namespace {

// Four channels of 16 bits: red in the low one, alpha in the high one. Sums of four samples fit.
constexpr uint64_t wide_lanes(Rgba c) {
  return c.r | uint64_t{c.g} << 16 | uint64_t{c.b} << 32 | uint64_t{c.a} << 48;
}

constexpr Rgba average_of_four(uint64_t sums) {
  return {static_cast<uint8_t>(sums >> 2), static_cast<uint8_t>(sums >> 18),
          static_cast<uint8_t>(sums >> 34), static_cast<uint8_t>(sums >> 50)};
}

// The samples of a plane; what the image did not paint counts as zero.
class Samples {
 public:
  explicit Samples(const Record& record)
      : plane_(record.plane), begin_(record.sampling.begin), end_(record.sampling.end) {
    for (int i = 0; i < 256; ++i) lanes_[i] = wide_lanes(record.palette[i]);
  }

  void select_rows(int64_t upper, int64_t lower) {
    rows_[0] = row(upper);
    rows_[1] = row(lower);
  }
  uint64_t at(int64_t column) const {
    if (column < begin_ || column >= end_) return 0;
    uint64_t sum = 0;
    for (const uint8_t* indices : rows_) sum += indices != nullptr ? lanes_[indices[column]] : 0;
    return sum;
  }

 private:
  const uint8_t* row(int64_t y) const {
    return plane_.painted[static_cast<size_t>(y)] ? plane_.row(static_cast<int>(y)) : nullptr;
  }

  const IndexPlane& plane_;
  int begin_, end_;
  uint64_t lanes_[256];
  const uint8_t* rows_[2] = {};
};

// Enlarging, copying and reducing alike: at equal sizes both points are the pixel itself.
bool resample(Record& record, Size target, const OutputGrid& grid) {
  const Size source = record.plane.size;
  Samples samples(record);
  QuarterPoints rows(source.height, target.height);
  for (int y = 0; y < target.height; ++y, rows.advance()) {
    if (!may_write(record, 1)) return false;
    samples.select_rows(rows.first(), rows.second());
    const RowSpan span = grid.span(y, 0, target.width);
    QuarterPoints columns(source.width, target.width, quarter_phases(source.width), span.skip);
    store_span(record.store, span, [&](int) {
      const uint64_t sums = samples.at(columns.first()) + samples.at(columns.second());
      columns.advance();
      return average_of_four(sums);
    });
  }
  return true;
}

}  // namespace

bool plan_reduction(Record& record) {
  const Size reduced = reduced_size(record);
  if (record.store == nullptr || !is_reduced(record)) return true;
  if (reduced == record.picture) {  // sampling straight into the output gives the same pixels
    return record.plane.painted.allocate(static_cast<size_t>(record.picture.height)) ||
           refuse(Reason::kNoMemory, "GIF picture");
  }
  return set_sampling(record.sampling, record.screen, reduced) && record.plane.allocate(reduced);
}

// A picture that is not turned fills the whole box when that is smaller on both sides.
bool finish_picture(Record& record, void* output) {
  const Size reduced = record.plane.size;
  if (!record.plane.indices) {
    clear_unpainted_rows(record, output);
    return true;
  }
  const Size buffer = record.request.buffer;
  const bool upright = (record.option & TAVIRPELO_ROTATE_MASK) == TAVIRPELO_ROTATE_0;
  const bool tight = (record.option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_TIGHT;
  if (upright && !tight && buffer.width < reduced.width && buffer.height < reduced.height) {
    return resample(record, buffer,
                    OutputGrid(output, buffer, 0, 0, bytes_per_pixel(record.request.format)));
  }
  return resample(record, record.picture, grid_of(record, output));
}

}  // namespace pelo::gif

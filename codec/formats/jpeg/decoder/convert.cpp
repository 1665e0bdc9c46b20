#include "codec/base/axis_stepper.h"
#include "codec/formats/jpeg/decoder/rows.h"

namespace pelo::jpeg {
namespace {

// The one channel of a grey row in all three lanes.
struct GreyLanes {
  using Row = GridRow;
  static uint32_t word(const Row& row, uint32_t column) {
    const uint32_t sample = row.plane[0][column];
    return pack_lanes(sample, sample, sample);
  }
};

// What the channels of a full-grid row are, and the writers they go to.
struct YccRows {
  static void write(PELOJ_JDINFO& jd, const GridRow& row, int count) {
    write_ycc_row(jd.output, row.plane[0], row.plane[1], row.plane[2], count);
  }
  static void write_sums(PELOJ_JDINFO& jd) {
    write_ycc_sums(jd.output, jd.resampling.quarters.words(), jd.sizes.target.width);
  }
  using Lanes = ColourLanes;
};
struct RgbRows {
  static void write(PELOJ_JDINFO& jd, const GridRow& row, int count) {
    write_rgb_row(jd.output, row.plane[0], row.plane[1], row.plane[2], count);
  }
  static void write_sums(PELOJ_JDINFO& jd) {
    write_rgb_sums(jd.output, jd.resampling.quarters.words(), jd.sizes.target.width);
  }
  using Lanes = ColourLanes;
};
struct GreyRows {
  static void write(PELOJ_JDINFO& jd, const GridRow& row, int count) {
    write_grey_row(jd.output, row.plane[0], count);
  }
  static void write_sums(PELOJ_JDINFO& jd) {
    write_grey_sums(jd.output, jd.resampling.quarters.words(), jd.sizes.target.width);
  }
  using Lanes = GreyLanes;
};

// The row at the read position, from the crop offset on.
GridRow grid_row(const Frame& frame, int row, int cropX) {
  GridRow grid{};
  for (int c = 0; c < frame.componentCount; ++c) {
    grid.plane[c] = (*frame.components)[static_cast<size_t>(c)].colourRows[row] + cropX;
  }
  return grid;
}

// True when an input row holds the sample point with offset q of output row y:
// 0 <= y * inH + q - i * outH < outH.
bool holds_point(const Sizes& sizes, int inputRow, int outputRow, int q) {
  const int64_t distance =
      int64_t{outputRow} * sizes.used.height + q - int64_t{inputRow} * sizes.target.height;
  return distance >= 0 && distance < sizes.target.height;
}
bool holds_quarter(const Sizes& sizes, int inputRow, int outputRow) {
  return holds_point(sizes, inputRow, outputRow, sizes.used.height / 4);
}
bool holds_three_quarters(const Sizes& sizes, int inputRow, int outputRow) {
  return holds_point(sizes, inputRow, outputRow, static_cast<int>(int64_t{3} * sizes.used.height / 4));
}

// Serves the next output row from the current input row. A row is opened by its quarter point and closed
// by its three-quarter point; since no output row's quarter point lies above the three-quarter point of
// the one before, only one is open at a time. True when an output row was finished.
template <class Rows>
bool serve_output_row(PELOJ_JDINFO& jd, const GridRow& row) {
  const int y = jd.output.emitted;
  if (holds_quarter(jd.sizes, jd.resampling.inputRow, y))
    jd.resampling.quarters.open<typename Rows::Lanes>(row);
  if (!holds_three_quarters(jd.sizes, jd.resampling.inputRow, y)) return false;
  jd.resampling.quarters.close<typename Rows::Lanes>(row);
  Rows::write_sums(jd);
  return true;
}

// True when the band is full and the picture goes on: the input row may have points of its next row too.
bool pauses(const RowOutput& output) {
  return output.emitted == output.bandEnd && output.emitted < output.limit;
}

// Four-point averages; every row of the call is used up.
template <class Rows>
void convert_averaging(PELOJ_JDINFO& jd, int rows) {
  for (int i = 0; i < rows; ++i, ++jd.resampling.inputRow) {
    const GridRow row = grid_row(jd.frame, jd.progress.readPosition + i, jd.sizes.cropX);
    if (jd.sizes.exact) {
      Rows::write(jd, row, jd.sizes.target.width);
      continue;
    }
    while (jd.output.emitted < jd.output.bandEnd && serve_output_row<Rows>(jd, row)) {
    }
    if (pauses(jd.output)) return;
  }
  jd.resampling.continueFlag = 0;
}

// The same for enlarging: one output row a call.
template <class Rows>
void convert_enlarging(PELOJ_JDINFO& jd, int rows) {
  if (rows > 0 &&
      serve_output_row<Rows>(jd, grid_row(jd.frame, jd.progress.readPosition, jd.sizes.cropX))) {
    // More points may fall into this input row.
    if (jd.output.emitted < jd.output.limit &&
        holds_quarter(jd.sizes, jd.resampling.inputRow, jd.output.emitted))
      return;
  }
  jd.resampling.continueFlag = 0;
  jd.resampling.inputRow += rows;
}

// Centre points. A row may be none's centre, or that of several rows of an enlarged picture.
void convert_picking(PELOJ_JDINFO& jd, int rows) {
  for (int i = 0; i < rows; ++i, ++jd.resampling.inputRow) {
    const GridRow row = grid_row(jd.frame, jd.progress.readPosition + i, jd.sizes.cropX);
    if (jd.sizes.exact) {
      YccRows::write(jd, row, jd.sizes.target.width);
      continue;
    }
    while (jd.output.emitted < jd.output.bandEnd &&
           holds_point(jd.sizes, jd.resampling.inputRow, jd.output.emitted, jd.sizes.used.height / 2)) {
      write_picked_row(jd.output, jd.resampling.centres.data(), row.plane[0], row.plane[1], row.plane[2],
                       jd.sizes.target.width);
    }
    if (pauses(jd.output)) return;
  }
  jd.resampling.continueFlag = 0;
}

// Small pictures, coarse modes, and in mode 1 pictures that hardly shrink take the fast converter.
bool wants_fast(const Sizes& sizes, int decMode) {
  if (sizes.output.width <= 99 && sizes.output.height <= 99) return true;
  if (decMode >= 2) return true;
  return decMode == 1 && int64_t{12} * sizes.output.width >= int64_t{7} * sizes.scaled.width &&
         int64_t{12} * sizes.output.height >= int64_t{7} * sizes.scaled.height;
}

}  // namespace

bool choose_converter(ColourSpace colourSpace, const Sizes& sizes, int decMode, Resampling& resampling) {
  const bool larger =
      sizes.output.width > sizes.scaled.width || sizes.output.height > sizes.scaled.height;
  resampling.sampling = Sampling::kQuarters;
  switch (colourSpace) {
    case ColourSpace::kYcc:
      if (larger ? decMode >= 2 : wants_fast(sizes, decMode)) {
        resampling.sampling = Sampling::kCentres;
        resampling.convert = larger ? pick_enlarging_ycc : pick_ycc;
      } else {
        resampling.convert = larger ? enlarge_ycc : average_ycc;
      }
      return true;
    case ColourSpace::kGrey:
      resampling.convert = larger ? enlarge_grey : average_grey;
      return true;
    case ColourSpace::kRgb:
      resampling.convert = larger ? enlarge_rgb : average_rgb;
      return true;
    default:
      return false;
  }
}

bool prepare_resampling(const Sizes& sizes, Resampling& resampling) {
  if (sizes.exact) return true;
  if (resampling.sampling == Sampling::kQuarters)
    return resampling.quarters.prepare(sizes.used.width, sizes.target.width);
  const auto width = static_cast<size_t>(sizes.target.width);
  if (!resampling.centres.allocate(width)) return false;
  AxisStepper centre(sizes.used.width, sizes.target.width, sizes.used.width / 2);
  for (size_t x = 0; x < width; ++x, centre.advance()) {
    resampling.centres[x] = static_cast<uint16_t>(centre.position());
  }
  return true;
}

void average_ycc(PELOJ_JDINFO* jdInfo, int rows) {
  convert_averaging<YccRows>(*jdInfo, rows);
}
void enlarge_ycc(PELOJ_JDINFO* jdInfo, int rows) {
  convert_enlarging<YccRows>(*jdInfo, rows);
}
void pick_ycc(PELOJ_JDINFO* jdInfo, int rows) {
  convert_picking(*jdInfo, rows);
}
void pick_enlarging_ycc(PELOJ_JDINFO* jdInfo, int rows) {
  convert_picking(*jdInfo, rows);
}
void average_grey(PELOJ_JDINFO* jdInfo, int rows) {
  convert_averaging<GreyRows>(*jdInfo, rows);
}
void enlarge_grey(PELOJ_JDINFO* jdInfo, int rows) {
  convert_enlarging<GreyRows>(*jdInfo, rows);
}
void average_rgb(PELOJ_JDINFO* jdInfo, int rows) {
  convert_averaging<RgbRows>(*jdInfo, rows);
}
void enlarge_rgb(PELOJ_JDINFO* jdInfo, int rows) {
  convert_enlarging<RgbRows>(*jdInfo, rows);
}

}  // namespace pelo::jpeg

#include "codec/formats/jpeg/decoder/convert.h"

#include "codec/base/axis_stepper.h"

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
    write_ycc_row(&jd, row.plane[0], row.plane[1], row.plane[2], count);
  }
  static void write_sums(PELOJ_JDINFO& jd) {
    write_ycc_sums(&jd, jd.resampling.quarters.words(), jd.sizes.target.width);
  }
  using Lanes = ColourLanes;
};
struct RgbRows {
  static void write(PELOJ_JDINFO& jd, const GridRow& row, int count) {
    write_rgb_row(&jd, row.plane[0], row.plane[1], row.plane[2], count);
  }
  static void write_sums(PELOJ_JDINFO& jd) {
    write_rgb_sums(&jd, jd.resampling.quarters.words(), jd.sizes.target.width);
  }
  using Lanes = ColourLanes;
};
struct GreyRows {
  static void write(PELOJ_JDINFO& jd, const GridRow& row, int count) {
    write_grey_row(&jd, row.plane[0], count);
  }
  static void write_sums(PELOJ_JDINFO& jd) {
    write_grey_sums(&jd, jd.resampling.quarters.words(), jd.sizes.target.width);
  }
  using Lanes = GreyLanes;
};

// The row at the read position, from the crop offset on.
GridRow grid_row(const PELOJ_JDINFO& jd, int row) {
  GridRow grid{};
  for (int c = 0; c < jd.frame.componentCount; ++c) {
    grid.plane[c] =
        (*jd.frame.components)[static_cast<size_t>(c)].colourRows[jd.progress.readPosition + row] +
        jd.sizes.cropX;
  }
  return grid;
}

// True when an input row holds the sample point with offset q of output row y:
// 0 <= y * inH + q - i * outH < outH.
bool holds_point(const PELOJ_JDINFO& jd, int inputRow, int outputRow, int q) {
  const int64_t distance =
      int64_t{outputRow} * jd.sizes.used.height + q - int64_t{inputRow} * jd.sizes.target.height;
  return distance >= 0 && distance < jd.sizes.target.height;
}
bool holds_quarter(const PELOJ_JDINFO& jd, int outputRow) {
  return holds_point(jd, jd.resampling.inputRow, outputRow, jd.sizes.used.height / 4);
}
bool holds_three_quarters(const PELOJ_JDINFO& jd, int outputRow) {
  return holds_point(jd, jd.resampling.inputRow, outputRow,
                     static_cast<int>(int64_t{3} * jd.sizes.used.height / 4));
}

// Serves the next output row from the current input row. A row is opened by its quarter point and closed
// by its three-quarter point; since no output row's quarter point lies above the three-quarter point of
// the one before, only one is open at a time. True when an output row was finished.
template <class Rows>
bool serve_output_row(PELOJ_JDINFO& jd, const GridRow& row) {
  const int y = jd.output.emitted;
  if (holds_quarter(jd, y)) jd.resampling.quarters.open<typename Rows::Lanes>(row);
  if (!holds_three_quarters(jd, y)) return false;
  jd.resampling.quarters.close<typename Rows::Lanes>(row);
  Rows::write_sums(jd);
  return true;
}

// True when the band is full and the picture goes on: the input row may have points of its next row too.
bool pauses(const PELOJ_JDINFO& jd) {
  return jd.output.emitted == jd.output.bandEnd && jd.output.emitted < jd.output.limit;
}

// Four-point averages; every row of the call is used up.
template <class Rows>
void convert_averaging(PELOJ_JDINFO& jd, int rows) {
  for (int i = 0; i < rows; ++i, ++jd.resampling.inputRow) {
    const GridRow row = grid_row(jd, i);
    if (jd.sizes.exact) {
      Rows::write(jd, row, jd.sizes.target.width);
      continue;
    }
    while (jd.output.emitted < jd.output.bandEnd && serve_output_row<Rows>(jd, row)) {
    }
    if (pauses(jd)) return;
  }
  jd.resampling.continueFlag = 0;
}

// The same for enlarging: one output row a call.
template <class Rows>
void convert_enlarging(PELOJ_JDINFO& jd, int rows) {
  if (rows > 0 && serve_output_row<Rows>(jd, grid_row(jd, 0))) {
    // More points may fall into this input row.
    if (jd.output.emitted < jd.output.limit && holds_quarter(jd, jd.output.emitted)) return;
  }
  jd.resampling.continueFlag = 0;
  jd.resampling.inputRow += rows;
}

// Centre points. A row may be none's centre, or that of several rows of an enlarged picture.
template <auto WriteRow>
void convert_picking(PELOJ_JDINFO& jd, int rows) {
  for (int i = 0; i < rows; ++i, ++jd.resampling.inputRow) {
    const GridRow row = grid_row(jd, i);
    if (jd.sizes.exact) {
      YccRows::write(jd, row, jd.sizes.target.width);
      continue;
    }
    while (jd.output.emitted < jd.output.bandEnd &&
           holds_point(jd, jd.resampling.inputRow, jd.output.emitted, jd.sizes.used.height / 2)) {
      WriteRow(&jd, row.plane[0], row.plane[1], row.plane[2], jd.sizes.target.width);
    }
    if (pauses(jd)) return;
  }
  jd.resampling.continueFlag = 0;
}

// Small pictures, coarse modes, and in mode 1 pictures that hardly shrink take the fast converter.
bool wants_fast(const PELOJ_JDINFO& jd) {
  if (jd.sizes.output.width <= 99 && jd.sizes.output.height <= 99) return true;
  if (jd.decMode >= 2) return true;
  return jd.decMode == 1 && int64_t{12} * jd.sizes.output.width >= int64_t{7} * jd.sizes.scaled.width &&
         int64_t{12} * jd.sizes.output.height >= int64_t{7} * jd.sizes.scaled.height;
}

}  // namespace

bool choose_converter(PELOJ_JDINFO& jd) {
  const bool larger =
      jd.sizes.output.width > jd.sizes.scaled.width || jd.sizes.output.height > jd.sizes.scaled.height;
  jd.resampling.sampling = Sampling::kQuarters;
  switch (jd.frame.colourSpace) {
    case ColourSpace::kYcc:
      if (larger ? jd.decMode >= 2 : wants_fast(jd)) {
        jd.resampling.sampling = Sampling::kCentres;
        jd.resampling.convert = larger ? pick_enlarging_ycc : pick_ycc;
      } else {
        jd.resampling.convert = larger ? enlarge_ycc : average_ycc;
      }
      return true;
    case ColourSpace::kGrey:
      jd.resampling.convert = larger ? enlarge_grey : average_grey;
      return true;
    case ColourSpace::kRgb:
      jd.resampling.convert = larger ? enlarge_rgb : average_rgb;
      return true;
    default:
      return false;
  }
}

bool prepare_resampling(PELOJ_JDINFO& jd) {
  if (jd.sizes.exact) return true;
  if (jd.resampling.sampling == Sampling::kQuarters)
    return jd.resampling.quarters.prepare(jd.sizes.used.width, jd.sizes.target.width);
  const auto width = static_cast<size_t>(jd.sizes.target.width);
  if (!jd.resampling.centres.allocate(width)) return false;
  AxisStepper centre(jd.sizes.used.width, jd.sizes.target.width, jd.sizes.used.width / 2);
  for (size_t x = 0; x < width; ++x, centre.advance()) {
    jd.resampling.centres[x] = static_cast<uint16_t>(centre.position());
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
  convert_picking<write_picked_row>(*jdInfo, rows);
}
void pick_enlarging_ycc(PELOJ_JDINFO* jdInfo, int rows) {
  convert_picking<write_picked_enlarged_row>(*jdInfo, rows);
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

// The converters: full-grid rows of the decoded size become rows of the target size (copied, picked at
// centres, or averaged from four points) and go to a row writer.
//
// Output column x of outW draws on input columns floor((x * inW + q) / outW): q = inW/2 for the centre
// point, inW/4 and 3*inW/4 for the two points of the averages; rows likewise.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// Each converts `rows` rows of the current row group from the read position on. The plain members and
// the fast enlarging one finish their rows in one call; the averaging enlarging ones return after every
// output row. All clear the continue flag when the input row is used up, and keep it, one row a call,
// when the band of output rows is full before.
void average_ycc(PELOJ_JDINFO* jdInfo, int rows);
void enlarge_ycc(PELOJ_JDINFO* jdInfo, int rows);
void pick_ycc(PELOJ_JDINFO* jdInfo, int rows);
void pick_enlarging_ycc(PELOJ_JDINFO* jdInfo, int rows);
void average_grey(PELOJ_JDINFO* jdInfo, int rows);
void enlarge_grey(PELOJ_JDINFO* jdInfo, int rows);
void average_rgb(PELOJ_JDINFO* jdInfo, int rows);
void enlarge_rgb(PELOJ_JDINFO* jdInfo, int rows);

// Picks the converter of a colour space, sizes and a decode mode; false for a colour space that has
// none.
[[nodiscard]] bool choose_converter(ColourSpace colourSpace, const Sizes& sizes, int decMode,
                                    Resampling& resampling);

// Makes the column table that the chosen converter needs, and room for its sums.
[[nodiscard]] bool prepare_resampling(const Sizes& sizes, Resampling& resampling);

}  // namespace pelo::jpeg

// Reduced still images: their pixels are averaged in a last step, unless sampling them is all there is
// to it.
#pragma once

#include "codec/formats/gif/record.h"

namespace pelo::gif {

// Prepares the plane of sampled indices when the picture is to be averaged, or the note of the rows that
// are there when it is sampled into the output. False when memory is short.
[[nodiscard]] bool plan_reduction(Record& record);

// Averages the plane, if there is one, into the caller's buffer, or clears the rows that did not come.
// False when the caller ends the decode.
bool finish_picture(Record& record, void* output);

}  // namespace pelo::gif

// The last step of a reduced still image: averaging its sampled pixels into the output.
#pragma once

#include "codec/formats/gif/record.h"

namespace pelo::gif {

// Prepares the plane of sampled indices when the picture is to be averaged. False when memory is short.
[[nodiscard]] bool plan_reduction(Record& record);

// Averages the plane, if there is one, into the caller's buffer.
void write_reduced(const Record& record, void* output);

}  // namespace pelo::gif

// LZW decompression of one image's data, as far as the next row asks for.
#pragma once

#include "codec/formats/gif/record.h"

namespace pelo::gif {

enum class Supply {
  kReady,       // what was asked for is there
  kEnded,       // an end code, or one that means the same
  kTerminated,  // the data's last sub-block is behind the reader
  kCut,         // the source ends inside the data
  kBroken,      // a code that cannot exist
};

// Ready for the data that the reader stands at: table, line buffer and state. False for a minimum code
// size above 11 or when memory is short.
[[nodiscard]] bool start_lzw(Record& record);

// Makes the next image row stand in the line buffer from lzw.start on.
Supply fill_row(Record& record);

// Lets the next image row go by; what is not written is only counted.
Supply skip_row(Record& record);

// Moves the reader behind the image's data after its last row or its end code.
void skip_rest(Record& record);

}  // namespace pelo::gif

// What the header of every frame begins with (T.81 B.2.2), and why a frame is refused.
#pragma once

#include "codec/base/errors.h"
#include "codec/base/source.h"

namespace pelo::jpeg {

constexpr int kMaxSide = 5000;  // pixels, both directions

struct FrameHead {
  int precision;  // bits a sample
  int height, width;
};
constexpr uint32_t kFrameHeadBytes = 5;

[[nodiscard]] FrameHead load_frame_head(const uint8_t* bytes);

// Consumes length and head of a frame's segment; `remaining` bytes of it follow. False for a length that
// does not reach so far, or at the source's end.
[[nodiscard]] bool read_frame_head(PELOJ_SOURCE& source, FrameHead& head, uint32_t& remaining);

// Notes what keeps a frame from being decoded. Always false.
bool refuse_frame(const FrameHead& head, const char* stage);

// Why frames of the coding process behind a marker (T.81 Table B.1) are not read; kNone for those that
// are, and for what begins no frame. The source stands behind the marker's code, and stays there.
[[nodiscard]] Reason foreign_process(PELOJ_SOURCE& source, uint8_t code);

}  // namespace pelo::jpeg

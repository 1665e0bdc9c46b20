// The parts of marker parsing that the header scans and the decoding parser share: finding markers,
// segment lengths, what the header of every frame begins with (T.81 B.2.2), and why a frame is refused.
#pragma once

#include "codec/base/errors.h"
#include "codec/base/source.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {

// Consumes bytes up to and including the first FF D8.
[[nodiscard]] bool find_soi(PELOJ_SOURCE& source);

// Consumes up to the next marker and its code; FF FF counts as a fill byte.
[[nodiscard]] bool next_marker(PELOJ_SOURCE& source, uint8_t& code);

// Reads a segment's 16-bit length and gives the bytes that follow it; false below 2 or at the end.
[[nodiscard]] bool segment_length(PELOJ_SOURCE& source, uint32_t& remaining);

// True for the application, comment and table markers that a length follows; frames and scans, which it
// follows too, are each caller's own concern. Behind other codes the search for markers just goes on.
[[nodiscard]] bool has_segment(Marker code);

// Passes over a segment by its length.
[[nodiscard]] bool skip_segment(PELOJ_SOURCE& source);

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

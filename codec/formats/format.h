// What a picture format is to the rooms above it: how its files begin, what their heads tell, and the
// ways in which they are decoded. codec/decode/formats.cpp has a line for each; a further format is a
// folder and a line.
#pragma once

#include <cstdint>

#include "codec/base/checked.h"
#include "codec/base/errors.h"
#include "codec/base/geometry.h"
#include "codec/base/os_memory.h"
#include "codec/base/source.h"
#include "tavirpelo/parse.h"

namespace pelo {

constexpr uint32_t kSniffBytes = 8;  // what a format is recognised by

struct Format {
  // True for the first kSniffBytes bytes of its files; bytes behind a shorter source's end are zeros.
  bool (*sniff)(const uint8_t* head);

  // Reads the head behind sniff(), from a source at its start: the object's image size and what `hinfo`
  // (may be null) has of this format. The format's code, or 0 when the source is none after all.
  int (*parse)(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

  // Decodes the whole picture, of an animation its first image; 1 or 0.
  int (*decode)(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);

  int code, animatedCode;  // what parse() answers; animatedCode 0: the format has no animations
};

// Reads a head from the start of the object's source by `detect`, as TAVIRPELO_Parser does of any
// format's: sets imageFormat and the record's sizes.
using Detect = int (*)(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);
int parse_source(TAVIRPELO_DECINFO& decInfo, TAVIRPELO_HINFO* hinfo, Detect detect);

// ---- what the decoders share ----

// The state that a row-wise or frame-wise decode leaves in an object's pFormatInfo. Every such record
// begins with its kind, so that no decoder takes another's for its own.
enum class FormatKind : uint32_t { kPng = 0x504E4721, kGif = 0x47494621, kBmp = 0x424D5021 };

struct FormatState {
  FormatKind kind;
};

// The object's state when it is a T (a FormatState with a T::kKind), else null.
template <class T>
T* held_state(const TAVIRPELO_DECINFO& decInfo) {
  auto* state = static_cast<FormatState*>(decInfo.pFormatInfo);
  return state != nullptr && state->kind == T::kKind ? static_cast<T*>(state) : nullptr;
}

// Destroys the object's state when it is a T; false, with nothing touched, otherwise.
template <class T>
bool release_state(TAVIRPELO_DECINFO& decInfo) {
  T* state = held_state<T>(decInfo);
  if (state == nullptr) return false;
  OsDelete{}(state);
  decInfo.pFormatInfo = nullptr;
  return true;
}

// What a decode was started with; its later calls must ask for the same.
struct DecodeRequest {
  Size buffer;  // the caller's, pixels
  int format;
  uint32_t option;
  bool operator==(const DecodeRequest&) const = default;
};

inline DecodeRequest request_of(const TAVIRPELO_DECINFO& decInfo, int width, int height) {
  return {{width, height}, decInfo.outFormat, decInfo.option};
}

// Whether a decode can be asked for with these arguments.
inline bool usable(const TAVIRPELO_DECINFO* decInfo, const void* output, int width, int height,
                   const char* stage) {
  return (decInfo != nullptr && decInfo->pIO != nullptr && output != nullptr && width >= 0 &&
          height >= 0) ||
         refuse(Reason::kArgument, stage);
}

// Whether the object holds no state, or a State whose request is the same by same(state). A State of
// another request is released; another format's is left alone.
template <class State, class Same>
[[nodiscard]] bool may_go_on(TAVIRPELO_DECINFO& decInfo, const char* stage, Same same) {
  const State* held = held_state<State>(decInfo);
  if (decInfo.pFormatInfo == nullptr || (held != nullptr && same(*held))) return true;
  release_state<State>(decInfo);
  return refuse(Reason::kRequestChanged, stage);
}

// Releases what an earlier decode left. False when that is another format's.
template <class State>
[[nodiscard]] bool may_start(TAVIRPELO_DECINFO& decInfo, const char* stage) {
  release_state<State>(decInfo);
  return decInfo.pFormatInfo == nullptr || refuse(Reason::kRequestChanged, stage);
}

// Whether obtain() gets a block of so many bytes, or why not. It is not asked above the limit.
template <class Obtain>
[[nodiscard]] bool obtain_block(int64_t bytes, const char* stage, Obtain obtain) {
  if (bytes > kMaxPictureBlock) return refuse(Reason::kBlockLimit, stage);
  return obtain() || refuse(Reason::kNoMemory, stage);
}

// ---- what the parsers share ----

// Notes a picture's size and its number of images; gives back the format's code.
inline int found(TAVIRPELO_DECINFO& decInfo, TAVIRPELO_HINFO* hinfo, int code, uint32_t width,
                 uint32_t height) {
  decInfo.imageWidth = static_cast<int>(width);
  decInfo.imageHeight = static_cast<int>(height);
  if (hinfo != nullptr) hinfo->frameCount = 1;
  return code;
}

// A head that the source does not hold whole: 0.
inline int cut_head(const char* stage) {
  refuse(Reason::kTruncated, stage);
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_HEADER);
  return TAVIRPELO_FORMAT_UNKNOWN;
}

}  // namespace pelo

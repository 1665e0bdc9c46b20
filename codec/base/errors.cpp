#include "codec/base/errors.h"

#include <atomic>
#include <cstdio>

#include "tavirpelo/decinfo.h"

int gTAVIRPELO_Error = TAVIRPELO_ERROR_NONE;
int gTavirError = TAVIRPELO_ERROR_NONE;
int debug_PeloCodecError = 0;

namespace pelo {
namespace {

struct Failure {
  ErrorWord word;
  int code;
  Reason reason;
  const char* stage;
  const char* detail;
  int width, height;  // of a picture that is too large
};

constinit thread_local Failure lastFailure{};

// The words are plain integers for callers in C. Threads that fail at the same time overwrite each
// other's codes, but no store is torn.
int* address_of(ErrorWord word) {
  switch (word) {
    case ErrorWord::kDecoding:
      return &gTAVIRPELO_Error;
    case ErrorWord::kObject:
      return &gTavirError;
    case ErrorWord::kCodec:
      return &debug_PeloCodecError;
    default:
      return nullptr;
  }
}

// What a code of the decoding and object words says by itself.
Reason reason_of_decoding(int code) {
  switch (code) {
    case TAVIRPELO_ERROR_NONE:
      return Reason::kNone;
    case TAVIRPELO_ERROR_MEMORY:
      return Reason::kNoMemory;
    case TAVIRPELO_ERROR_HEADER:
      return Reason::kTruncated;
    case TAVIRPELO_ERROR_IO_KIND:
      return Reason::kSource;
    case TAVIRPELO_ERROR_EMPTY_MEMORY:
      return Reason::kEmpty;
    case TAVIRPELO_ERROR_OPEN:
      return Reason::kCannotOpen;
    case TAVIRPELO_ERROR_DECODE:
    case TAVIRPELO_ERROR_CROP:
      return Reason::kDamaged;
    default:
      return Reason::kArgument;
  }
}

Reason reason_of(ErrorWord word, int code) {
  if (word != ErrorWord::kCodec) return reason_of_decoding(code);
  return code == TAVIRPELO_CODEC_FORMAT ? Reason::kUnknownFormat : Reason::kArgument;
}

constexpr const char* kTexts[] = {
    "no error",
    "a missing argument, or one that makes no sense",
    "out of memory",
    "no such file",
    "permission denied",
    "not a regular file",
    "cannot be opened",
    "empty",
    "this kind of source is not read here",
    "not a picture in a known format",
    "a format that is not read",
    "more than 5000 pixels a side",
    "a side of 0 pixels",
    "a JPEG of four colour components (CMYK)",
    "a JPEG with arithmetic coding",
    "a JPEG of 12 bits a sample",
    "a lossless JPEG",
    "a variant of the format that is not read",
    "cut before its picture begins",
    "damaged data",
    "a row or canvas of more than 256 MiB",
    "cancelled",
    "the request differs from the one that the decode began with",
    "a pixel format that is not supported here",
    "cannot be written",
    "no space left",
};
constexpr int kTextCount = static_cast<int>(sizeof kTexts / sizeof *kTexts);
static_assert(kTextCount == TAVIRPELO_REASON_DISK_FULL + 1);

void describe(const Failure& failure, char* text, size_t size) {
  const char* general = TAVIRPELO_ErrorText(static_cast<int>(failure.reason));
  if (failure.reason == Reason::kTooLarge) {
    std::snprintf(text, size, "%dx%d, %s", failure.width, failure.height, general);
  } else if (failure.reason == Reason::kForeignFormat && failure.detail != nullptr) {
    std::snprintf(text, size, "%s, which is not read", failure.detail);
  } else if (failure.detail != nullptr) {
    std::snprintf(text, size, "%s: %s", general, failure.detail);
  } else {
    std::snprintf(text, size, "%s", general);
  }
}

}  // namespace

void begin_operation() {
  lastFailure = {};
}

void record_error(ErrorWord word, int code) {
  std::atomic_ref<int>(*address_of(word)).store(code, std::memory_order_relaxed);
  // A raw image of another format than asked for is told by the word alone.
  if (code == TAVIRPELO_ERROR_NONE || (word == ErrorWord::kCodec && code == TAVIRPELO_CODEC_RAW_FORMAT))
    return;
  lastFailure.word = word;
  lastFailure.code = code;
  if (lastFailure.reason == Reason::kNone) lastFailure.reason = reason_of(word, code);
}

int error_code(ErrorWord word) {
  return std::atomic_ref<int>(*address_of(word)).load(std::memory_order_relaxed);
}

bool refuse(Reason reason, const char* stage, const char* detail) {
  if (lastFailure.reason != Reason::kNone) return false;
  lastFailure.reason = reason;
  lastFailure.stage = stage;
  lastFailure.detail = detail;
  return false;
}

bool refuse_size(const char* stage, int width, int height) {
  if (lastFailure.reason != Reason::kNone) return false;
  lastFailure.width = width;
  lastFailure.height = height;
  return refuse(Reason::kTooLarge, stage);
}

Reason noted_reason() {
  return lastFailure.reason;
}

}  // namespace pelo

using namespace pelo;

int TAVIRPELO_LastError(TAVIRPELO_ERROR* out) {
  const Failure& failure = lastFailure;
  const bool failed = failure.reason != Reason::kNone;
  if (out == nullptr) return failed;
  *out = {};
  out->stage = failure.stage != nullptr ? failure.stage : "";
  if (!failed) return 0;
  out->word = static_cast<int>(failure.word);
  out->code = failure.code;
  out->reason = static_cast<int>(failure.reason);
  describe(failure, out->text, sizeof out->text);
  return 1;
}

const char* TAVIRPELO_ErrorText(int reason) {
  return reason < 0 || reason >= kTextCount ? "unknown error" : kTexts[reason];
}

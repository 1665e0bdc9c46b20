// The one place where failures are recorded: the process-wide words that the interface promises, and the
// calling thread's own account of why its operation failed.
//
// The innermost function that knows the reason calls refuse(); what it learned stays, so that the
// functions around it need not pass it on. The function that answers to the caller writes the word.
#pragma once

#include "tavirpelo/error.h"

namespace pelo {

enum class ErrorWord {
  kNone = TAVIRPELO_WORD_NONE,
  kDecoding = TAVIRPELO_WORD_DECODING,
  kObject = TAVIRPELO_WORD_OBJECT,
  kCodec = TAVIRPELO_WORD_CODEC,
};

enum class Reason {
  kNone = TAVIRPELO_REASON_NONE,
  kArgument = TAVIRPELO_REASON_ARGUMENT,
  kNoMemory = TAVIRPELO_REASON_NO_MEMORY,
  kNotFound = TAVIRPELO_REASON_NOT_FOUND,
  kPermission = TAVIRPELO_REASON_PERMISSION,
  kNotAFile = TAVIRPELO_REASON_NOT_A_FILE,
  kCannotOpen = TAVIRPELO_REASON_CANNOT_OPEN,
  kEmpty = TAVIRPELO_REASON_EMPTY,
  kSource = TAVIRPELO_REASON_SOURCE,
  kUnknownFormat = TAVIRPELO_REASON_UNKNOWN_FORMAT,
  kForeignFormat = TAVIRPELO_REASON_FOREIGN_FORMAT,
  kTooLarge = TAVIRPELO_REASON_TOO_LARGE,
  kZeroSize = TAVIRPELO_REASON_ZERO_SIZE,
  kCmyk = TAVIRPELO_REASON_CMYK,
  kArithmetic = TAVIRPELO_REASON_ARITHMETIC,
  kTwelveBit = TAVIRPELO_REASON_TWELVE_BIT,
  kLossless = TAVIRPELO_REASON_LOSSLESS,
  kVariant = TAVIRPELO_REASON_VARIANT,
  kTruncated = TAVIRPELO_REASON_TRUNCATED,
  kDamaged = TAVIRPELO_REASON_DAMAGED,
  kBlockLimit = TAVIRPELO_REASON_BLOCK_LIMIT,
  kCancelled = TAVIRPELO_REASON_CANCELLED,
  kRequestChanged = TAVIRPELO_REASON_REQUEST_CHANGED,
  kOutputFormat = TAVIRPELO_REASON_OUTPUT_FORMAT,
  kNotWritable = TAVIRPELO_REASON_NOT_WRITABLE,
  kDiskFull = TAVIRPELO_REASON_DISK_FULL,
};

// Forgets the calling thread's failure; each public operation starts with it.
void begin_operation();

// Writes a word, and notes word and code for the calling thread. Without a reason so far the code's own
// stands in. TAVIRPELO_ERROR_NONE clears the word.
void record_error(ErrorWord word, int code);

// What a word holds, as any thread last left it.
int error_code(ErrorWord word);

// Notes why an operation fails, unless something deeper has: `stage` is what was being done ("PNG
// header"), `detail` what the sentence ends with; both are literals. Always false.
bool refuse(Reason reason, const char* stage, const char* detail = nullptr);

// The same for a picture whose sides exceed the limit.
bool refuse_size(const char* stage, int width, int height);

// The reason noted since the operation began.
Reason noted_reason();

}  // namespace pelo

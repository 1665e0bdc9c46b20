// Coding rows of MCUs in the order of the output, or column by column into a stream for each output row.
#pragma once

#include "codec/formats/jpeg/transform/coding_parameters.h"

namespace pelo::jpeg {

// The bytes of one output row while its columns arrive.
struct ColumnStream {
  ELO_DESTINATION destination;
  EntropyCoderState entropy;
};

// One stream for each row of MCUs of the output.
class ColumnEncoder {
 public:
  ColumnEncoder() = default;
  ColumnEncoder(const ColumnEncoder&) = delete;
  ColumnEncoder& operator=(const ColumnEncoder&) = delete;
  ~ColumnEncoder() { release(); }

  OsBuffer<ColumnStream> streams;
  ELO_ENCODER* encoder = nullptr;
  int column = 0;  // pixels of the output that the columns so far cover

  void release() {
    for (size_t i = 0; i < streams.size(); ++i) discard(streams[i].destination);
    streams.reset();
  }
};

// Codes the MCUs of the next output row, one after another. 1 or 0.
int code_stream(ELO_ENCODER* encoder, const pelo::jpeg::CoefficientBlock* row);

// Makes the streams. 1, or 0 when memory is short.
int begin_column(pelo::jpeg::ColumnEncoder* columns, ELO_ENCODER* encoder, int sourceSize);

// Codes the next column: one MCU for each stream, from the upper row down. 1 or 0.
int code_column(pelo::jpeg::ColumnEncoder* columns, const pelo::jpeg::CoefficientBlock* column);

// Completes every stream and joins them behind the headers, with restart markers between. 1 or 0.
int finish_column(pelo::jpeg::ColumnEncoder* columns);

}  // namespace pelo::jpeg

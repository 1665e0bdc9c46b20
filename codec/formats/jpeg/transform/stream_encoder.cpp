#include "codec/formats/jpeg/transform/stream_encoder.h"

#include <algorithm>
#include <climits>
#include <utility>

#include "codec/base/os.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {
namespace {

// Lends the encoder a stream's destination and bits.
class UseStream {
 public:
  UseStream(ELO_ENCODER& encoder, ColumnStream& stream) : encoder_(encoder), stream_(stream) {
    exchange();
  }
  ~UseStream() { exchange(); }
  UseStream(const UseStream&) = delete;
  UseStream& operator=(const UseStream&) = delete;

 private:
  void exchange() {
    if (lent_) {
      encoder_.destination = own_;
    } else {
      own_ = std::exchange(encoder_.destination, &stream_.destination);
    }
    lent_ = !lent_;
    std::swap(encoder_.entropy, stream_.entropy);
  }

  ELO_ENCODER& encoder_;
  ColumnStream& stream_;
  ELO_DESTINATION* own_ = nullptr;
  bool lent_ = false;
};

// A share of the source's bytes and a quarter more, or a step when that is less than an MCU may take.
int first_capacity(const ELO_ENCODER& encoder, int sourceSize) {
  const int64_t share = int64_t{sourceSize} * 10 / 8 / encoder.mcusDown;
  return share < 128 * encoder.mcuBlocks ? kDestinationStep
                                         : static_cast<int>(std::min<int64_t>(share, INT_MAX));
}

// Room for everything that will be joined, in one go.
bool reserve(ELO_DESTINATION& destination, int64_t bytes) {
  const int64_t missing = destination.used + bytes - destination.capacity;
  if (destination.kind != ELO_TO_MEMORY || missing <= 0) return true;
  if (missing > INT_MAX) return false;
  uint8_t* grown = grow_block(destination.buffer, destination.capacity, static_cast<int>(missing));
  if (grown == nullptr) return false;
  destination.buffer = grown;
  destination.capacity += static_cast<int>(missing);
  return true;
}

}  // namespace

int code_stream(ELO_ENCODER* encoder, const CoefficientBlock* row) {
  for (int mcu = 0; mcu < encoder->mcusAcross; ++mcu, row += encoder->mcuBlocks) {
    if (!code_mcu(encoder, row)) return 0;
  }
  encoder->row += encoder->mcu_height();
  return 1;
}

int begin_column(ColumnEncoder* columns, ELO_ENCODER* encoder, int sourceSize) {
  columns->encoder = encoder;
  columns->column = 0;
  if (!columns->streams.allocate(static_cast<size_t>(encoder->mcusDown))) return 0;
  const int capacity = first_capacity(*encoder, sourceSize);
  for (size_t i = 0; i < columns->streams.size(); ++i) {
    ELO_DESTINATION& destination = columns->streams[i].destination;
    destination.kind = ELO_TO_MEMORY;
    destination.buffer = static_cast<uint8_t*>(os_malloc(static_cast<size_t>(capacity)));
    if (destination.buffer == nullptr) return 0;
    destination.capacity = capacity;
  }
  return 1;
}

int code_column(ColumnEncoder* columns, const CoefficientBlock* column) {
  ELO_ENCODER& encoder = *columns->encoder;
  for (size_t i = 0; i < columns->streams.size(); ++i, column += encoder.mcuBlocks) {
    const UseStream use(encoder, columns->streams[i]);
    if (!code_mcu(&encoder, column)) return 0;
  }
  columns->column += encoder.mcu_width();
  return 1;
}

int finish_column(ColumnEncoder* columns) {
  if (columns->encoder == nullptr) return 1;
  ELO_ENCODER& encoder = *columns->encoder;
  int64_t total = 0;
  for (size_t i = 0; i < columns->streams.size(); ++i) {
    const UseStream use(encoder, columns->streams[i]);
    if (!flush_bits(&encoder)) return 0;
    total += columns->streams[i].destination.used + 2;
  }
  if (!reserve(*encoder.destination, total + 2)) return 0;
  for (size_t i = 0; i < columns->streams.size(); ++i) {
    ELO_DESTINATION& stream = columns->streams[i].destination;
    const uint8_t marker[2] = {0xFF, restart_code(static_cast<int>(i + 7))};
    if (i != 0 && !append(*encoder.destination, marker, sizeof marker)) return 0;
    if (!append(*encoder.destination, stream.buffer, static_cast<size_t>(stream.used))) return 0;
    discard(stream);
  }
  columns->release();
  return 1;
}

}  // namespace pelo::jpeg

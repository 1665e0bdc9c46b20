// The bit reader where it meets what is no data: windows, stuffing, markers, restarts, the end.
#include "codec/formats/jpeg/decoder/bit_reader.h"

#include "codec/formats/jpeg/decoder/jd_info.h"
#include "codec/formats/jpeg/decoder/mcu_decode.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {
namespace {

// The next source byte, reading another block when the window is used up; -1 when there is none.
int next_byte(BitReader& reader) {
  if (reader.next == reader.end) {
    PELOJ_SOURCE& source = *reader.source;
    source.pos = source.avail = 0;
    if (!source.refill(kSourceBufferSize)) return -1;
    reader.next = source.next();
    reader.end = reader.plainEnd = reader.next + source.avail;
  }
  return *reader.next++;
}

// The next data byte without its stuffing; -1 at a marker, which becomes the unread one, or at the end.
int next_data_byte(BitReader& reader) {
  int code = next_byte(reader);
  if (code >= 0 && code != 0xFF) return code;
  while (code == 0xFF) code = next_byte(reader);
  if (code == 0) return 0xFF;
  if (code > 0) {
    reader.entropy->unreadMarker = static_cast<uint8_t>(code);
  } else {
    meet_end(*reader.entropy);
  }
  return -1;
}

// Zeros behind the data, counted as invented. One less than fit in: the shift stays below the width even
// when nothing is held.
void pad(BitState& state) {
  const int zeros = kBitBufferSize - 1 - state.left;
  state.bits <<= zeros;
  state.left += zeros;
  state.invented += zeros;
}

// Searches a code bit by bit from a given length on (T.81 F.16).
uint32_t match_code(BitReader& reader, const DerivedTable& table, int length) {
  while (length <= kMaxCodeLength &&
         static_cast<int32_t>(reader.peek(length)) > table.maxcode[static_cast<size_t>(length)]) {
    ++length;
  }
  // A corrupt code is noticed when one bit more than the longest code is gone.
  const auto code = static_cast<int32_t>(reader.take(length));
  if (length > kMaxCodeLength) return 0;
  const int32_t index = code + table.valoffset[static_cast<size_t>(length)];
  return table.raw->symbols[static_cast<size_t>(index) & 255];
}

// Reads up to the next marker, which becomes the unread one. False at the end of the source.
bool scan_for_marker(PELOJ_SOURCE& source, Entropy& entropy, MarkerRecord& marker) {
  while (source.need(1)) {
    if (*source.take(1) != 0xFF) {
      marker.discardedBytes++;
      continue;
    }
    uint8_t code;
    do {
      if (!source.need(1)) return false;
      code = *source.take(1);
    } while (code == 0xFF);
    if (code != 0) {
      entropy.unreadMarker = code;
      return true;
    }
    marker.discardedBytes += 2;
  }
  return false;
}

}  // namespace

void meet_end(Entropy& entropy) {
  if (entropy.endIsMarker) entropy.unreadMarker = static_cast<uint8_t>(Marker::kEoi);
}

BitReader fill_by_bytes(BitReader reader) {
  BitState& state = reader.state;
  while (state.left <= kBitBufferSize - 8) {
    const int byte = reader.entropy->unreadMarker == 0 ? next_data_byte(reader) : -1;
    if (byte < 0) {
      reader.plainEnd = reader.next;
      pad(state);
      break;
    }
    state.bits = state.bits << 8 | static_cast<BitBuffer>(byte);
    state.left += 8;
  }
  return reader;
}

uint32_t decode_long_code(BitReader& reader, const DerivedTable& table) {
  reader.fill();
  return match_code(reader, table, kLookBits + 1);
}

BitReader open_bits(PELOJ_SOURCE& source, Entropy& entropy) {
  const uint8_t* next = source.buffer + source.pos;
  const uint8_t* end = next + source.avail;
  const uint8_t* plainEnd = entropy.unreadMarker == 0 ? end : next;
  return {entropy.state->bits, next, end, plainEnd, &source, &entropy};
}

void close_bits(const BitReader& reader) {
  reader.entropy->state->bits = reader.state;
  reader.source->pos = static_cast<uint32_t>(reader.next - reader.source->buffer);
  reader.source->avail = static_cast<uint32_t>(reader.end - reader.next);
}

int refill_bits(BitReader* reader, BitBuffer buffer, int bitsLeft, int needed) {
  reader->state.bits = buffer;
  reader->state.left = bitsLeft;
  *reader = fill_by_bytes(*reader);
  const int real = reader->state.left - reader->state.invented;
  if (real >= needed) return 1;
  return reader->entropy->unreadMarker != 0 ? 1 : 0;
}

int decode_code(BitReader* reader, BitBuffer buffer, int bitsLeft, const DerivedTable* derived,
                int minBits) {
  reader->state.bits = buffer;
  reader->state.left = bitsLeft;
  if (bitsLeft <= kMaxCodeLength && !refill_bits(reader, buffer, bitsLeft, minBits)) return -1;
  return static_cast<int>(match_code(*reader, *derived, minBits < 1 ? 1 : minBits));
}

bool process_restart(PELOJ_SOURCE& source, Entropy& entropy, MarkerRecord& marker, int interval) {
  EntropyState& state = *entropy.state;
  const int real = state.bits.left - state.bits.invented;
  if (real > 0) marker.discardedBytes += real / 8;
  state.bits = {};

  if (entropy.unreadMarker == 0 && !scan_for_marker(source, entropy, marker)) {
    meet_end(entropy);
    if (entropy.unreadMarker == 0) return false;
  }
  if (entropy.unreadMarker == restart_code(marker.nextRestart)) entropy.unreadMarker = 0;
  marker.nextRestart = (marker.nextRestart + 1) & 7;
  state.lastDc = {};
  entropy.eobRun = 0;
  state.restartsToGo = static_cast<uint32_t>(interval);
  if (entropy.unreadMarker == 0) state.insufficient = 0;
  return true;
}

}  // namespace pelo::jpeg

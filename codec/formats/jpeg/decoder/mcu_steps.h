// Steps that the sequential and the progressive MCU decoders share.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"
#include "codec/formats/jpeg/decoder/mcu_decode.h"

namespace pelo::jpeg {

// Extra bits behind a code: the reader may need another fill where the buffer is narrow.
inline uint32_t take_extra(BitReader& reader, int size) {
  if constexpr (kBitBufferSize < 64) reader.fill();
  return reader.take(size);
}

// The DC difference of a block (T.81 F.2.2.1); a corrupt code counts as none.
inline int32_t decode_dc(BitReader& reader, const DerivedTable& table, uint32_t& predictor) {
  reader.fill();
  const int size = static_cast<int>(decode_symbol(reader, table));
  if (size != 0) predictor += static_cast<uint32_t>(extend(take_extra(reader, size), size));
  return static_cast<int32_t>(predictor);
}

// True when the MCU is to be decoded; otherwise `result` answers for it.
inline bool begin_mcu(PELOJ_JDINFO& jd, int& result) {
  EntropyState& entropy = *jd.entropy.state;
  if (jd.scan.restartInterval != 0 && entropy.restartsToGo == 0 &&
      !process_restart(*jd.source, jd.entropy, *jd.marker, jd.scan.restartInterval)) {
    result = 0;
    return false;
  }
  if (!entropy.insufficient) return true;
  --entropy.restartsToGo;
  result = 1;
  return false;
}

// Gives the window back and looks once at what the reader had to invent.
inline int end_mcu(const BitReader& reader) {
  close_bits(reader);
  Entropy& entropy = *reader.entropy;
  --entropy.state->restartsToGo;
  if (reader.state.left >= reader.state.invented) return 1;
  if (entropy.unreadMarker == 0) return 0;  // the source ended
  entropy.state->insufficient = 1;
  return 1;
}

}  // namespace pelo::jpeg

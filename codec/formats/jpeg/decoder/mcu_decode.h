// Huffman decoding of one MCU. Sequential members, one per decode scale, keep only the coefficients that
// its inverse transform reads; progressive ones add a scan's bits to what is there. Below them the steps
// that all share.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// Each decodes one MCU into `blocks` (64 coefficients a block, natural order, zeroed by the caller, not
// dequantised) and records every block's last non-zero zig-zag position. 1, or 0 when the source failed.
// A corrupt code ends its block only; behind a marker MCUs stay as they are.
int decode_mcu_full(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);           // all positions
int decode_mcu_requantised(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);    // requantising
int decode_mcu_half(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);           // below 19
int decode_mcu_three_eighths(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);  // below 9
int decode_mcu_quarter(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);        // below 5
int decode_mcu_dc(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);             // DC alone

// Synchronises with the next RSTn (T.81 F.2.2.4): drops the bits held, looks for a marker unless one is
// pending, resets the predictors. A marker with another number stays pending. `interval`: MCUs up to the
// next one. False at the end of the source.
[[nodiscard]] bool process_restart(PELOJ_SOURCE& source, Entropy& entropy, MarkerRecord& marker,
                                   int interval);

// First pass and refinement of progressive scans (T.81 G.1.2); 1, or 0 when the source failed.
int decode_mcu_first(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);
int decode_mcu_refine(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);

// The shared steps.

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

// Huffman decoding of progressive scans (ITU-T T.81 G.1.2, G.2).
#include "codec/formats/jpeg/decoder/mcu_decode.h"

namespace pelo::jpeg {
namespace {

int32_t shifted(int32_t value, int al) {
  return static_cast<int32_t>(static_cast<uint32_t>(value) << al);
}

// The blocks that an end-of-band code with run category r covers, this one included.
uint32_t eob_run(BitReader& reader, int r) {
  const uint32_t run = 1u << r;
  return r == 0 ? run : run + take_extra(reader, r);
}

void decode_dc_first(const Scan& scan, EntropyState& state, BitReader& reader, int32_t* const* blocks) {
  for (size_t i = 0; i < static_cast<size_t>(scan.mcuBlocks); ++i) {
    const int32_t dc = decode_dc(reader, *state.blockDc[i], state.lastDc[scan.blockComponent[i]]);
    blocks[i][0] = shifted(dc, scan.al);
  }
}

void decode_ac_first(const Scan& scan, Entropy& entropy, BitReader& reader, int32_t* block) {
  if (entropy.eobRun > 0) {
    --entropy.eobRun;
    return;
  }
  const DerivedTable& table = *entropy.state->blockAc[0];
  for (int k = scan.ss; k <= scan.se;) {
    reader.fill();
    const int32_t direct = table.coefficient[reader.peek(kLookBits)];
    if (direct != 0) [[likely]] {
      reader.drop(direct & 0xFF);
      k += direct >> 8 & 0xFF;
      block[PELOJ_NATURAL_ORDER[k++]] = shifted(direct >> 16, scan.al);
      continue;
    }
    const uint32_t symbol = decode_symbol(reader, table);
    const int size = static_cast<int>(symbol & 15);
    const int run = static_cast<int>(symbol >> 4);
    if (size != 0) {
      k += run;
      block[PELOJ_NATURAL_ORDER[k++]] = shifted(extend(take_extra(reader, size), size), scan.al);
    } else if (run == 15) {
      k += 16;
    } else {
      entropy.eobRun = eob_run(reader, run) - 1;
      return;
    }
  }
}

// One correction bit for a coefficient that is not zero yet lacks this bit.
void refine(BitReader& reader, int32_t& coefficient, int32_t bit) {
  reader.fill();
  if (reader.take(1) == 0 || (coefficient & bit) != 0) return;
  coefficient += coefficient >= 0 ? bit : -bit;
}

// Passes `zeros` coefficients without history and corrects those with; the position of the next one
// without, or one past the band.
int refine_run(const Scan& scan, BitReader& reader, int32_t* block, int k, int zeros) {
  for (; k <= scan.se; ++k) {
    int32_t& coefficient = block[PELOJ_NATURAL_ORDER[k]];
    if (coefficient != 0) {
      refine(reader, coefficient, 1 << scan.al);
    } else if (--zeros < 0) {
      break;
    }
  }
  return k;
}

void decode_ac_refine(const Scan& scan, Entropy& entropy, BitReader& reader, int32_t* block) {
  const DerivedTable& table = *entropy.state->blockAc[0];
  int k = scan.ss;
  for (; entropy.eobRun == 0 && k <= scan.se; ++k) {
    reader.fill();
    const uint32_t symbol = decode_symbol(reader, table);
    const int run = static_cast<int>(symbol >> 4);
    int32_t value = 0;
    if ((symbol & 15) != 0) {  // a new coefficient; its size can only be 1
      value = take_extra(reader, 1) != 0 ? 1 << scan.al : -(1 << scan.al);
    } else if (run != 15) {
      entropy.eobRun = eob_run(reader, run);
      break;
    }
    k = refine_run(scan, reader, block, k, run);
    if (value != 0 && k <= scan.se) block[PELOJ_NATURAL_ORDER[k]] = value;
  }
  if (entropy.eobRun == 0) return;
  refine_run(scan, reader, block, k, 64);
  --entropy.eobRun;
}

void decode_dc_refine(const Scan& scan, BitReader& reader, int32_t* const* blocks) {
  for (size_t i = 0; i < static_cast<size_t>(scan.mcuBlocks); ++i) {
    reader.fill();
    if (reader.take(1) != 0) blocks[i][0] |= 1 << scan.al;
  }
}

}  // namespace

int decode_mcu_first(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  int result;
  if (!begin_mcu(*jdInfo, result)) return result;
  BitReader reader = open_bits(*jdInfo->source, jdInfo->entropy);
  if (jdInfo->scan.ss == 0) {
    decode_dc_first(jdInfo->scan, *jdInfo->entropy.state, reader, blocks);
  } else {
    decode_ac_first(jdInfo->scan, jdInfo->entropy, reader, blocks[0]);
  }
  return end_mcu(reader);
}

int decode_mcu_refine(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  int result;
  if (!begin_mcu(*jdInfo, result)) return result;
  BitReader reader = open_bits(*jdInfo->source, jdInfo->entropy);
  if (jdInfo->scan.ss == 0) {
    decode_dc_refine(jdInfo->scan, reader, blocks);
  } else {
    decode_ac_refine(jdInfo->scan, jdInfo->entropy, reader, blocks[0]);
  }
  return end_mcu(reader);
}

}  // namespace pelo::jpeg

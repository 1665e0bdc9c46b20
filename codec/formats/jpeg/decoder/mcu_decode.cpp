#include "codec/formats/jpeg/decoder/mcu_decode.h"

#include "codec/formats/jpeg/decoder/scans.h"

namespace pelo::jpeg {
namespace {

// What a member keeps: AC coefficients at zig-zag positions below kLimit; the rest of a block is
// skipped. kRequantise brings values to the reference steps.
template <int Limit, bool Requantise = false>
struct Keep {
  static constexpr int kLimit = Limit;
  static constexpr bool kWhole = Limit == 64;
  static constexpr bool kRequantise = Requantise;
};

// One block's view of the MCU.
struct BlockContext {
  const DerivedTable& ac;
  const SkipTable* skip;
  const int32_t* correction;  // zig-zag order; requantising members only
  int end;                    // last position of the scan's band
};

// Stores a coefficient unless its position lies past what the member reads.
template <class Member>
inline void store(const BlockContext& context, int32_t* block, int k, int32_t value, int& last) {
  if constexpr (Member::kRequantise) {
    if (k > 63) return;
    value = static_cast<int32_t>(int64_t{value} * context.correction[k] / 8192);
    if (value == 0) return;
  } else if constexpr (!Member::kWhole) {
    if (k >= Member::kLimit) return;
  }
  block[PELOJ_NATURAL_ORDER[k]] = value;
  last = k;
}

// Decodes coefficients from position k on while it is below the member's limit. Returns the next
// position, or 64 when the block has ended.
template <class Member>
inline int decode_kept(BitReader& reader, const BlockContext& context, int32_t* block, int k,
                       int& last) {
  const int end = Member::kWhole ? context.end + 1 : Member::kLimit;
  while (k < end) {
    reader.fill();
    const uint32_t bits = reader.peek(kLookBits);
    const int32_t direct = context.ac.coefficient[bits];
    if (direct != 0) [[likely]] {
      reader.drop(direct & 0xFF);
      k += direct >> 8 & 0xFF;
      store<Member>(context, block, k, direct >> 16, last);
      ++k;
      continue;
    }
    const uint32_t symbol = decode_symbol(reader, context.ac);
    const int size = static_cast<int>(symbol & 15);
    const int run = static_cast<int>(symbol >> 4);
    if (size == 0) {
      if (run != 15) return 64;  // end of block
      k += 16;
      continue;
    }
    k += run;
    store<Member>(context, block, k, extend(take_extra(reader, size), size), last);
    ++k;
  }
  return k;
}

// Passes one code; true at the end of the block.
inline bool skip_code(BitReader& reader, const DerivedTable& ac, int& position) {
  const uint32_t symbol = decode_symbol(reader, ac);
  const int size = static_cast<int>(symbol & 15);
  const int run = static_cast<int>(symbol >> 4);
  if (size == 0 && run != 15) return true;
  position += run + 1;
  if (size != 0) take_extra(reader, size);
  return position >= 63;
}

// Passes the rest of a block; `position` is the last one handled. Several codes go at a time as long as
// they cannot belong to the next block: an entry that would overshoot is not taken.
inline void skip_rest(BitReader& reader, const BlockContext& context, int position) {
  while (position < 63) {
    reader.fill();
    if (context.skip != nullptr) {
      const uint32_t entry = (*context.skip)[reader.peek(kSkipBits)];
      const int next = position + skip_advance(entry);
      const int used = static_cast<int>(skip_used(entry));
      const bool ends = (entry & kSkipEndOfBlock) != 0;
      // Extra bits beyond a narrow buffer's content: one code at a time.
      const bool held = kFilledBits >= kSkipBits + kMaxExtraBits || used <= reader.state.left;
      if (used != 0 && held && next <= (ends ? 62 : 63)) [[likely]] {
        reader.drop(used);
        if (ends) return;
        position = next;
        continue;
      }
    }
    if (skip_code(reader, context.ac, position)) return;
  }
}

template <class Member>
int decode_mcu(PELOJ_JDINFO& jd, int32_t* const* blocks) {
  int result;
  if (!begin_mcu(jd, result)) return result;
  EntropyState& entropy = *jd.entropy.state;
  BitReader reader = open_bits(*jd.source, jd.entropy);
  for (size_t i = 0; i < static_cast<size_t>(jd.scan.mcuBlocks); ++i) {
    const size_t scanIndex = jd.scan.blockComponent[i];
    const int32_t dc = decode_dc(reader, *entropy.blockDc[i], entropy.lastDc[scanIndex]);
    blocks[i][0] = static_cast<int32_t>(static_cast<uint32_t>(dc) << jd.scan.al);

    BlockContext context{*entropy.blockAc[i], entropy.blockSkip[i], nullptr, jd.scan.se};
    if constexpr (Member::kRequantise) {
      context.correction = quant_table(jd.tables, *jd.scan.components[scanIndex])->correction.data();
    }
    int last = 0;
    int k = jd.scan.ss + 1;
    if constexpr (Member::kLimit > 1) {
      k = decode_kept<Member>(reader, context, blocks[i], k, last);
    }
    if constexpr (!Member::kWhole) skip_rest(reader, context, k - 1);
    jd.entropy.lastPosition[i] = static_cast<uint8_t>(last < 63 ? last : 63);
  }
  return end_mcu(reader);
}

}  // namespace
int decode_mcu_full(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return decode_mcu<Keep<64>>(*jdInfo, blocks);
}
int decode_mcu_requantised(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return decode_mcu<Keep<64, true>>(*jdInfo, blocks);
}
int decode_mcu_half(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return decode_mcu<Keep<19>>(*jdInfo, blocks);
}
int decode_mcu_three_eighths(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return decode_mcu<Keep<9>>(*jdInfo, blocks);
}
int decode_mcu_quarter(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return decode_mcu<Keep<5>>(*jdInfo, blocks);
}
int decode_mcu_dc(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return decode_mcu<Keep<1>>(*jdInfo, blocks);
}

}  // namespace pelo::jpeg

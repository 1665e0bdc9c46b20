#include "codec/formats/jpeg/decoder/huffman.h"

#include "codec/base/errors.h"
#include "codec/formats/jpeg/decoder/jd_info.h"
#include "codec/formats/jpeg/header_scan.h"

namespace pelo::jpeg {
namespace {

// Code lengths and codes in symbol order (T.81 C.1, C.2), and the search tables of F.15. False for more
// than 256 codes or a code that does not fit its length.
bool derive_codes(const HuffmanSpec& raw, DerivedTable& table) {
  uint32_t code = 0;
  int index = 0;
  for (size_t length = 1; length <= kMaxCodeLength; ++length) {
    const int count = raw.counts[length];
    if (index + count > 256) return false;
    table.maxcode[length] = -1;
    if (count > 0) {
      table.valoffset[length] = index - static_cast<int32_t>(code);
      code += static_cast<uint32_t>(count);
      if (code > 1u << length) return false;
      table.maxcode[length] = static_cast<int32_t>(code) - 1;
      index += count;
    }
    code <<= 1;
  }
  table.maxcode[kMaxCodeLength + 1] = 0xFFFFF;
  return true;
}

// Spreads each short code over all values that begin with it.
void fill_lookup(const HuffmanSpec& raw, DerivedTable& table) {
  uint32_t first = 0;
  size_t symbol = 0;
  for (uint32_t length = 1; length <= kLookBits; ++length) {
    for (int i = 0; i < raw.counts[length]; ++i, ++symbol) {
      const uint32_t span = 1u << (kLookBits - length);
      for (uint32_t v = 0; v < span && first < kLookSize; ++v) {
        table.lookup[first++] = static_cast<uint16_t>(length << 8 | raw.symbols[symbol]);
      }
    }
  }
}

// Codes whose extra bits fit behind them decode to run and value in one step.
void fill_coefficients(DerivedTable& table) {
  for (uint32_t v = 0; v < kLookSize; ++v) {
    const uint32_t length = table.lookup[v] >> 8;
    const uint32_t size = table.lookup[v] & 15;
    const uint32_t run = table.lookup[v] >> 4 & 15;
    if (length == 0 || size == 0 || length + size > kLookBits) continue;
    const uint32_t extra = v >> (kLookBits - length - size) & ((1u << size) - 1);
    const int32_t value = extend(extra, static_cast<int>(size));
    table.coefficient[v] = value * 65536 + static_cast<int32_t>(run << 8 | (length + size));
  }
}

// The AC codes that complete within kSkipBits bits, from the first on.
uint32_t skip_entry(const DerivedTable& table, uint32_t v) {
  uint32_t used = 0;
  uint32_t advance = 0;
  while (used < kSkipBits && advance < 64) {
    const uint32_t code = table.lookup[(v << used & (kSkipSize - 1)) >> (kSkipBits - kLookBits)];
    const uint32_t length = code >> 8;
    if (length == 0 || used + length > kSkipBits) break;
    const uint32_t size = code & 15;
    const uint32_t run = code >> 4 & 15;
    used += length;
    if (size == 0 && run != 15) return kSkipEndOfBlock | advance << 16 | used;
    used += size;
    advance += run + 1;  // a run of sixteen zeros (ZRL) too
  }
  return advance << 16 | used;
}

bool build_skip_table(DerivedTable& table) {
  table.skip = os_new<SkipTable>();
  if (!table.skip) return false;
  for (uint32_t v = 0; v < kSkipSize; ++v) (*table.skip)[v] = skip_entry(table, v);
  return true;
}

int no_memory() {
  refuse(Reason::kNoMemory, "JPEG Huffman tables");
  return PELOJ_FAIL;
}

}  // namespace

int derive_table(Tables& tables, bool isDc, int tableNumber, EntropyState* skipping,
                 const DerivedTable** derivedOut) {
  if (tableNumber < 0 || tableNumber > 3) return PELOJ_FAIL;
  const auto number = static_cast<size_t>(tableNumber);
  const HuffmanSpec* raw = isDc ? tables.dcRaw[number] : tables.acRaw[number];
  if (raw == nullptr || tables.derivedCount >= kTablePoolSize) return PELOJ_FAIL;
  auto table = os_new<DerivedTable>();
  if (!table) return no_memory();

  table->raw = raw;
  if (!derive_codes(*raw, *table)) return 0;
  fill_lookup(*raw, *table);
  if (isDc) {
    int symbols = 0;
    for (const uint8_t count : raw->counts) symbols += count;
    for (int i = 0; i < symbols; ++i) {
      if (raw->symbols[static_cast<size_t>(i)] > 15) return 0;
    }
  } else {
    fill_coefficients(*table);
    if (skipping != nullptr) {
      if (!build_skip_table(*table)) return no_memory();
      skipping->skip[number] = table->skip.get();
    }
  }
  *derivedOut = table.get();
  tables.derivedPool[tables.derivedCount++] = std::move(table);
  return PELOJ_OK;
}

}  // namespace pelo::jpeg

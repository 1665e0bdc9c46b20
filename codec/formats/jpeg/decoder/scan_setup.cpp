// Preparing a scan, and the requantisation of very finely quantised pictures.
#include <algorithm>

#include "codec/base/errors.h"
#include "codec/formats/jpeg/decoder/scans.h"
#include "codec/formats/jpeg/header_scan.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

int no_memory(const char* text) {
  refuse(Reason::kNoMemory, "JPEG scan");
  log_error(text);
  return PELOJ_FAIL;
}
int fail(const char* text) {
  log_error(text);
  return PELOJ_FAIL;
}

// Reserves the component's blocks in the MCU; false when an MCU would have more than ten.
bool add_blocks(Scan& scan, int scanIndex, const Component& component) {
  if (scan.mcuBlocks + component.mcuBlocks > kMaxMcuBlocks) return false;
  for (int i = 0; i < component.mcuBlocks; ++i) {
    scan.blockComponent[static_cast<size_t>(scan.mcuBlocks++)] = static_cast<uint8_t>(scanIndex);
  }
  return true;
}

// Which classes of tables a scan decodes with: all of them in sequential scans, one in progressive ones,
// none where single DC bits are refined.
bool uses_dc(const ScanHeader& scan) {
  return scan.ss == 0 && scan.ah == 0;
}
bool uses_ac(const ScanHeader& scan) {
  return scan.se > 0;
}

// Derives a table number unless this scan has it already.
bool derive(Tables& tables, EntropyState& state, EntropyState* skipping, bool isDc, uint8_t number) {
  if (number > 3) return false;
  const DerivedTable*& table = isDc ? state.dc[number] : state.ac[number];
  return table != nullptr || derive_table(tables, isDc, number, skipping, &table) == PELOJ_OK;
}

bool derive_tables(Tables& tables, const Scan& scan, EntropyState& state, EntropyState* skipping) {
  for (int i = 0; i < scan.componentCount; ++i) {
    const Component& component = *scan.components[static_cast<size_t>(i)];
    if (uses_dc(scan) && !derive(tables, state, skipping, true, component.dcTable)) return false;
    if (uses_ac(scan) && !derive(tables, state, skipping, false, component.acTable)) return false;
  }
  for (size_t b = 0; b < static_cast<size_t>(scan.mcuBlocks); ++b) {
    const Component& component = *scan.components[scan.blockComponent[b]];
    if (uses_dc(scan)) state.blockDc[b] = state.dc[component.dcTable];
    if (!uses_ac(scan)) continue;
    state.blockAc[b] = state.ac[component.acTable];
    state.blockSkip[b] = state.skip[component.acTable];
  }
  return true;
}

// Coefficients of the largest MCU.
bool allocate_blocks(Entropy& entropy) {
  if (entropy.coefficients) return true;
  if (!entropy.coefficients.allocate(kMaxMcuBlocks * 64)) return false;
  for (size_t b = 0; b < kMaxMcuBlocks; ++b) entropy.blocks[b] = entropy.coefficients.data() + 64 * b;
  return true;
}

// The steps that a decode in mode 1 quantises to: Annex K at 30 %.
int32_t reference_step(const Component& component, size_t position) {
  const auto& table = component.index == 0 ? kLuminanceQuant : kChrominanceQuant;
  return (table[position] * 30 + 50) / 100;
}

// Some AC step of the first component is less than half of the reference's.
bool much_finer_than_reference(const QuantTable& table, const Component& first) {
  for (size_t k = 1; k < 64; ++k) {
    if (reference_step(first, k) > 2 * table.value[k]) return true;
  }
  return false;
}

void set_multipliers(Scale scale, const QuantTable& table, Component& component) {
  // The 4-point table belongs to scale 1/2 whatever the frame type, although progressive pictures run an
  // 8-point member there: their detail loses a tenth of its contrast, which is how they have always been
  // shown.
  const auto& factors = scale == kHalf ? kFourPointScale : kAanScale;
  for (size_t k = 0; k < 64; ++k) component.multiplier[k] = table.value[k] * factors[k] >> 2;
}

// Steps finer than the reference are replaced by it; the correction brings stored coefficients there.
void set_requantising(QuantTable& table, Component& component) {
  for (size_t k = 1; k < 64; ++k) {
    const size_t n = PELOJ_NATURAL_ORDER[k];
    const int32_t reference = reference_step(component, n);
    table.correction[k] = 8192;
    if (table.value[n] < reference) {
      component.multiplier[n] = kAanScale[n] * reference >> 2;
      table.correction[k] = table.value[n] * 8192 / reference;
    }
  }
}

}  // namespace

EntropyState* skip_tables(PELOJ_JDINFO& jd) {
  const bool skips = jd.marker->frameType == FrameType::kBaseline && jd.sizes.scale != kFull;
  return skips ? jd.entropy.state.get() : nullptr;
}

// A single component is not interleaved: its MCU is one block, and its rows of MCUs are block rows
// (T.81 A.2).
bool set_scan_geometry(const Frame& frame, Scan& scan) {
  scan.mcuBlocks = 0;
  const bool interleaved = scan.componentCount > 1;
  scan.mcusPerRow = interleaved ? frame.mcus_across() : scan.components[0]->blocksWide;
  for (int i = 0; i < scan.componentCount; ++i) {
    Component& component = *scan.components[static_cast<size_t>(i)];
    component.mcuWidth = interleaved ? component.h : 1;
    component.mcuHeight = interleaved ? component.v : 1;
    component.mcuBlocks = component.mcuWidth * component.mcuHeight;
    const auto last = [](int blocks, int mcu) { return blocks % mcu != 0 ? blocks % mcu : mcu; };
    component.lastColumnWidth = last(component.blocksWide, component.mcuWidth);
    component.lastRowHeight = last(component.blocksHigh, component.mcuHeight);
    if (!add_blocks(scan, i, component)) return false;
  }
  return true;
}

int set_up_scan(PELOJ_JDINFO* jdInfo) {
  if (!jdInfo->entropy.state) {
    jdInfo->entropy.state = os_new<EntropyState>();
    if (!jdInfo->entropy.state) return no_memory("PELOJ_SetupScan : malloc fail");
  }
  *jdInfo->entropy.state = {};
  jdInfo->entropy.unreadMarker = 0;
  jdInfo->marker->nextRestart = 0;
  if (jdInfo->scan.componentCount > kMaxComponents) return PELOJ_FAIL;
  for (int i = 0; i < jdInfo->scan.componentCount; ++i) {
    const Component& component = *jdInfo->scan.components[static_cast<size_t>(i)];
    if (component.quantTable > 3 || !jdInfo->tables.quant[component.quantTable]) return PELOJ_FAIL;
  }
  if (!set_scan_geometry(jdInfo->frame, jdInfo->scan))
    return fail("PELOJ_SetupScan : invalid block info");
  if (!derive_tables(jdInfo->tables, jdInfo->scan, *jdInfo->entropy.state, skip_tables(*jdInfo)))
    return fail("PELOJ_SetupScan : PELOJ_PrepareDerivedTbl fail");
  jdInfo->entropy.state->restartsToGo = static_cast<uint32_t>(jdInfo->scan.restartInterval);
  return PELOJ_OK;
}

void begin_imcu_row(Scan& scan, int imcuRow) {
  const Component& first = *scan.components[0];
  scan.mcuRowsPerImcu =
      scan.componentCount > 1 ? 1 : std::min<int>(first.v, first.blocksHigh - imcuRow * first.v);
}

int prepare_before_scan(PELOJ_JDINFO* jdInfo) {
  if (set_up_scan(jdInfo) != PELOJ_OK) return fail("PELOJ_InitDecBeforeScan : PELOJ_SetupScan fail");
  if (!prepare_multipliers(*jdInfo)) return fail("PELOJ_InitDecBeforeScan : no quntaze table");
  if (!allocate_blocks(jdInfo->entropy)) return no_memory("PELOJ_InitDecBeforeScan : malloc fail");
  begin_imcu_row(jdInfo->scan, jdInfo->progress.imcuRow);
  return PELOJ_OK;
}

QuantTable* quant_table(const Tables& tables, const Component& component) {
  if (component.table != nullptr) return component.table;
  return component.quantTable < 4 ? tables.quant[component.quantTable].get() : nullptr;
}

bool prepare_multipliers(PELOJ_JDINFO& jd) {
  const bool sequential = !is_progressive(jd);
  for (int i = 0; sequential && i < jd.scan.componentCount; ++i) {
    Component& component = *jd.scan.components[static_cast<size_t>(i)];
    component.table = quant_table(jd.tables, component);
  }
  std::array<QuantTable*, kMaxComponents> tables{};
  for (size_t c = 0; c < static_cast<size_t>(jd.frame.componentCount); ++c) {
    const Component& component = (*jd.frame.components)[c];
    // Tables of sequential components may still come, in front of their scans.
    tables[c] = sequential ? component.table : quant_table(jd.tables, component);
    if (tables[c] == nullptr && !sequential) return false;
  }
  jd.entropy.requantise = jd.decMode == 1 && tables[0] != nullptr &&
                          much_finer_than_reference(*tables[0], (*jd.frame.components)[0]);
  const bool requantise = jd.entropy.requantise && jd.sizes.scale == kFull && sequential;
  for (size_t c = 0; c < static_cast<size_t>(jd.frame.componentCount); ++c) {
    if (tables[c] == nullptr) continue;
    Component& component = (*jd.frame.components)[c];
    set_multipliers(jd.sizes.scale, *tables[c], component);
    if (requantise) set_requantising(*tables[c], component);
  }
  return true;
}

}  // namespace pelo::jpeg

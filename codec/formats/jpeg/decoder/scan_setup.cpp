#include "codec/formats/jpeg/decoder/scan_setup.h"

#include <algorithm>

#include "codec/base/errors.h"
#include "codec/formats/jpeg/decoder/dequantise.h"
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

}  // namespace pelo::jpeg

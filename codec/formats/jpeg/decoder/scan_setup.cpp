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
bool add_blocks(PELOJ_JDINFO& jd, int scanIndex, const Component& component) {
  if (jd.scan.mcuBlocks + component.mcuBlocks > kMaxMcuBlocks) return false;
  for (int i = 0; i < component.mcuBlocks; ++i) {
    jd.scan.blockComponent[static_cast<size_t>(jd.scan.mcuBlocks++)] = static_cast<uint8_t>(scanIndex);
  }
  return true;
}

// Which classes of tables a scan decodes with: all of them in sequential scans, one in progressive ones,
// none where single DC bits are refined.
bool uses_dc(const PELOJ_JDINFO& jd) {
  return jd.scan.ss == 0 && jd.scan.ah == 0;
}
bool uses_ac(const PELOJ_JDINFO& jd) {
  return jd.scan.se > 0;
}

// Derives a table number unless this scan has it already.
bool derive(PELOJ_JDINFO& jd, bool isDc, uint8_t number) {
  if (number > 3) return false;
  const DerivedTable*& table = isDc ? jd.entropy.state->dc[number] : jd.entropy.state->ac[number];
  return table != nullptr || derive_table(&jd, isDc, number, &table, jd.entropy.state.get()) == PELOJ_OK;
}

bool derive_tables(PELOJ_JDINFO& jd) {
  EntropyState& entropy = *jd.entropy.state;
  for (int i = 0; i < jd.scan.componentCount; ++i) {
    const Component& component = *jd.scan.components[static_cast<size_t>(i)];
    if (uses_dc(jd) && !derive(jd, true, component.dcTable)) return false;
    if (uses_ac(jd) && !derive(jd, false, component.acTable)) return false;
  }
  for (size_t b = 0; b < static_cast<size_t>(jd.scan.mcuBlocks); ++b) {
    const Component& component = *jd.scan.components[jd.scan.blockComponent[b]];
    if (uses_dc(jd)) entropy.blockDc[b] = entropy.dc[component.dcTable];
    if (!uses_ac(jd)) continue;
    entropy.blockAc[b] = entropy.ac[component.acTable];
    entropy.blockSkip[b] = entropy.skip[component.acTable];
  }
  return true;
}

// Coefficients of the largest MCU.
bool allocate_blocks(PELOJ_JDINFO& jd) {
  if (jd.entropy.coefficients) return true;
  if (!jd.entropy.coefficients.allocate(kMaxMcuBlocks * 64)) return false;
  for (size_t b = 0; b < kMaxMcuBlocks; ++b)
    jd.entropy.blocks[b] = jd.entropy.coefficients.data() + 64 * b;
  return true;
}

}  // namespace

// A single component is not interleaved: its MCU is one block, and its rows of MCUs are block rows
// (T.81 A.2).
bool set_scan_geometry(PELOJ_JDINFO& jd) {
  jd.scan.mcuBlocks = 0;
  const bool interleaved = jd.scan.componentCount > 1;
  jd.scan.mcusPerRow = interleaved ? jd.frame.mcus_across() : jd.scan.components[0]->blocksWide;
  for (int i = 0; i < jd.scan.componentCount; ++i) {
    Component& component = *jd.scan.components[static_cast<size_t>(i)];
    component.mcuWidth = interleaved ? component.h : 1;
    component.mcuHeight = interleaved ? component.v : 1;
    component.mcuBlocks = component.mcuWidth * component.mcuHeight;
    const auto last = [](int blocks, int mcu) { return blocks % mcu != 0 ? blocks % mcu : mcu; };
    component.lastColumnWidth = last(component.blocksWide, component.mcuWidth);
    component.lastRowHeight = last(component.blocksHigh, component.mcuHeight);
    if (!add_blocks(jd, i, component)) return false;
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
  if (!set_scan_geometry(*jdInfo)) return fail("PELOJ_SetupScan : invalid block info");
  if (!derive_tables(*jdInfo)) return fail("PELOJ_SetupScan : PELOJ_PrepareDerivedTbl fail");
  jdInfo->entropy.state->restartsToGo = static_cast<uint32_t>(jdInfo->scan.restartInterval);
  return PELOJ_OK;
}

void begin_imcu_row(PELOJ_JDINFO* jdInfo) {
  const Component& first = *jdInfo->scan.components[0];
  jdInfo->scan.mcuRowsPerImcu =
      jdInfo->scan.componentCount > 1
          ? 1
          : std::min<int>(first.v, first.blocksHigh - jdInfo->progress.imcuRow * first.v);
}

int prepare_before_scan(PELOJ_JDINFO* jdInfo) {
  if (set_up_scan(jdInfo) != PELOJ_OK) return fail("PELOJ_InitDecBeforeScan : PELOJ_SetupScan fail");
  if (!prepare_multipliers(*jdInfo)) return fail("PELOJ_InitDecBeforeScan : no quntaze table");
  if (!allocate_blocks(*jdInfo)) return no_memory("PELOJ_InitDecBeforeScan : malloc fail");
  begin_imcu_row(jdInfo);
  return PELOJ_OK;
}

}  // namespace pelo::jpeg

#include "codec/formats/jpeg/decoder/progressive.h"

#include "codec/formats/jpeg/decoder/idct.h"
#include "codec/formats/jpeg/decoder/markers.h"
#include "codec/formats/jpeg/decoder/scan_setup.h"
#include "codec/formats/jpeg/decoder/upsample.h"
#include "codec/formats/jpeg/header_scan.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

int fail(int error, const char* text) {
  gTAVIRPELO_Error = error;
  log_error(text);
  return PELOJ_FAIL;
}

// Blocks of a component in one row of the coefficient store: whole MCUs of the frame, whatever the
// current scan's are.
size_t stored_blocks_wide(const PELOJ_JDINFO& jd, const Component& component) {
  const int mcus = (jd.imageWidth + 8 * jd.hMax - 1) / (8 * jd.hMax);
  return static_cast<size_t>(mcus) * component.h;
}

}  // namespace

int32_t* stored_block(PELOJ_JDINFO& jd, const Component& component, int row, int column) {
  const size_t block = static_cast<size_t>(row) * stored_blocks_wide(jd, component) +
                       static_cast<size_t>(column);
  return jd.rowCoefficients[component.index].data() + 64 * block;
}

namespace {

bool allocate_store(PELOJ_JDINFO& jd) {
  for (int c = 0; c < jd.componentCount; ++c) {
    const auto index = static_cast<size_t>(c);
    const Component& component = (*jd.components)[index];
    const size_t blocks = stored_blocks_wide(jd, component) * component.v;
    if (!jd.rowCoefficients[index].allocate(blocks * 64)) return false;
  }
  return true;
}

// Points the MCU's blocks at their places in the store.
void point_blocks(PELOJ_JDINFO& jd, int mcu, int mcuRow) {
  size_t b = 0;
  for (int i = 0; i < jd.scanComponentCount; ++i) {
    const Component& component = *jd.scan[static_cast<size_t>(i)];
    for (int y = 0; y < component.mcuHeight; ++y) {
      for (int x = 0; x < component.mcuWidth; ++x) {
        jd.blocks[b++] = stored_block(jd, component, mcuRow + y, mcu * component.mcuWidth + x);
      }
    }
  }
}

// One scan's part of the iMCU row; false when its data fails.
bool decode_scan_row(PELOJ_JDINFO& jd) {
  const auto decode = jd.ah != 0 ? PELOJ_ProgDecodeMcuRefine : PELOJ_ProgDecodeMcu;
  for (int row = 0; row < jd.mcuRowsPerImcu; ++row) {
    for (int mcu = 0; mcu < jd.mcusPerRow; ++mcu) {
      point_blocks(jd, mcu, row);
      if (!decode(&jd, jd.blocks.data())) return false;
    }
  }
  return true;
}

void transform_row(PELOJ_JDINFO& jd, const Component& component, InverseDct transform) {
  const int size = jd.scale.block_size();
  for (int y = 0; y < component.v && jd.imcuRow * component.v + y < component.blocksHigh; ++y) {
    uint8_t* const* rows = component.samples.get() + y * size;
    for (int x = 0; x < component.blocksWide; ++x) {
      transform(nullptr, component.multiplier.data(), stored_block(jd, component, y, x), rows, x * size);
    }
  }
}

// Later scans cannot change what a reduced transform reads of the components that are marked complete.
struct Completeness {
  std::array<bool, kMaxComponents> complete{};

  void mark(const PELOJ_JDINFO& jd) {
    const bool enough = (jd.scale == kHalf && jd.se > 18) || (jd.scale == kQuarter && jd.se >= 5);
    if (enough) complete[static_cast<size_t>(jd.lastScanComponent)] = true;
  }
  bool all(int components) const {
    for (int c = 0; c < components; ++c) {
      if (!complete[static_cast<size_t>(c)]) return false;
    }
    return true;
  }
};

// Prepares the scan whose header has just been read.
int prepare_scan(PELOJ_JDINFO& jd) {
  if (PELOJ_InitUpsampler(&jd) != PELOJ_OK) {
    return fail(TAVIRPELO_ERROR_DECODE, "PELOJ_DecodeImage : PELOJ_InitUpsampler fail");
  }
  if (PELOJ_InitDecBeforeScan(&jd) != PELOJ_OK) {
    return fail(TAVIRPELO_ERROR_DECODE, "PELOJ_DecodeImage : PELOJ_InitDecBeforeScan fail");
  }
  return PELOJ_OK;
}

}  // namespace

int list_scans(PELOJ_JDINFO& jd) {
  if (!allocate_store(jd)) return fail(TAVIRPELO_ERROR_MEMORY, "PELOJ_DecodeImage : malloc fail");
  Completeness components;
  while (jd.scanCount < kMaxScans) {
    if (PELOJ_SetupScanInfo(&jd, &jd.scans[jd.scanCount]) != PELOJ_OK) {
      return fail(TAVIRPELO_ERROR_MEMORY, "PELOJ_DecodeImage : malloc fail");
    }
    ++jd.scanCount;
    components.mark(jd);
    if (components.all(jd.componentCount)) break;
    // The search for the next marker passes over the entropy-coded data of this scan.
    int status;
    PELOJ_ParseNextMarker(&jd, &status);
    if (status != PELOJ_OK) break;
    if (prepare_scan(jd) != PELOJ_OK) return PELOJ_FAIL;
  }
  return PELOJ_OK;
}

int decode_coefficient_row(PELOJ_JDINFO& jd) {
  for (OsBuffer<int32_t>& plane : jd.rowCoefficients) {
    if (plane) TAVIRPELO_OsMemset(plane.data(), 0, plane.size() * sizeof(int32_t));
  }
  for (size_t i = 0; i < jd.scanCount; ++i) {
    ScanRecord* record = jd.scans[i].get();
    if (!PELOJ_LoadScanInfo(&jd, record)) continue;
    if (!decode_scan_row(jd)) {
      if (jd.usedHeight - jd.rowsDone < 16) return PELOJ_IMAGE_DONE;
      if (jd.ah == 0) log_error("PELOJ_ProgDecodeSingleiMcu : PELOJ_ProgDecodeMcu fail");
      return PELOJ_ROW_FAIL;
    }
    PELOJ_SaveScanInfo(&jd, record);
  }
  return PELOJ_ROW_DONE;
}

}  // namespace pelo::jpeg

using namespace pelo;
using namespace pelo::jpeg;

int PELOJ_SetupScanInfo(PELOJ_JDINFO* jdInfo, OsPtr<ScanRecord>* slot) {
  *slot = os_new<ScanRecord>();
  if (!*slot) return PELOJ_FAIL;
  ScanRecord& record = **slot;
  record.componentCount = jdInfo->scanComponentCount;
  record.components = jdInfo->scan;
  record.lastComponent = jdInfo->lastScanComponent;
  record.ss = jdInfo->ss;
  record.se = jdInfo->se;
  record.ah = jdInfo->ah;
  record.al = jdInfo->al;
  record.restartInterval = jdInfo->restartInterval;
  jdInfo->eobRun = 0;
  PELOJ_SaveScanInfo(jdInfo, &record);
  return PELOJ_OK;
}

void PELOJ_SaveScanInfo(PELOJ_JDINFO* jdInfo, ScanRecord* record) {
  record->entropy = *jdInfo->entropy;
  record->sourcePosition = source_offset(*jdInfo->source);
  record->eobRun = jdInfo->eobRun;
  record->nextRestart = jdInfo->marker->nextRestart;
  record->unreadMarker = jdInfo->unreadMarker;
}

int PELOJ_LoadScanInfo(PELOJ_JDINFO* jdInfo, const ScanRecord* record) {
  if (!source_reposition(*jdInfo->source, record->sourcePosition)) return 0;
  jdInfo->scanComponentCount = record->componentCount;
  jdInfo->scan = record->components;
  jdInfo->lastScanComponent = record->lastComponent;
  jdInfo->ss = record->ss;
  jdInfo->se = record->se;
  jdInfo->ah = record->ah;
  jdInfo->al = record->al;
  jdInfo->restartInterval = record->restartInterval;
  *jdInfo->entropy = record->entropy;
  jdInfo->eobRun = record->eobRun;
  jdInfo->marker->nextRestart = record->nextRestart;
  jdInfo->unreadMarker = record->unreadMarker;
  if (!set_scan_geometry(*jdInfo)) return 0;
  PELOJ_SetupiMcu(jdInfo);
  return 1;
}

int PELOJ_ProgDecodeSingleiMcu(PELOJ_JDINFO* jdInfo) {
  const int status = decode_coefficient_row(*jdInfo);
  return status == PELOJ_ROW_DONE ? PELOJ_ProgIDct(jdInfo) : status;
}

int PELOJ_ProgIDct(PELOJ_JDINFO* jdInfo) {
  const InverseDct transform = jdInfo->scale == kFull   ? PELOJ_DoIdct
                               : jdInfo->scale == kHalf ? PELOJ_DoIdct_2to1
                                                        : PELOJ_DoIdct_4to1;
  for (int c = 0; c < jdInfo->componentCount; ++c) {
    transform_row(*jdInfo, (*jdInfo->components)[static_cast<size_t>(c)], transform);
  }
  return ++jdInfo->imcuRow >= jdInfo->imcuRows ? PELOJ_IMAGE_DONE : PELOJ_ROW_DONE;
}

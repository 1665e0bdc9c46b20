#include "codec/base/os.h"
#include "codec/formats/jpeg/decoder/headers.h"
#include "codec/formats/jpeg/decoder/idct.h"
#include "codec/formats/jpeg/decoder/imcu_row.h"
#include "codec/formats/jpeg/decoder/mcu_decode.h"
#include "codec/formats/jpeg/decoder/rows.h"
#include "codec/formats/jpeg/decoder/scans.h"
#include "codec/formats/jpeg/header_scan.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

// Blocks of a component in one row of the coefficient store: whole MCUs of the frame, whatever the
// current scan's are.
size_t stored_blocks_wide(const Frame& frame, const Component& component) {
  return static_cast<size_t>(frame.mcus_across()) * component.h;
}

}  // namespace

int32_t* stored_block(PELOJ_JDINFO& jd, const Component& component, int row, int column) {
  const size_t block =
      static_cast<size_t>(row) * stored_blocks_wide(jd.frame, component) + static_cast<size_t>(column);
  return jd.scans.coefficients[component.index].data() + 64 * block;
}

bool allocate_store(const Frame& frame, ScanList& scans) {
  for (int c = 0; c < frame.componentCount; ++c) {
    const auto index = static_cast<size_t>(c);
    const Component& component = (*frame.components)[index];
    const size_t blocks = stored_blocks_wide(frame, component) * component.v;
    if (!scans.coefficients[index].allocate(blocks * 64)) return false;
  }
  return true;
}

namespace {

// Points the MCU's blocks at their places in the store.
void point_blocks(PELOJ_JDINFO& jd, int mcu, int mcuRow) {
  size_t b = 0;
  for (int i = 0; i < jd.scan.componentCount; ++i) {
    const Component& component = *jd.scan.components[static_cast<size_t>(i)];
    for (int y = 0; y < component.mcuHeight; ++y) {
      for (int x = 0; x < component.mcuWidth; ++x) {
        jd.entropy.blocks[b++] = stored_block(jd, component, mcuRow + y, mcu * component.mcuWidth + x);
      }
    }
  }
}

// One scan's part of the iMCU row; false when its data fails.
bool decode_scan_row(PELOJ_JDINFO& jd) {
  // Nothing more comes of a scan that ended: a few bytes must not cost a visit to every block.
  if (jd.entropy.state->insufficient && jd.scan.restartInterval == 0) return true;
  const auto decode = jd.scan.ah != 0 ? decode_mcu_refine : decode_mcu_first;
  for (int row = 0; row < jd.scan.mcuRowsPerImcu; ++row) {
    for (int mcu = 0; mcu < jd.scan.mcusPerRow; ++mcu) {
      point_blocks(jd, mcu, row);
      if (!decode(&jd, jd.entropy.blocks.data())) return false;
    }
  }
  return true;
}

void transform_row(PELOJ_JDINFO& jd, const Component& component, InverseDct transform) {
  const int size = jd.sizes.scale.block_size();
  for (int y = 0; y < component.v && jd.progress.imcuRow * component.v + y < component.blocksHigh; ++y) {
    uint8_t* const* rows = component.samples.get() + y * size;
    for (int x = 0; x < component.blocksWide; ++x) {
      transform(component.multiplier.data(), stored_block(jd, component, y, x), rows, x * size);
    }
  }
}

}  // namespace

int decode_coefficient_row(PELOJ_JDINFO& jd) {
  for (OsBuffer<int32_t>& plane : jd.scans.coefficients) {
    if (plane) os_memset(plane.data(), 0, plane.size() * sizeof(int32_t));
  }
  for (size_t i = 0; i < jd.scans.count; ++i) {
    ScanRecord* record = jd.scans.records[i].get();
    if (!load_scan(&jd, record)) continue;
    if (!decode_scan_row(jd)) {
      if (jd.sizes.used.height - jd.progress.rowsDone < 16) return PELOJ_IMAGE_DONE;
      if (jd.scan.ah == 0) log_error("PELOJ_ProgDecodeSingleiMcu : PELOJ_ProgDecodeMcu fail");
      return PELOJ_ROW_FAIL;
    }
    save_scan(&jd, record);
  }
  return PELOJ_ROW_DONE;
}

int decode_progressive_row(PELOJ_JDINFO* jdInfo) {
  const int status = decode_coefficient_row(*jdInfo);
  return status == PELOJ_ROW_DONE ? transform_stored_row(jdInfo) : status;
}

int transform_stored_row(PELOJ_JDINFO* jdInfo) {
  const InverseDct transform = jdInfo->sizes.scale == kFull   ? idct8<8, 8>
                               : jdInfo->sizes.scale == kHalf ? idct_reduced4
                                                              : idct_reduced2;
  for (int c = 0; c < jdInfo->frame.componentCount; ++c) {
    transform_row(*jdInfo, (*jdInfo->frame.components)[static_cast<size_t>(c)], transform);
  }
  return ++jdInfo->progress.imcuRow >= jdInfo->progress.imcuRows ? PELOJ_IMAGE_DONE : PELOJ_ROW_DONE;
}

}  // namespace pelo::jpeg

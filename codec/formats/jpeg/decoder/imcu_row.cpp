#include "codec/formats/jpeg/decoder/imcu_row.h"

#include "codec/base/os.h"
#include "codec/formats/jpeg/decoder/idct.h"
#include "codec/formats/jpeg/decoder/mcu_decode.h"
#include "codec/formats/jpeg/decoder/scans.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

// Everything that a scale changes.
struct FullSize {
  static constexpr int kBlock = 8;
  static InverseDct transform(int lastPosition) { return kFullIdct[static_cast<size_t>(lastPosition)]; }
};
struct HalfSize {
  static constexpr int kBlock = 4;
  static InverseDct transform(int lastPosition) { return kHalfIdct[static_cast<size_t>(lastPosition)]; }
};
struct ThreeEighthsSize {
  static constexpr int kBlock = 3;
  static InverseDct transform(int) { return idct_reduced3; }
};
struct QuarterSize {
  static constexpr int kBlock = 2;
  static InverseDct transform(int) { return idct_reduced2; }
};
struct EighthSize {
  static constexpr int kBlock = 1;
};

template <class Size>
void transform_block(const Component& component, const int32_t* block, int lastPosition,
                     uint8_t* const* rows, int column) {
  if constexpr (Size::kBlock == 1) {
    rows[0][column] = idct_dc(component.multiplier[0], block[0]);
  } else {
    Size::transform(lastPosition)(component.multiplier.data(), block, rows, column);
  }
}

// Transforms the MCU's blocks of one component, but for those beyond the picture's last column and row.
// Returns the index of the next component's first block.
template <class Size>
int transform_component(const Entropy& entropy, const Component& component, int block, int mcu,
                        bool lastColumn, int imcuRow, int blockRow) {
  const int wide = lastColumn ? component.lastColumnWidth : component.mcuWidth;
  const int firstRow = imcuRow * component.v + blockRow;
  for (int y = 0; y < component.mcuHeight; ++y) {
    if (firstRow + y >= component.blocksHigh) break;
    uint8_t* const* rows = component.samples.get() + (blockRow + y) * Size::kBlock;
    for (int x = 0; x < wide; ++x) {
      const auto b = static_cast<size_t>(block + y * component.mcuWidth + x);
      transform_block<Size>(component, entropy.blocks[b], entropy.lastPosition[b], rows,
                            (mcu * component.mcuWidth + x) * Size::kBlock);
    }
  }
  return block + component.mcuBlocks;
}

template <class Size>
void transform_mcu(const Scan& scan, const Entropy& entropy, int mcu, int imcuRow, int blockRow) {
  int block = 0;
  const bool lastColumn = mcu == scan.mcusPerRow - 1;
  for (int i = 0; i < scan.componentCount; ++i) {
    const Component& component = *scan.components[static_cast<size_t>(i)];
    block = transform_component<Size>(entropy, component, block, mcu, lastColumn, imcuRow, blockRow);
  }
}

using DecodeMcu = int (*)(PELOJ_JDINFO*, int32_t* const*);

// The current scan's part of the iMCU row; false when its data fails.
template <class Size>
bool decode_scan_row(PELOJ_JDINFO& jd, DecodeMcu decode) {
  const auto used = static_cast<size_t>(jd.scan.mcuBlocks) * 64 * sizeof(int32_t);
  for (int blockRow = 0; blockRow < jd.scan.mcuRowsPerImcu; ++blockRow) {
    for (int mcu = 0; mcu < jd.scan.mcusPerRow; ++mcu) {
      os_memset(jd.entropy.coefficients.data(), 0, used);
      jd.entropy.lastPosition = {};
      if (!decode(&jd, jd.entropy.blocks.data())) return false;
      transform_mcu<Size>(jd.scan, jd.entropy, mcu, jd.progress.imcuRow, blockRow);
    }
  }
  return true;
}

// The same of every listed scan.
template <class Size>
bool decode_scan_rows(PELOJ_JDINFO& jd, DecodeMcu decode) {
  for (size_t i = 0; i < jd.scans.count; ++i) {
    ScanRecord* record = jd.scans.records[i].get();
    if (!load_scan(&jd, record) || !decode_scan_row<Size>(jd, decode)) return false;
    save_scan(&jd, record);
  }
  return true;
}

template <class Size>
int decode_imcu_row(PELOJ_JDINFO& jd, DecodeMcu decode, const char* failure) {
  const bool decoded =
      jd.scans.count > 0 ? decode_scan_rows<Size>(jd, decode) : decode_scan_row<Size>(jd, decode);
  if (!decoded) {
    if (jd.sizes.used.height - jd.progress.rowsDone < 16) return PELOJ_IMAGE_DONE;
    log_error(failure);
    return PELOJ_ROW_FAIL;
  }
  if (++jd.progress.imcuRow >= jd.progress.imcuRows) return PELOJ_IMAGE_DONE;
  begin_imcu_row(jd.scan, jd.progress.imcuRow);
  return PELOJ_ROW_DONE;
}

}  // namespace

int decode_imcu_row(PELOJ_JDINFO* jdInfo) {
  return decode_imcu_row<FullSize>(*jdInfo,
                                   jdInfo->entropy.requantise ? decode_mcu_requantised : decode_mcu_full,
                                   "PELOJ_DecodeSingleiMcu : PELOJ_DecodeMcu fail");
}

int decode_imcu_row_scaled(PELOJ_JDINFO* jdInfo) {
  if (jdInfo->sizes.scale == kHalf) {
    return decode_imcu_row<HalfSize>(*jdInfo, decode_mcu_half,
                                     "PELOJ_DecodeSingleiMcu_resize : PELOJ_DecodeMcu_2to1 fail");
  }
  if (jdInfo->sizes.scale == kThreeEighths) {
    return decode_imcu_row<ThreeEighthsSize>(
        *jdInfo, decode_mcu_three_eighths, "PELOJ_DecodeSingleiMcu_resize : PELOJ_DecodeMcu_8to3 fail");
  }
  if (jdInfo->sizes.scale == kQuarter) {
    return decode_imcu_row<QuarterSize>(*jdInfo, decode_mcu_quarter,
                                        "PELOJ_DecodeSingleiMcu_resize : PELOJ_DecodeMcu_4to1 fail");
  }
  // A progressive picture's first scan is all that an eighth of its size needs.
  return decode_imcu_row<EighthSize>(*jdInfo, is_progressive(*jdInfo) ? decode_mcu_first : decode_mcu_dc,
                                     "PELOJ_DecodeSingleiMcu_resize : PELOJ_DecodeMcu8to1 fail");
}

}  // namespace pelo::jpeg

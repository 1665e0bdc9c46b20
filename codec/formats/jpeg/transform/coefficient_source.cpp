#include "codec/formats/jpeg/transform/coefficient_source.h"

#include <algorithm>
#include <cstring>

#include "codec/base/dec_info.h"
#include "codec/formats/jpeg/decoder/imcu_row.h"
#include "codec/formats/jpeg/decoder/mcu_decode.h"

namespace pelo::jpeg {
namespace {

// Pointers to the blocks of one MCU, as the decoders take them.
using McuBlocks = std::array<int32_t*, kMaxMcuBlocks>;
McuBlocks mcu_blocks(CoefficientBlock* first, int count) {
  McuBlocks blocks{};
  for (size_t b = 0; b < static_cast<size_t>(count); ++b) blocks[b] = first[b].data();
  return blocks;
}

bool has_zero(const QuantTable& table) {
  return std::any_of(table.value.begin(), table.value.end(), [](uint16_t q) { return (q & 0xFF) == 0; });
}

}  // namespace

bool CoefficientSource::progressive() const {
  return decoder_->marker->frameType == FrameType::kProgressive;
}

bool CoefficientSource::open(int ioType, void* source, int size, int width, int height) {
  decInfo_.reset(create_dec_info(ioType, source, size, TAVIRPELO_YUV420, TAVIRPELO_THUMBNAIL_NEVER));
  if (!decInfo_) return false;
  decoder_.reset(
      begin_strips(decInfo_.get(), std::max(width, 1), std::max(height, 1), TAVIRPELO_YUV420));
  if (!decoder_ || !accepted()) return false;
  lay_out();
  return true;
}

bool CoefficientSource::accepted() const {
  const PELOJ_JDINFO& jd = *decoder_;
  if (jd.frame.colourSpace != ColourSpace::kYcc && jd.frame.colourSpace != ColourSpace::kGrey)
    return false;
  for (int c = 0; c < jd.frame.componentCount; ++c) {
    const auto index = static_cast<size_t>(c);
    const Component& component = (*jd.frame.components)[index];
    if (component.quantTable >= jd.tables.quant.size() || !jd.tables.quant[component.quantTable])
      return false;
    if (has_zero(*jd.tables.quant[component.quantTable])) return false;
    if (!progressive() &&
        (jd.scan.componentCount != jd.frame.componentCount || jd.scan.components[index]->index != c))
      return false;
  }
  return !progressive() || needs_all_scans(jd);
}

void CoefficientSource::lay_out() {
  const PELOJ_JDINFO& jd = *decoder_;
  grid_ = {};
  grid_.componentCount = jd.frame.componentCount;
  const bool single = jd.frame.componentCount == 1;
  for (size_t c = 0; c < static_cast<size_t>(jd.frame.componentCount); ++c) {
    const Component& component = (*jd.frame.components)[c];
    grid_.h[c] = single ? 1 : component.h;
    grid_.v[c] = single ? 1 : component.v;
    grid_.blocks += grid_.h[c] * grid_.v[c];
  }
  grid_.across = single ? (*jd.frame.components)[0].blocksWide : jd.frame.mcus_across();
  grid_.down = single ? (*jd.frame.components)[0].blocksHigh : jd.progress.imcuRows;
}

bool CoefficientSource::read_row(CoefficientBlock* blocks) {
  return progressive() ? read_progressive_row(blocks) : read_baseline_row(blocks);
}

bool CoefficientSource::read_baseline_row(CoefficientBlock* blocks) {
  std::memset(blocks, 0, grid_.row_blocks() * sizeof(CoefficientBlock));
  for (int mcu = 0; mcu < grid_.across; ++mcu, blocks += grid_.blocks) {
    if (!decode_mcu_full(decoder_.get(), mcu_blocks(blocks, grid_.blocks).data())) {
      TAVIRPELO_PrintMessage("__ValorenJpgDecodeSingleiMcu : PELOJ_DecodeMcu fail");
      return false;
    }
  }
  return true;
}

bool CoefficientSource::skip_row() {
  std::array<CoefficientBlock, kMaxMcuBlocks> unread;
  const McuBlocks blocks = mcu_blocks(unread.data(), grid_.blocks);
  for (int mcu = 0; mcu < grid_.across; ++mcu) {
    if (!decode_mcu_dc(decoder_.get(), blocks.data())) {
      TAVIRPELO_PrintMessage("__ValorenJpgDecodeSingleiMcuSkip : PELOJ_DecodeMcu8to1 fail");
      return false;
    }
  }
  return true;
}

// Fills the coefficient store with the next iMCU row. Of one component that holds several rows of MCUs.
bool CoefficientSource::next_stored_row() {
  PELOJ_JDINFO& jd = *decoder_;
  if (jd.progress.imcuRow >= jd.progress.imcuRows || decode_coefficient_row(jd) != PELOJ_ROW_DONE)
    return false;
  const Component& first = (*jd.frame.components)[0];
  storedRows_ = jd.frame.componentCount > 1
                    ? 1
                    : std::min<int>(first.v, first.blocksHigh - jd.progress.imcuRow * first.v);
  storedRow_ = 0;
  ++jd.progress.imcuRow;
  return true;
}

bool CoefficientSource::read_progressive_row(CoefficientBlock* blocks) {
  if (storedRow_ >= storedRows_ && !next_stored_row()) return false;
  for (int mcu = 0; mcu < grid_.across; ++mcu) {
    for (size_t c = 0; c < static_cast<size_t>(grid_.componentCount); ++c) {
      const Component& component = (*decoder_->frame.components)[c];
      for (int y = 0; y < grid_.v[c]; ++y) {
        for (int x = 0; x < grid_.h[c]; ++x, ++blocks) {
          const int32_t* stored =
              stored_block(*decoder_, component, storedRow_ + y, mcu * grid_.h[c] + x);
          std::memcpy(blocks->data(), stored, sizeof(CoefficientBlock));
        }
      }
    }
  }
  ++storedRow_;
  return true;
}

void init_partial(const PELOJ_JDINFO* jdInfo, RowSnapshot* snapshot) {
  const EntropyState& entropy = *jdInfo->entropy.state;
  *snapshot = {entropy.bits,
               entropy.lastDc,
               entropy.restartsToGo,
               jdInfo->source->tell(),
               entropy.insufficient,
               jdInfo->marker->nextRestart,
               jdInfo->entropy.unreadMarker};
}

int load_partial(PELOJ_JDINFO* jdInfo, const RowSnapshot* snapshot) {
  if (!jdInfo->source->move_to(snapshot->sourcePosition)) return 0;
  EntropyState& entropy = *jdInfo->entropy.state;
  entropy.bits = snapshot->bits;
  entropy.lastDc = snapshot->lastDc;
  entropy.restartsToGo = snapshot->restartsToGo;
  entropy.insufficient = snapshot->insufficient;
  jdInfo->marker->nextRestart = snapshot->nextRestart;
  jdInfo->entropy.unreadMarker = snapshot->unreadMarker;
  return 1;
}

int make_row_record(CoefficientSource* source, RowSnapshots* snapshots) {
  PELOJ_JDINFO& jd = source->decoder();
  const int rows = source->grid().down;
  if (!snapshots->allocate(static_cast<size_t>(rows))) return 0;
  for (int row = 0; row < rows; ++row) {
    if (!jd.checkFn(jd.decInfo, row, row)) {
      TAVIRPELO_PrintMessage("__ValorenJpgProcessDataSkip : pJDInfo->CheckFn fail");
      return 0;
    }
    init_partial(&jd, &(*snapshots)[static_cast<size_t>(row)]);
    if (!source->skip_row()) return 0;
  }
  return 1;
}

}  // namespace pelo::jpeg

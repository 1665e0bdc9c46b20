// A JPEG read as rows of MCUs of quantised coefficients, baseline or progressive.
#pragma once

#include <array>
#include <memory>

#include "codec/base/dec_info.h"
#include "codec/formats/jpeg/encoder/encoder.h"
#include "codec/formats/jpeg/strips/strips.h"

namespace pelo::jpeg {

// MCUs of a picture and the blocks in each. A single component is not interleaved: its MCU is one block,
// whatever its factors (T.81 A.2.2).
struct McuGrid {
  int across, down;
  int componentCount;
  std::array<int, kEncoderComponents> h, v;
  int blocks;  // of one MCU

  size_t row_blocks() const { return static_cast<size_t>(across) * static_cast<size_t>(blocks); }
};

class CoefficientSource {
 public:
  // Opens a source of either frame type at the scale at which all of its coefficients are read. False
  // for what cannot be transformed: RGB, scans of fewer components than the frame, zero quantisers.
  [[nodiscard]] bool open(int ioType, void* source, int size, int width, int height);

  const McuGrid& grid() const { return grid_; }
  PELOJ_JDINFO& decoder() { return *decoder_; }
  bool progressive() const;

  // The next row of MCUs, grid().row_blocks() blocks. False when its data fail.
  [[nodiscard]] bool read_row(CoefficientBlock* blocks);

  // Passes a row of a baseline source, reading DC only.
  [[nodiscard]] bool skip_row();

 private:
  struct DestroyDecInfo {
    void operator()(TAVIRPELO_DECINFO* d) const { destroy_dec_info(d); }
  };
  struct FinishDecoder {
    void operator()(PELOJ_JDINFO* d) const { end_strips(d); }
  };

  bool accepted() const;
  void lay_out();
  bool read_baseline_row(CoefficientBlock* blocks);
  bool read_progressive_row(CoefficientBlock* blocks);
  bool next_stored_row();

  std::unique_ptr<TAVIRPELO_DECINFO, DestroyDecInfo> decInfo_;
  std::unique_ptr<PELOJ_JDINFO, FinishDecoder> decoder_;
  McuGrid grid_{};
  int storedRow_ = 0;   // progressive: MCU row of the coefficient store that comes next,
  int storedRows_ = 0;  // and how many it holds
};

// ---- resuming a baseline scan at any row of MCUs ----

// Where a row's codes begin, and what its DC values are
// predicted from, follows from every code before it: one pass notes both for each row.
struct RowSnapshot {
  BitState bits;
  std::array<uint32_t, kMaxComponents> lastDc;
  uint32_t restartsToGo;
  uint32_t sourcePosition;  // next unread byte
  uint8_t insufficient;
  uint8_t nextRestart;
  uint8_t unreadMarker;
};
using RowSnapshots = OsBuffer<RowSnapshot>;

// Reads the whole source once, DC only, and notes where each of its rows begins. False when memory is
// short, data fail or the progress function refuses.
int make_row_record(CoefficientSource* source, RowSnapshots* snapshots);

// Notes, and goes back to, the decoder's place. Load: 0 when the source cannot be moved there.
void init_partial(const PELOJ_JDINFO* jdInfo, RowSnapshot* snapshot);
int load_partial(PELOJ_JDINFO* jdInfo, const RowSnapshot* snapshot);

}  // namespace pelo::jpeg

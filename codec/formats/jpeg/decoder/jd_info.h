// The JPEG decoder's state for one picture: headers, tables, entropy state, sample rows, resampling and
// the output position. Made by initialize_decoder, emptied by clear_decoder.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>

#include "codec/base/checked.h"
#include "codec/base/errors.h"
#include "codec/base/geometry.h"
#include "codec/base/os_memory.h"
#include "codec/base/source.h"
#include "codec/formats/jpeg/decoder/bit_reader.h"
#include "codec/formats/jpeg/decoder/huffman.h"
#include "codec/formats/jpeg/decoder/row_output.h"
#include "codec/pixel/quad_sampler.h"
#include "tavirpelo/decinfo.h"

// Results of the row decoders.
enum { PELOJ_ROW_DONE = 100, PELOJ_IMAGE_DONE = 101, PELOJ_ROW_FAIL = 102 };

namespace pelo::jpeg {

constexpr int kMaxComponents = 3;
constexpr int kMaxSampling = 4;
constexpr int kMaxMcuBlocks = 10;       // T.81 B.2.3
constexpr size_t kTablePoolSize = 120;  // four for each of kMaxScans; a file with more is not read on

enum class ColourSpace : uint8_t { kNone = 0, kGrey = 1, kRgb = 2, kYcc = 3 };
enum class FrameType : uint8_t { kNone = 0, kBaseline = 1, kProgressive = 2 };

struct OsFreeDelete {
  void operator()(void* block) const { os_free(block); }
};
// Row pointers and the samples behind them, one allocation (allocate_rows).
using SampleRows = std::unique_ptr<uint8_t*, OsFreeDelete>;

struct QuantTable {
  std::array<uint16_t, 64> value;      // natural order
  std::array<int32_t, 64> correction;  // zig-zag order, 8192 = 1.0: stored to reference step
};

// A component of the frame (T.81 B.2.2), and its layout in the picture.
struct Component {
  uint8_t id;
  uint8_t index;  // in frame order
  uint8_t h, v;   // sampling factors
  uint8_t quantTable;
  uint8_t dcTable, acTable;
  int blocksWide, blocksHigh;
  int downsampledWidth, downsampledHeight;  // samples
  int scaledWidth;                          // downsampled width at the decode scale
  int mcuWidth, mcuHeight, mcuBlocks;       // blocks of one MCU of the current scan
  int lastColumnWidth, lastRowHeight;       // blocks of the last MCU inside the picture
  uint8_t hExpand, vExpand;                 // replication to the full grid; 1 and 1: none
  QuantTable* table;                        // sequential: the one that its scan found
  std::array<int32_t, 64> multiplier;       // dequantisation, natural order
  SampleRows samples;                       // one iMCU row
  SampleRows colour;                  // replicated rows; empty when the samples are used as they are
  uint8_t* colourRows[kMaxSampling];  // the current row group on the full grid

  bool on_full_grid() const { return hExpand == 1 && vExpand == 1; }
};

struct MarkerRecord {
  int32_t discardedBytes;
  uint8_t nextRestart;  // n of the RSTn expected next
  FrameType frameType;
  uint8_t sawSos, sawDht, sawDqt, sawApp0, sawApp14;
  uint8_t transform;  // last byte of the last APP14
  std::array<uint8_t, kMaxComponents> componentIds;
  Reason foreign;  // why frames that were passed over on the way to the first are not read
};

struct EntropyState {
  uint8_t insufficient;  // zeros were consumed in place of data: MCUs stay flat until a restart
  BitState bits;
  std::array<uint32_t, kMaxComponents> lastDc;  // by scan position; unsigned, as hostile sums wrap
  uint32_t restartsToGo;
  std::array<const DerivedTable*, 4> dc, ac;
  std::array<const SkipTable*, 4> skip;
  std::array<const DerivedTable*, kMaxMcuBlocks> blockDc, blockAc;
  std::array<const SkipTable*, kMaxMcuBlocks> blockSkip;
};

// Numerator / 2^shift: 1/1, 1/2, 3/8, 1/4, 1/8.
struct Scale {
  int numerator;
  int shift;
  constexpr int of(int64_t size) const { return static_cast<int>(size * numerator >> shift); }
  constexpr int block_size() const { return 8 * numerator >> shift; }  // samples of a block's side
  constexpr bool operator==(const Scale&) const = default;
};
constexpr Scale kFull{1, 0}, kHalf{1, 1}, kThreeEighths{3, 3}, kQuarter{1, 2}, kEighth{1, 3};

// A scan's header (T.81 B.2.3).
struct ScanHeader {
  int componentCount;
  std::array<Component*, kMaxComponents> components;
  int lastComponent;  // frame index
  int ss, se, ah, al;
  int restartInterval;  // MCUs; 0: none
};

// A scan between visits: its header, and where its decoding stands.
struct ScanRecord {
  ScanHeader header;
  EntropyState entropy;
  uint32_t sourcePosition;  // next unread byte
  uint32_t eobRun;
  uint8_t nextRestart;
  uint8_t unreadMarker;
};

// The row of full-grid samples that the converters read.
struct GridRow {
  const uint8_t* plane[kMaxComponents];
};

// Three channels of a full-grid row, a word of 10-bit lanes each column.
struct ColourLanes {
  using Word = uint32_t;
  using Row = GridRow;
  static Word word(const Row& row, uint32_t column) {
    return pack_lanes(row.plane[0][column], row.plane[1][column], row.plane[2][column]);
  }
};

// How the decoded size becomes the target size.
enum class Sampling : uint8_t {
  kCentres,  // the sample nearest to each output's centre
  kQuarters  // the mean of the four at its quarter points
};

// The picture as its frame header describes it.
struct Frame {
  int width, height;
  int componentCount;
  int hMax, vMax;
  ColourSpace colourSpace;
  OsPtr<std::array<Component, kMaxComponents>> components;

  // Interleaved MCUs; those at the right and lower edge reach beyond the picture.
  int mcus_across() const { return ceil_div(width, 8 * hMax); }
  int mcus_down() const { return ceil_div(height, 8 * vMax); }
};

// Tables as segments have defined them so far.
struct Tables {
  std::array<OsPtr<QuantTable>, 4> quant;
  // Replaced between scans, but still some component's.
  std::array<OsPtr<QuantTable>, kMaxComponents> replacedQuant;
  size_t replacedCount;
  std::array<const HuffmanSpec*, 4> dcRaw, acRaw;
  // Every DHT definition keeps its slot: derived tables of earlier scans point into it.
  std::array<OsPtr<HuffmanSpec>, kTablePoolSize> rawPool;
  size_t rawCount;
  std::array<OsPtr<DerivedTable>, kTablePoolSize> derivedPool;
  size_t derivedCount;
};

// The current scan: its header, and the layout of its MCUs.
struct Scan : ScanHeader {
  int mcuBlocks;
  std::array<uint8_t, kMaxMcuBlocks> blockComponent;  // scan position
  int mcusPerRow;
  int mcuRowsPerImcu;  // rows of MCUs in the current iMCU row
};

// Entropy decoding, and the MCU that it fills.
struct Entropy {
  OsPtr<EntropyState> state;
  uint8_t unreadMarker;  // second byte of a marker met in the data; 0: none
  int endIsMarker;       // the source's end counts as EOI; otherwise decoding fails there
  uint32_t eobRun;       // blocks that an end-of-band code still covers (T.81 G.1.2.2)
  int requantise;        // AC coefficients are brought to the reference steps while decoding
  std::array<uint8_t, kMaxMcuBlocks> lastPosition;  // zig-zag, last non-zero coefficient
  OsBuffer<int32_t> coefficients;                   // one MCU
  std::array<int32_t*, kMaxMcuBlocks> blocks;
};

// Pictures in several scans: where each stands, and what they have in common of a progressive one.
constexpr size_t kMaxScans = 30;
struct ScanList {
  std::array<OsPtr<ScanRecord>, kMaxScans> records;
  size_t count;                                                // 0 while the header's scan alone is read
  std::array<OsBuffer<int32_t>, kMaxComponents> coefficients;  // one iMCU row, 64 a block
};

// Sizes in pixels, in the order in which a picture passes through them. The inverse transform makes of
// the frame a `scaled` picture. Of that the part `used` is shown, all of it unless filling cuts it, from
// the crop offset on; it is resampled to `target`, which stands somewhere in the caller's `buffer`. What
// the whole scaled picture would become, of which filling cuts the target, is `output`.
struct Sizes {
  Scale scale;
  Size scaled;
  Size used;
  int cropX, cropY;
  Size output;
  Size target;
  Size buffer;  // as requested: for sideways rotations its sides are the picture's exchanged
  int exact;    // scaled equals output: rows are copied
};

// How far a decode has come.
struct Progress {
  int imcuRows;    // in the picture
  int imcuRow;     // decoded
  int bufferFull;  // an iMCU row waits to be shown
  int lastImcuDecoded;
  int rowGroup;      // of that iMCU row, next to be replicated
  int readPosition;  // rows of the current row group already converted
  int rowsDone;      // full-grid rows handed to the converter, or skipped
  int skipping;      // rows above the wanted region: no conversion
};

// From full-grid rows to rows of the target.
struct Resampling {
  void (*convert)(PELOJ_JDINFO*, int);
  Sampling sampling;
  int continueFlag;  // the input row must still yield more output rows
  int inputRow;
  // Columns of an input row fit 16 bits: none has more than kMaxSide samples.
  OsBuffer<uint16_t> centres;  // of each output column; for sampling at quarters instead:
  QuadSampler<ColourLanes, uint16_t> quarters;
};

}  // namespace pelo::jpeg

struct PELOJ_JDINFO {
  PELOJ_SOURCE* source;
  TAVIRPELO_DECINFO* decInfo;
  TAVIRPELO_CHECKFN checkFn;
  int outFormat;
  uint32_t rotation;
  int decMode;

  pelo::OsPtr<pelo::jpeg::MarkerRecord> marker;
  pelo::jpeg::Frame frame;
  pelo::jpeg::Tables tables;
  pelo::jpeg::Scan scan;
  pelo::jpeg::Entropy entropy;

  pelo::jpeg::ScanList scans;
  pelo::jpeg::Sizes sizes;
  pelo::jpeg::Progress progress;
  pelo::jpeg::Resampling resampling;
  pelo::jpeg::RowOutput output;
};

namespace pelo::jpeg {

// Frees what the state owns and clears it; a second call does nothing.
void clear_decoder(PELOJ_JDINFO* jdInfo);

}  // namespace pelo::jpeg

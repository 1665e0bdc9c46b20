#include <algorithm>

#include "codec/formats/jpeg/tables.h"
#include "codec/formats/jpeg/transform/coding_parameters.h"
#include "codec/formats/jpeg/transform/stream_encoder.h"

namespace pelo::jpeg {
namespace {

constexpr int kOne = 1024;  // fixed point of gains and ratios
constexpr int kGainBase = 25, kGainEnd = 500;

using GainTable = std::array<uint16_t, kGainEnd - kGainBase>;

// A target of four hundredths per unit: entry r - 25 is for a size of r / 25 times the target. Gains
// fall with the 3/2 power of the excess, a tenth of which is ignored: min(960, 1024 * (25 / (0.9 *
// r))^1.5), found in integers as the largest g with g^2 * (0.9 r)^3 <= 1024^2 * 25^3.
constexpr GainTable make_gains() {
  constexpr uint64_t kRight = uint64_t{1024} * 1024 * 25 * 25 * 25 * 1000;
  GainTable table{};
  uint64_t gain = 1500;
  for (uint64_t r = kGainBase; r < kGainEnd; ++r) {
    while (gain * gain * 729 * r * r * r > kRight) --gain;
    table[static_cast<size_t>(r - kGainBase)] = static_cast<uint16_t>(std::min<uint64_t>(gain, 960));
  }
  return table;
}
constexpr GainTable kGains = make_gains();
static_assert(kGains[0] == 960 && kGains[5] == 912 && kGains[25] == 424 && kGains[474] == 13);

// The table of a scale: Annex K's values divided by it.
struct Scaled {
  const std::array<uint8_t, 64>* base;
  int64_t divisor;  // scale * gain, 2^20 = 1.0
};

Scaled scaled_by(const std::array<uint8_t, 64>& base, uint8_t dc, int gain) {
  return {&base, int64_t{base[0]} * kOne / dc * gain};
}

bool too_coarse(const Scaled& scaled) {
  return scaled.divisor < 1 << 18;
}

void install(TransformParameters& parameters, uint8_t number, const Scaled& scaled) {
  auto& table = parameters.coding.quant[number];
  auto& ratio = parameters.ratio[number];
  for (size_t i = 0; i < 64; ++i) {
    const int64_t value = (int64_t{(*scaled.base)[i]} * (1 << 20) + scaled.divisor / 2) / scaled.divisor;
    const auto step = static_cast<uint8_t>(std::clamp<int64_t>(value, 1, 255));
    ratio[i] = ratio[i] * table[i] / step;
    table[i] = step;
  }
}

void multiply(CoefficientBlock& block, const std::array<int64_t, 64>& ratio) {
  constexpr int64_t kMost = 32767;  // beyond what any code expresses
  for (size_t i = 0; i < 64; ++i) {
    block[i] = static_cast<int32_t>(std::clamp(block[i] * ratio[i] / kOne, -kMost, kMost));
  }
}

int requantise(CoefficientSource& source, const TransformParameters& parameters, ELO_ENCODER& encoder) {
  const McuGrid& grid = source.grid();
  OsBuffer<CoefficientBlock> row;
  if (!row.allocate(grid.row_blocks())) return 0;
  for (int y = 0; y < grid.down; ++y) {
    if (!source.read_row(row.data())) return 0;
    for (size_t b = 0; b < row.size(); ++b) {
      const size_t component = encoder.blockComponent[b % static_cast<size_t>(grid.blocks)];
      multiply(row[b], parameters.ratio[parameters.coding.components[component].quantTable]);
    }
    if (!code_stream(&encoder, row.data())) return 0;
  }
  return 1;
}

}  // namespace

int updated_gain(int size, int target) {
  if (target < 1) return 10;
  const int64_t r = int64_t{kGainBase} * size / target;
  if (r < kGainBase) return kOne;
  return r >= kGainEnd ? 10 : kGains[static_cast<size_t>(r - kGainBase)];
}

Coarsening set_gained_table(TransformParameters* parameters, int gain) {
  if (parameters->tableCount < 1 || parameters->tableCount > 2) return Coarsening::kFailed;
  const std::array<uint8_t, 64>* const bases[2] = {&kLuminanceQuant, &kChrominanceQuant};
  std::array<Scaled, 2> scaled;
  for (size_t i = 0; i < static_cast<size_t>(parameters->tableCount); ++i) {
    const uint8_t dc = parameters->coding.quant[parameters->numbers[i]][0];
    if (dc == 0) return Coarsening::kFailed;
    scaled[i] = scaled_by(*bases[i], dc, gain);
    if (too_coarse(scaled[i])) return Coarsening::kTooCoarse;
  }
  for (size_t i = 0; i < static_cast<size_t>(parameters->tableCount); ++i) {
    install(*parameters, parameters->numbers[i], scaled[i]);
  }
  return Coarsening::kDone;
}

int requantise_sequential(CoefficientSource* source, const TransformParameters* parameters,
                          ELO_ENCODER* encoder) {
  return !source->progressive() && requantise(*source, *parameters, *encoder);
}

int requantise_progressive(CoefficientSource* source, const TransformParameters* parameters,
                           ELO_ENCODER* encoder) {
  return source->progressive() && requantise(*source, *parameters, *encoder);
}

}  // namespace pelo::jpeg

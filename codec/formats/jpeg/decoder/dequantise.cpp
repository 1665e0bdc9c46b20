#include "codec/formats/jpeg/decoder/dequantise.h"

#include "codec/formats/jpeg/decoder/scan_list.h"

namespace pelo::jpeg {
namespace {

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

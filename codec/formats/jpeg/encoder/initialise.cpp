// Start and end of an encoder state: component layout, tables, sample buffers.
#include <algorithm>

#include "codec/base/checked.h"
#include "codec/base/errors.h"
#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {
namespace {

using pelo::ceil_div;
using pelo::OsPtr;

// 4:2:0: luma 2 x 2 with table 0, chroma 1 x 1 with table 1.
constexpr CodingParameters kDefaultColour{3, {{{0, 2, 2}, {1, 1, 1}, {1, 1, 1}}}, {}, false};
constexpr CodingParameters kDefaultGrey{1, {{{0, 1, 1}}}, {}, false};

bool accepted_size(const TAVIRPELO_RAWINFO& image) {
  return image.width >= 1 && image.height >= 1 && image.width <= kMaxEncodedSide &&
         image.height <= kMaxEncodedSide;
}

const CodingParameters* default_parameters(uint32_t format) {
  switch (format) {
    case TAVIRPELO_RGB565:
    case TAVIRPELO_RGB888:
    case TAVIRPELO_YUV420:
      return &kDefaultColour;
    case TAVIRPELO_GREY8:
      return &kDefaultGrey;
    default:
      return nullptr;
  }
}

int blocks_of(const CodingParameters& parameters) {
  int blocks = 0;
  for (int i = 0; i < parameters.componentCount; ++i) {
    const auto& component = parameters.components[static_cast<size_t>(i)];
    blocks += component.h * component.v;
  }
  return blocks;
}

bool accepted_sampling(const CodingParameters& parameters) {
  if (parameters.componentCount < 1 || parameters.componentCount > kEncoderComponents) return false;
  for (int i = 0; i < parameters.componentCount; ++i) {
    const auto& component = parameters.components[static_cast<size_t>(i)];
    if (component.h < 1 || component.h > 2 || component.v < 1 || component.v > 2) return false;
    if (component.quantTable >= kQuantTables) return false;
  }
  return blocks_of(parameters) <= kEncoderMcuBlocks;
}

void lay_out(ELO_ENCODER& encoder, size_t index) {
  EncoderComponent& component = encoder.components[index];
  component.width = ceil_div(encoder.width * component.h, encoder.hMax);
  component.height = ceil_div(encoder.height * component.v, encoder.vMax);
  component.blocksWide = ceil_div(component.width, 8);
  component.blocksHigh = ceil_div(component.height, 8);
  for (int block = 0; block < component.h * component.v; ++block) {
    encoder.blockComponent[static_cast<size_t>(encoder.mcuBlocks++)] = static_cast<uint8_t>(index);
  }
}

void set_components(ELO_ENCODER& encoder, const CodingParameters& parameters) {
  encoder.componentCount = parameters.componentCount;
  encoder.hMax = encoder.vMax = 1;
  for (size_t i = 0; i < static_cast<size_t>(encoder.componentCount); ++i) {
    EncoderComponent& component = encoder.components[i];
    component.id = static_cast<uint8_t>(i + 1);
    component.quantTable = parameters.components[i].quantTable;
    component.dcTable = component.acTable = i == 0 ? 0 : 1;
    // The MCU of a single component is one block whatever its factors (T.81 A.2.2).
    const bool single = encoder.componentCount == 1;
    component.h = single ? 1 : parameters.components[i].h;
    component.v = single ? 1 : parameters.components[i].v;
    encoder.hMax = std::max<int>(encoder.hMax, component.h);
    encoder.vMax = std::max<int>(encoder.vMax, component.v);
  }
  for (size_t i = 0; i < static_cast<size_t>(encoder.componentCount); ++i) lay_out(encoder, i);
  encoder.mcusAcross = ceil_div(encoder.width, encoder.mcu_width());
  encoder.mcusDown = ceil_div(encoder.height, encoder.mcu_height());
}

bool allocate_samples(ELO_ENCODER& encoder) {
  for (size_t i = 0; i < static_cast<size_t>(encoder.componentCount); ++i) {
    EncoderComponent& component = encoder.components[i];
    if (!component.samples.allocate(static_cast<size_t>(component.stride() * 8 * component.v))) {
      return false;
    }
  }
  return true;
}

}  // namespace

ELO_ENCODER* make_encoder(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION* destination,
                          const TAVIRPELO_ENCOPTION* options, const CodingParameters* parameters) {
  if (!accepted_size(*image)) {
    refuse(image->width == 0 || image->height == 0 ? Reason::kZeroSize : Reason::kArgument,
           "JPEG encoder", "4999 pixels a side are the most");
    return nullptr;
  }
  const CodingParameters* defaults = default_parameters(image->format);
  if (defaults == nullptr) return refuse(Reason::kOutputFormat, "JPEG encoder"), nullptr;
  const CodingParameters& coding = parameters != nullptr ? *parameters : *defaults;
  if (!accepted_sampling(coding))
    return refuse(Reason::kArgument, "JPEG encoder", "sampling factors"), nullptr;

  OsPtr<ELO_ENCODER> encoder = pelo::os_new<ELO_ENCODER>();
  if (encoder == nullptr) return refuse(Reason::kNoMemory, "JPEG encoder"), nullptr;
  encoder->width = static_cast<int>(image->width);
  encoder->height = static_cast<int>(image->height);
  encoder->format = image->format;
  encoder->pixels = static_cast<const uint8_t*>(image->pData);
  encoder->destination = destination;
  encoder->app1 = options->app1;
  encoder->restartPerRow = coding.restartPerRow;
  set_components(*encoder, coding);
  if (!allocate_samples(*encoder)) return refuse(Reason::kNoMemory, "JPEG encoder"), nullptr;

  if (parameters == nullptr) {
    set_quality(encoder.get(), options->quality);
  } else {
    for (int i = 0; i < kQuantTables; ++i) {
      set_quant_table(encoder.get(), i, coding.quant[static_cast<size_t>(i)].data());
    }
  }
  prepare_codes(encoder.get());
  return encoder.release();
}

void release_buffers(ELO_ENCODER* encoder) {
  for (EncoderComponent& component : encoder->components) component.samples.reset();
  if (encoder->destination->kind == ELO_TO_FILE) {
    const int total = encoder->destination->total;
    discard(*encoder->destination);
    encoder->destination->total = total;
  }
}

}  // namespace pelo::jpeg

// pelo rotate: a JPEG is turned or mirrored without decoding it to pixels.
#include <memory>

#include "tavirpelo/tavirpelo.h"
#include "tools/common/codec_objects.h"
#include "tools/common/output.h"
#include "tools/pelo/input.h"
#include "tools/pelo/jpeg_input.h"

namespace pelo_tool {
namespace {

struct Turn {
  int angle;
  bool flip;
};

struct Options {
  std::string picture;
  std::string output;
  int angle = -1;  // degrees clockwise; -1: as the picture's orientation tag asks
  bool flip = false;
};

// What brings a picture of an orientation upright. Mirroring comes first.
Turn upright(uint32_t orientation) {
  switch (orientation) {
    case TAVIRPELO_ORIENTATION_FLIP_HORIZONTAL:
      return {0, true};
    case TAVIRPELO_ORIENTATION_ROTATE_180:
      return {180, false};
    case TAVIRPELO_ORIENTATION_FLIP_VERTICAL:
      return {180, true};
    case TAVIRPELO_ORIENTATION_TRANSPOSE:
      return {270, true};
    case TAVIRPELO_ORIENTATION_ROTATE_90:
      return {90, false};
    case TAVIRPELO_ORIENTATION_TRANSVERSE:
      return {90, true};
    case TAVIRPELO_ORIENTATION_ROTATE_270:
      return {270, false};
    default:
      return {0, false};
  }
}

uint32_t orientation_of(std::vector<uint8_t>& bytes) {
  const tool::DecInfo info(TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, bytes.data(),
                                                   static_cast<int>(bytes.size()), TAVIRPELO_RGB888, 0));
  const tool::ExifInfo exif(info ? PELOJ_CreatExifInfo(info.get()) : nullptr);
  return exif ? exif->orientation : 0;
}

Exit run(const Options& options) {
  std::vector<uint8_t> bytes;
  TAVIRPELO_HINFO header{};
  const Exit result = read_jpeg(options.picture, bytes, header);
  if (result != Exit::kDone) return result;
  const bool asked = options.angle >= 0 || options.flip;
  const Turn turn =
      asked ? Turn{options.angle < 0 ? 0 : options.angle, options.flip} : upright(orientation_of(bytes));
  if (turn.angle == 0 && !turn.flip)
    return tool::write_bytes(options.output, bytes.data(), bytes.size());

  tool::CodecBuffer buffer;
  ELO_DESTINATION destination{ELO_TO_MEMORY, buffer.size, 0, 0, nullptr, buffer.bytes};
  const int done = elo_rotate_jpeg(bytes.data(), static_cast<int>(bytes.size()), header.width,
                                   header.height, &destination, turn.angle, turn.flip, nullptr);
  buffer.bytes = destination.buffer;
  if (done != 1) {
    return fail(Exit::kRefused,
                "{}: cannot be turned: only sound baseline JPEGs in one scan, YCbCr or grey",
                options.picture);
  }
  return tool::write_bytes(options.output, buffer.bytes, static_cast<size_t>(destination.total));
}

}  // namespace

void register_rotate(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand(
      "rotate",
      "Turn or mirror a JPEG without loss; without options upright, as its orientation tag asks");
  add_picture_argument(*command, options->picture);
  command->add_option("output", options->output, "JPEG file, - for standard output")->required();
  command->add_option("--angle", options->angle, "Degrees clockwise: 0, 90, 180 or 270")
      ->check(CLI::IsMember({0, 90, 180, 270}));
  command->add_flag("--flip", options->flip, "Mirror from left to right first");
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool

// pelo encode: a portable pixmap or greymap becomes a JPEG.
#include <memory>

#include "tools/common/arguments.h"
#include "tools/common/codec_objects.h"
#include "tools/common/output.h"
#include "tools/common/pnm.h"
#include "tools/pelo/commands.h"
#include "tools/pelo/input.h"

namespace pelo_tool {
namespace {

struct Options {
  std::string picture;
  std::string output;
  int quality = 90;
};

Exit run(const Options& options) {
  std::vector<uint8_t> bytes;
  Exit result = read_all(options.picture, bytes);
  if (result != Exit::kDone) return result;
  std::optional<tool::Pnm> picture = tool::parse_pnm(bytes);
  if (!picture) {
    return fail(Exit::kRefused, "{}: not a binary PPM or PGM file of 8-bit samples", options.picture);
  }
  TAVIRPELO_RAWINFO raw{static_cast<uint32_t>(picture->width), static_cast<uint32_t>(picture->height),
                        picture->pixels.data(),
                        static_cast<uint32_t>(picture->grey ? TAVIRPELO_GREY8 : TAVIRPELO_RGB888)};
  tool::CodecBuffer buffer;
  if (!buffer.encode(raw, options.quality)) {
    return fail(Exit::kRefused, "{}: cannot encode {}x{} pixels, sides go up to {}", options.picture,
                raw.width, raw.height, tool::kMaxSide);
  }
  return tool::write_bytes(options.output, buffer.bytes, static_cast<size_t>(buffer.size));
}

}  // namespace

void register_encode(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("encode", "Write a PPM or PGM picture as JPEG");
  add_picture_argument(*command, options->picture);
  command->add_option("output", options->output, "JPEG file, - for standard output")->required();
  tool::add_quality_option(*command, options->quality);
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool

// pelo encode: a portable pixmap or greymap becomes a JPEG.
#include <memory>

#include "tools/common/arguments.h"
#include "tools/common/output.h"
#include "tools/pelo/commands.h"
#include "tools/pelo/input.h"
#include "tools/pelo/pnm.h"

namespace pelo_tool {
namespace {

constexpr int kFirstBuffer = 64 * 1024;  // bytes; the encoder enlarges it as needed

struct Options {
  std::string picture;
  std::string output;
  int quality = 90;
};

struct OsDeleter {
  void operator()(uint8_t* block) const { TAVIRPELO_OsFree(block); }
};

Exit run(const Options& options) {
  std::vector<uint8_t> bytes;
  Exit result = read_all(options.picture, bytes);
  if (result != Exit::kDone) return result;
  std::optional<Pnm> picture = parse_pnm(bytes);
  if (!picture) {
    return fail(Exit::kRefused, "{}: not a binary PPM or PGM file of 8-bit samples", options.picture);
  }
  TAVIRPELO_RAWINFO raw{static_cast<uint32_t>(picture->width), static_cast<uint32_t>(picture->height),
                        picture->pixels.data(),
                        static_cast<uint32_t>(picture->grey ? TAVIRPELO_GREY8 : TAVIRPELO_RGB888)};
  int size = kFirstBuffer;
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(kFirstBuffer));
  if (!buffer || TAVIRPELO_EncodeJpegToBuffer(&raw, &buffer, &size, options.quality) != 1) {
    return fail(Exit::kRefused, "{}: cannot encode {}x{} pixels, sides go up to {}", options.picture,
                raw.width, raw.height, tool::kMaxSide);
  }
  std::unique_ptr<uint8_t, OsDeleter> owner(buffer);
  return tool::write_bytes(options.output, buffer, static_cast<size_t>(size));
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

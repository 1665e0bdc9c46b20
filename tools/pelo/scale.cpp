// pelo scale: a portable pixmap at another size.
#include <memory>

#include "tavirpelo/raw.h"
#include "tools/common/arguments.h"
#include "tools/common/output.h"
#include "tools/common/pnm.h"
#include "tools/pelo/commands.h"
#include "tools/pelo/input.h"

namespace pelo_tool {
namespace {

struct Options {
  std::string picture;
  std::string output;
  tool::Size size;
  bool nearest = false;
};

Exit run(const Options& options) {
  std::vector<uint8_t> bytes;
  const Exit result = read_all(options.picture, bytes);
  if (result != Exit::kDone) return result;
  const std::optional<tool::Pnm> in = tool::parse_pnm(bytes);
  if (!in || in->grey) {
    return fail(Exit::kRefused, "{}: not a binary PPM file of 8-bit samples", options.picture);
  }
  const auto [width, height] = options.size;
  tool::Pnm out{width, height, false,
                std::vector<uint8_t>(static_cast<size_t>(width) * static_cast<size_t>(height) * 3)};
  if (options.nearest) {
    TAVIRPELO_CODEC_Scale(in->pixels.data(), out.pixels.data(), in->width, in->height, 3 * in->width,
                          width, height, 3 * width, width, height, TAVIRPELO_RGB888, 0, 0);
  } else {
    PELO_RGB888Scale_ex(in->pixels.data(), in->width, in->height, in->width, out.pixels.data(), width,
                        height, width);
  }
  return tool::write_pnm(options.output, out);
}

}  // namespace

void register_scale(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("scale", "Write a PPM picture at another size");
  add_picture_argument(*command, options->picture);
  command->add_option("output", options->output, "PPM file, - for standard output")->required();
  tool::add_size_argument(*command, "-s,--size", options->size, tool::kMaxSide, "Size of the result")
      ->required();
  command->add_flag("--nearest", options->nearest, "Nearest samples instead of averages");
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool

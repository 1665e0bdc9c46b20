// pelo yuv2rgb: a camera frame as a portable pixmap.
#include <memory>

#include "tavirpelo/yuv.h"
#include "tools/common/arguments.h"
#include "tools/common/output.h"
#include "tools/common/pnm.h"
#include "tools/pelo/commands.h"
#include "tools/pelo/input.h"
#include "tools/pelo/words.h"

namespace pelo_tool {
namespace {

struct Options {
  std::string frame;
  std::string output;
  tool::Size size;
  bool pairs = false;
};

Exit run(const Options& options) {
  std::vector<uint8_t> frame;
  const Exit result = read_all(options.frame, frame);
  if (result != Exit::kDone) return result;
  const auto width = static_cast<size_t>(options.size.width),
             height = static_cast<size_t>(options.size.height);
  const size_t needed = width * height + (width + 1) / 2 * ((height + 1) / 2) * 2;
  if (frame.size() < needed) {
    return fail(Exit::kRefused, "{}: {} bytes, a frame of this size has {}", options.frame, frame.size(),
                needed);
  }
  std::vector<uint8_t> words(width * height * 2);
  const auto convert = options.pairs ? elo_OrbPYV0420toRGB565 : elo_OrbYUV420toRGB565;
  convert(frame.data(), options.size.width, options.size.height, words.data());
  return tool::write_pnm(options.output,
                         {options.size.width, options.size.height, false, rgb_of_words(words)});
}

}  // namespace

void register_yuv2rgb(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command =
      app.add_subcommand("yuv2rgb", "Write a YUV 4:2:0 camera frame as PPM, in 16-bit colours");
  command->add_option("frame", options->frame, "File of planes Y, Cb, Cr; - for standard input")
      ->required();
  command->add_option("output", options->output, "PPM file, - for standard output")->required();
  tool::add_size_argument(*command, "-s,--size", options->size, tool::kMaxSide, "Size of the frame")
      ->required();
  command->add_flag("--pairs", options->pairs, "Chroma is one plane of pairs Cr, Cb");
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool

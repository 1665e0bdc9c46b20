// pelo crop: a part of a JPEG file at a size, decoded no larger than it takes.
#include <memory>

#include "tools/common/arguments.h"
#include "tools/common/output.h"
#include "tools/common/pnm.h"
#include "tools/pelo/commands.h"
#include "tools/pelo/input.h"
#include "tools/pelo/numbers.h"
#include "tools/pelo/words.h"

namespace pelo_tool {
namespace {

struct Options {
  std::string picture;
  std::string output;
  std::array<int, 4> part{};  // x, y, width, height
  tool::Size size;
  bool stretch = false;
  int memory = 64;  // MiB
};

Exit run(const Options& options) {
  Input input;
  const Exit opened = input.open(options.picture);
  if (opened != Exit::kDone) return opened;
  if (input.format() != TAVIRPELO_FORMAT_JPEG || options.picture == "-") {
    return fail(Exit::kRefused, "{}: only a JPEG in a file can be cropped", options.picture);
  }
  const auto [x, y, width, height] = options.part;
  const tool::Size size = options.size.width != 0 ? options.size : tool::Size{width, height};
  if (size.width < 1 || size.height < 1) return fail(Exit::kRefused, "an empty part");
  std::vector<uint8_t> words(static_cast<size_t>(size.width) * static_cast<size_t>(size.height) * 2);
  TAVIRPELO_CROPRECT rect{input.header().width, input.header().height, x, y, width, height};
  if (TAVIRPELO_CropFromImage(options.picture.c_str(), &rect, words.data(), size.width, size.height,
                              options.stretch ? TAVIRPELO_FIT_STRETCH : TAVIRPELO_FIT_INSIDE,
                              options.memory << 20) != 1) {
    return fail(Exit::kRefused, "{}: {}", options.picture,
                gTAVIRPELO_Error == TAVIRPELO_ERROR_MEMORY ? "this takes more memory"
                : gTAVIRPELO_Error == TAVIRPELO_ERROR_CROP ? "cannot be decoded"
                                                           : "the part is not inside the picture");
  }
  return tool::write_pnm(options.output, {size.width, size.height, false, rgb_of_words(words)});
}

}  // namespace

void register_crop(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("crop", "Write a part of a JPEG as PPM, in 16-bit colours");
  add_picture_argument(*command, options->picture);
  command->add_option("output", options->output, "PPM file, - for standard output")->required();
  const auto store = [options](const std::string& text) {
    const auto part = parse_numbers<4>(text);
    if (!part || (*part)[2] > tool::kMaxSide || (*part)[3] > tool::kMaxSide) {
      throw CLI::ValidationError(text, "a part is X,Y,WIDTH,HEIGHT");
    }
    options->part = *part;
  };
  command->add_option_function<std::string>("--part", store, "The part of the picture, in pixels")
      ->type_name("X,Y,W,H")
      ->required();
  tool::add_size_argument(*command, "-s,--size", options->size, tool::kMaxSide,
                          "Size of the result (default: the part's)");
  command->add_flag("--stretch", options->stretch,
                    "Exactly the size, instead of as large as fits, centred on black");
  command->add_option("--memory", options->memory, "Most memory for the decoded picture, MiB")
      ->check(CLI::Range(1, 2047))
      ->capture_default_str();
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool

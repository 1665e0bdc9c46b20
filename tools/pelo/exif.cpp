// pelo exif: what the camera noted in a JPEG.
#include "tools/pelo/commands.h"
#include "tools/pelo/exif_text.h"
#include "tools/pelo/input.h"

namespace pelo_tool {
namespace {

struct Options {
  std::string picture;
  bool json = false;
};

Exit run(const Options& options) {
  Input input;
  Exit opened = input.open(options.picture);
  if (opened != Exit::kDone) return opened;
  tool::ExifInfo exif(input.format() == TAVIRPELO_FORMAT_JPEG ? PELOJ_CreatExifInfo(input.info())
                                                              : nullptr);
  if (!exif) return fail(Exit::kRefused, "{}: no EXIF", options.picture);
  if (options.json) {
    fmt::print("{}\n", exif_json(*exif));
  } else {
    fmt::print("{}", exif_lines(*exif, ""));
  }
  return Exit::kDone;
}

}  // namespace

void register_exif(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("exif", "Print the EXIF fields of a JPEG");
  add_picture_argument(*command, options->picture);
  command->add_flag("--json", options->json, "Print JSON");
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool

// vss thumb: a picture decoded at another size, as a JPEG file.
#include <memory>

#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/picture.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

struct Options {
  std::string show;
  int index = 0;
  Size size;
  std::string output;
  int quality = 90;
};

Exit run(const Options& options) {
  SlideShow show;
  Exit result = open_show(show, options.show, Access::kRead);
  if (result == Exit::kDone) result = check_index(show, options.index);
  if (result != Exit::kDone) return result;
  RawImage canvas = create_canvas(options.size, 0);
  if (!canvas || !draw_slide(show, options.index, *canvas, 0, 0, options.size)) {
    return fail(Exit::kCannotOpen, "{}: picture {} cannot be decoded", options.show, options.index);
  }
  return write_jpeg(show, options.output, *canvas, options.quality);
}

}  // namespace

void register_thumb(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command =
      app.add_subcommand("thumb", "Write a picture, fitted into a size on black, as JPEG");
  add_show_argument(*command, options->show);
  command->add_option("index", options->index, "Index of the picture")->required();
  add_size_argument(*command, "size", options->size, kMaxSide, "Size of the result")->required();
  command->add_option("output", options->output, "JPEG file, - for standard output")->required();
  add_quality_option(*command, options->quality);
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss

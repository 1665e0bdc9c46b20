// vss get: a stored picture as it is, a JPEG file.
#include <memory>
#include <vector>

#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/picture.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

struct Options {
  std::string show;
  int index = 0;
  std::string output;
};

Exit run(const Options& options) {
  SlideShow show;
  Exit result = open_show(show, options.show, Access::kRead);
  if (result == Exit::kDone) result = check_index(show, options.index);
  if (result != Exit::kDone) return result;
  std::vector<uint8_t> jpeg(static_cast<size_t>(show.GetSizeOfSubfile(options.index)));
  if (jpeg.empty() || show.GetImage(options.index, jpeg.data()) != 1) {
    return fail(Exit::kCannotOpen, "{}: picture {} cannot be read", options.show, options.index);
  }
  return write_output(show, options.output, jpeg.data(), jpeg.size());
}

}  // namespace

void register_get(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("get", "Write a stored picture as a JPEG file");
  add_show_argument(*command, options->show);
  command->add_option("index", options->index, "Index of the picture")->required();
  command->add_option("output", options->output, "JPEG file, - for standard output")->required();
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss

// vss remove: pictures out of the show, all at once. Marks for removal end with the process, so marking
// alone would do nothing.
#include <memory>
#include <vector>

#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

struct Options {
  std::string show;
  std::vector<int> indices;
};

Exit run(const Options& options) {
  SlideShow show;
  Exit result = open_show(show, options.show, Access::kEdit);
  if (result != Exit::kDone) return result;
  for (int index : options.indices) {
    result = check_index(show, index);
    if (result != Exit::kDone) return result;
    show.RemoveImage(index);
  }
  if (show.RemoveSubfile() != 1) {
    return fail(Exit::kWriteFailure, "{}: cannot be written", options.show);
  }
  return Exit::kDone;
}

}  // namespace

void register_remove(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("remove", "Remove pictures; those behind them move up");
  add_show_argument(*command, options->show);
  command->add_option("indices", options->indices, "Indices as listed before")->required();
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss

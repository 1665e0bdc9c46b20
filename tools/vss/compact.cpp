// vss compact: the file without what earlier edits left behind.
#include <memory>

#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

Exit run(const std::string& path) {
  SlideShow show;
  Exit opened = open_show(show, path, Access::kEdit);
  if (opened != Exit::kDone) return opened;
  if (show.RemoveSubfile() != 1) return fail(Exit::kWriteFailure, "{}: cannot be written", path);
  return Exit::kDone;
}

}  // namespace

void register_compact(CLI::App& app, Exit& result) {
  auto path = std::make_shared<std::string>();
  CLI::App* command =
      app.add_subcommand("compact", "Rewrite the headers and drop what earlier edits left behind");
  add_show_argument(*command, *path);
  command->callback([path, &result] { result = run(*path); });
}

}  // namespace vss

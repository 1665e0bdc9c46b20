// vss list: the pictures of a show, as a table or as JSON.
#include <memory>

#include "tools/common/text.h"
#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

struct Options {
  std::string show;
  bool json = false;
};

void print_table(const SlideShow& show) {
  fmt::print("{:>5}  {:<36}  {:>9}  {:>8}  {}\n", "index", "name", "size", "bytes", "source");
  for (int i = 0; i < show.subfileCount; ++i) {
    const subfileInfo& entry = show.subfiles[i];
    fmt::print("{:>5}  {:<36}  {:>9}  {:>8}  {}\n", i, tool::printable(entry.name),
               fmt::format("{}x{}", entry.width, entry.height), show.GetSizeOfSubfile(i),
               tool::printable(entry.path));
  }
}

void print_json(const SlideShow& show) {
  fmt::print("{{\"width\": {}, \"height\": {}, \"musicBytes\": {}, \"pictures\": [", show.width,
             show.height, show.GetMusicSize());
  for (int i = 0; i < show.subfileCount; ++i) {
    const subfileInfo& entry = show.subfiles[i];
    fmt::print(
        "{}\n  {{\"index\": {}, \"name\": {}, \"source\": {}, \"width\": {}, \"height\": {}, "
        "\"bytes\": {}, \"offset\": {}}}",
        i == 0 ? "" : ",", i, tool::json_text(entry.name), tool::json_text(entry.path), entry.width,
        entry.height, show.GetSizeOfSubfile(i), entry.offset);
  }
  fmt::print("]}}\n");
}

Exit run(const Options& options) {
  SlideShow show;
  Exit opened = open_show(show, options.show, Access::kRead);
  if (opened != Exit::kDone) return opened;
  options.json ? print_json(show) : print_table(show);
  return Exit::kDone;
}

}  // namespace

void register_list(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("list", "List the pictures");
  add_show_argument(*command, options->show);
  command->add_flag("--json", options->json, "Print JSON");
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss

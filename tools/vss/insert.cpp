// vss insert: one picture in front of another.
#include <memory>
#include <optional>

#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/picture_source.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

struct Options {
  std::string show;
  int position = 0;
  std::string picture;
  std::optional<std::string> name;
};

Exit run(const Options& options) {
  SlideShow show;
  Exit opened = open_show(show, options.show, Access::kEdit);
  if (opened != Exit::kDone) return opened;
  if (options.position < 0 || options.position > show.subfileCount) {
    return fail(Exit::kRefused, "{}: position {} is not within 0 to {}", options.show, options.position,
                show.subfileCount);
  }
  std::string name = options.name.value_or(default_name(options.picture));
  print_added_heading();
  return add_picture(show, options.picture, options.position, [&] {
    return show.InsertImageToFile(options.picture.c_str(), name.c_str(), options.position);
  });
}

}  // namespace

void register_insert(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("insert", "Insert a picture in front of another");
  add_show_argument(*command, options->show);
  command->add_option("position", options->position, "Index that the picture gets")->required();
  command->add_option("picture", options->picture, "Picture file")->required();
  command->add_option("-n,--name", options->name,
                      "Name of the picture; the file name without extension otherwise");
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss

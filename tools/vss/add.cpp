// vss add: pictures behind those that the show has.
#include <memory>

#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/picture_source.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

struct Options {
  std::string show;
  std::vector<std::string> pictures;
  std::vector<std::string> names;  // of the first pictures, in order
};

Exit add_one(SlideShow& show, const Options& options, size_t i) {
  const std::string& path = options.pictures[i];
  std::string name = i < options.names.size() ? options.names[i] : default_name(path);
  return add_picture(show, path, show.subfileCount,
                     [&] { return show.AddImageToFile(path.c_str(), name.c_str()); });
}

// A picture that is refused does not keep out those behind it; a file that cannot be written does. The
// first failure is the result.
Exit run(const Options& options) {
  if (options.names.size() > options.pictures.size()) {
    return fail(Exit::kUsage, "more names than pictures");
  }
  SlideShow show;
  Exit result = open_show(show, options.show, Access::kEdit);
  if (result != Exit::kDone) return result;
  print_added_heading();
  for (size_t i = 0; i < options.pictures.size(); ++i) {
    Exit added = add_one(show, options, i);
    if (result == Exit::kDone) result = added;
    if (added == Exit::kWriteFailure) break;
  }
  return result;
}

}  // namespace

void register_add(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("add", "Add pictures at the end");
  add_show_argument(*command, options->show);
  command->add_option("pictures", options->pictures, "Picture files")->required();
  command
      ->add_option(
          "-n,--name", options->names,
          "Name of a picture, once for each in order; the file name without extension otherwise")
      ->allow_extra_args(false);
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss

// vss create: an empty show.
#include <filesystem>
#include <memory>

#include "slideshow/SlideShow.h"
#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"

namespace vss {
namespace {

struct Options {
  std::string show;
  Size size{480, 480};
  bool force = false;
};

// Creating a show deletes what stood at its path, so that is done on request and to plain files only.
Exit check_target(const Options& options) {
  std::error_code ignored;
  auto status = std::filesystem::symlink_status(options.show, ignored);
  if (!std::filesystem::exists(status)) return Exit::kDone;
  if (!std::filesystem::is_regular_file(status)) {
    return fail(Exit::kRefused, "{}: exists and is not a plain file", options.show);
  }
  if (!options.force) {
    return fail(Exit::kRefused, "{}: exists; --force replaces it", options.show);
  }
  return Exit::kDone;
}

Exit run(const Options& options) {
  Exit target = check_target(options);
  if (target != Exit::kDone) return target;
  SlideShow show;
  bool created = show.CreateShow(options.show.c_str(), options.size.width, options.size.height) == 1;
  // The end mark makes the still empty show one that can be opened.
  if (!created || show.writeEndMark() != 1) {
    return fail(Exit::kWriteFailure, "{}: cannot be written", options.show);
  }
  fmt::print("{}: {}x{}\n", options.show, show.width, show.height);
  return Exit::kDone;
}

}  // namespace

void register_create(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("create", "Create an empty show");
  add_show_argument(*command, options->show);
  add_size_argument(*command, "-s,--size", options->size, 5000, "Largest size of a stored picture")
      ->default_str("480x480");
  command->add_flag("-f,--force", options->force, "Replace an existing file");
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss

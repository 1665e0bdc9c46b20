// vss: makes, edits and reads slide-show files from the command line.
#include <cstdio>
#include <exception>

#include "tools/vss/commands.h"

namespace {

constexpr vss::Register kCommands[] = {
    vss::register_create, vss::register_add,   vss::register_insert, vss::register_list,
    vss::register_get,    vss::register_thumb, vss::register_sheet,  vss::register_settings,
};

constexpr char kFooter[] =
    "Results go to standard output, messages to standard error.\n"
    "Exit codes: 0 done, 2 usage, 3 cannot open, 4 refused, 5 write failure.\n"
    "`vss COMMAND --help` explains a command.";

// Help and version are results; everything else that ends the reading early is a usage error.
int report(const CLI::App& app, const CLI::ParseError& error) {
  bool asked = app.exit(error) == 0;
  return static_cast<int>(asked ? vss::Exit::kDone : vss::Exit::kUsage);
}

}  // namespace

int main(int argc, char** argv) {
  CLI::App app{"Slide shows in one file: up to 20 pictures with settings.", "vss"};
  app.set_version_flag("--version", "vss " VSS_VERSION);
  app.require_subcommand(1);
  app.footer(kFooter);
  vss::Exit result = vss::Exit::kDone;
  for (vss::Register add : kCommands) add(app, result);
  try {
    app.parse(argc, argv);
  } catch (const CLI::ParseError& error) {
    result = static_cast<vss::Exit>(report(app, error));
  } catch (const std::exception& error) {  // no memory, a locale or file system that misbehaves
    result = vss::fail(vss::Exit::kRefused, "{}", error.what());
  }
  // Results that did not reach standard output were not delivered.
  bool lost = std::ferror(stdout) != 0;
  if (std::fflush(stdout) != 0 || lost) {
    result = vss::fail(vss::Exit::kWriteFailure, "cannot write to standard output");
  }
  return static_cast<int>(result);
}

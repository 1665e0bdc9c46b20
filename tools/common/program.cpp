#include "tools/common/program.h"

#include <cstdio>
#include <exception>

namespace tool {
namespace {

// Help and version are results; everything else that ends the reading early is a usage error.
Exit report(const CLI::App& app, const CLI::ParseError& error) {
  bool asked = app.exit(error) == 0;
  return asked ? Exit::kDone : Exit::kUsage;
}

}  // namespace

std::string footer() {
  return fmt::format(
      "Results go to standard output, messages to standard error.\n"
      "Exit codes: 0 done, 2 usage, 3 cannot open, 4 refused, 5 write failure.\n"
      "`{} COMMAND --help` explains a command.",
      kProgram);
}

int run(CLI::App& app, std::span<const Register> commands, int argc, char** argv) {
  Exit result = Exit::kDone;
  app.require_subcommand(1);
  for (Register add : commands) add(app, result);
  try {
    app.parse(argc, argv);
  } catch (const CLI::ParseError& error) {
    result = report(app, error);
  } catch (const std::exception& error) {  // no memory, a locale or file system that misbehaves
    result = fail(Exit::kRefused, "{}", error.what());
  }
  // Results that did not reach standard output were not delivered.
  bool lost = std::ferror(stdout) != 0;
  if (std::fflush(stdout) != 0 || lost) {
    result = fail(Exit::kWriteFailure, "cannot write to standard output");
  }
  return static_cast<int>(result);
}

}  // namespace tool

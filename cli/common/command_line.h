#pragma once

#include <CLI/CLI.hpp>
#include <functional>
#include <string>
#include <vector>

#include "cli/common/exit_code.h"

namespace pelorin::cli {

/// The quenby command: a list of verbs, of which one runs.
///
/// A verb is one file with one function that adds it:
///
///     void addInfo(CommandLine& commandLine) {
///       auto options = std::make_shared<InfoOptions>();
///       CLI::App* verb = commandLine.addVerb("info", "What a photo holds", "quenby info a.jpg\n",
///                                            [options] { return runInfo(*options); });
///       verb->add_option(...);
///     }
class CommandLine {
 public:
  CommandLine();

  /// Adds a verb.
  /// @param examples  whole commands, one a line, shown at the end of `--help`.
  /// @param work      runs once the command line has been read. A `UsageError` out of it ends with
  ///                  exit code 2, any other exception with 1, each with its one line.
  /// @returns the verb, for its options; lives as long as this.
  CLI::App* addVerb(const std::string& name, const std::string& summary,
                    const std::string& examples, std::function<ExitCode()> work);

  /// Reads the arguments and runs the verb they name.
  ExitCode run(int argc, char** argv);

 private:
  struct Verb {
    CLI::App* app;
    std::function<ExitCode()> work;
  };

  ExitCode refuse(const std::string& message, const CLI::App* verb) const;
  std::vector<std::string> verbNames() const;

  CLI::App app_;
  std::vector<Verb> verbs_;
};

}  // namespace pelorin::cli

#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "cli/frame/command_text.h"
#include "cli/frame/exit_code.h"
#include "cli/frame/verb.h"

namespace pelorin::cli {

/// The quenby command: a list of verbs, of which one runs.
///
/// A verb is one file with one function that adds it:
///
///     void addInfo(CommandLine& commandLine) {
///       auto options = std::make_shared<InfoOptions>();
///       Verb verb = commandLine.addVerb("info", "What a photo holds", "quenby info a.jpg\n",
///                                          [options] { return runInfo(*options); });
///       verb.option(...);
///     }
class CommandLine {
 public:
  CommandLine();
  ~CommandLine();

  /// Adds a verb.
  /// @param examples  whole commands, one a line, shown at the end of `--help`.
  /// @param work      runs once the command line has been read. A `UsageError` out of it ends with
  ///                  exit code 2, any other exception with 1, each with its one line.
  /// @returns the verb, for its options; lives as long as this.
  Verb addVerb(const std::string& name, const std::string& summary, const std::string& examples,
               std::function<ExitCode()> work);

  /// Hides a verb that is no user's from the help.
  void hide(const std::string& name);

  /// The help of everything added so far that is not hidden.
  CommandText text() const;

  /// What arguments come to before anything is done.
  struct Reading {
    bool runs = false;  ///< A verb is to run. Else:
    ExitCode code = ExitCode::usage;
    std::string answer = {};   ///< What was asked for, such as the help.
    std::string refusal = {};  ///< What is said of arguments that mean nothing: a line.
  };

  /// Reads arguments, into what the options of verbs refer to.
  /// @param arguments  without the name of the command.
  Reading read(std::vector<std::string> arguments);

  /// Reads the arguments and runs the verb they name.
  ExitCode run(int argc, char** argv);

 private:
  struct Work {
    CLI::App* verb;
    std::vector<std::string> examples;
    std::function<ExitCode()> run;
    bool hidden = false;
  };

  const Work* chosen() const;
  std::vector<std::string> verbNames() const;

  std::unique_ptr<CLI::App> app_;
  std::vector<Work> verbs_;
};

}  // namespace pelorin::cli

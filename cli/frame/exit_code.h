#pragma once

namespace pelorin::cli {

/// What the command leaves to the shell.
enum class ExitCode {
  allDone = 0,
  someFailed = 1,    ///< At least one file was not done; each has a line on stderr.
  usage = 2,         ///< The command line was refused before any work.
  nothingToDo = 3,   ///< No input that anything could be done with, or every output exists.
  aboveLimit = 4,    ///< A measurement is above the limit that the user set.
  interrupted = 130  ///< Ctrl-C; finished files stand, nothing is half-written.
};

}  // namespace pelorin::cli

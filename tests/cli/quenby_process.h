#pragma once

#include <sys/types.h>

#include <string>
#include <vector>

#include "tests/support/temporary_folder.h"

namespace pelorin::test_support {

/// What a finished command left behind.
struct Finished {
  int exitCode;  ///< 128 + signal when a signal ended it, as a shell says it.
  std::string output, errors;
};

/// A command that runs beside the test.
class Process {
 public:
  /// @param standardInput  a descriptor to read from; stays the caller's.
  Process(const std::vector<std::string>& command, int standardInput);
  ~Process();
  Process(const Process&) = delete;
  Process& operator=(const Process&) = delete;

  void send(int signal);
  Finished wait();

 private:
  TemporaryFolder folder_;
  pid_t id_ = -1;
};

/// The path of the command: the built one, unless QUENBY_COMMAND in the environment names another.
std::string quenbyPath();

/// Runs `quenby` with these arguments and input.
Finished quenby(const std::vector<std::string>& arguments, const Bytes& input = {});

/// Runs a shell command, in which $QUENBY is the built command.
Finished shell(const std::string& command);

}  // namespace pelorin::test_support

#pragma once

#include <exception>
#include <stdexcept>
#include <string>

namespace pelorin::cli {

/// The command line cannot mean anything: nothing is done and the exit code is 2. `what()` is one
/// line that says what to do instead.
class UsageError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// One file cannot be done; `what()` is one clause without the file's name.
class FileError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// One clause for a user from whatever a verb's work has thrown: full memory, a missing file, a
/// damaged photo, a full disk.
std::string explain(const std::exception& error);

}  // namespace pelorin::cli

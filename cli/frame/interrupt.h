#pragma once

#include <exception>

namespace pelorin::cli {

/// Thrown by work that stops because of Ctrl-C.
class Interrupted : public std::exception {
 public:
  const char* what() const noexcept override { return "interrupted"; }
};

/// From here on SIGINT and SIGTERM only set a mark, so that no file is left half-written.
void installInterruptHandler();

/// Whether the command was asked to stop. Any thread may ask.
bool interruptRequested();

/// To be called between the steps of a job.
/// @throws Interrupted when the command was asked to stop.
void stopIfInterrupted();

}  // namespace pelorin::cli

#pragma once

#include <stop_token>

#include "photo/photo_error.h"

namespace pelorin::cli {

/// Thrown by work that stops because of Ctrl-C.
using Interrupted = photo::Stopped;

/// From here on SIGINT and SIGTERM only set a mark, so that no file is left half-written.
void installInterruptHandler();

/// The mark, for work that is asked to stop by a token.
std::stop_token interruptToken();

/// Whether the command was asked to stop. Any thread may ask.
bool interruptRequested();

/// To be called between the steps of a job.
/// @throws Interrupted when the command was asked to stop.
void stopIfInterrupted();

}  // namespace pelorin::cli

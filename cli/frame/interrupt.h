#pragma once

#include <stop_token>

#include "photo/photo_error.h"

namespace pelorin::cli {

/// Thrown by work that stops because of Ctrl-C.
using Interrupted = photo::Stopped;

/// From here on SIGINT and SIGTERM set a mark, for work to stop and tell what is finished. Half a
/// second later, or on a second one, the process ends wherever it is; no file is left half-written.
void installInterruptHandler();

/// What a forced end still writes to standard output, such as the end of a list; null for nothing. The
/// text lives on.
void setLastWords(const char* text);

/// The mark, for work that is asked to stop by a token.
std::stop_token interruptToken();

/// Whether the command was asked to stop. Any thread may ask.
bool interruptRequested();

/// To be called between the steps of a job.
/// @throws Interrupted when the command was asked to stop.
void stopIfInterrupted();

}  // namespace pelorin::cli

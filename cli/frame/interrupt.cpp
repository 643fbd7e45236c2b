#include "cli/frame/interrupt.h"

#include <signal.h>

#include <atomic>

namespace pelorin::cli {
namespace {

std::atomic<bool> requested = false;
static_assert(std::atomic<bool>::is_always_lock_free);

void onSignal(int) {
  requested = true;
}

}  // namespace

void installInterruptHandler() {
  struct sigaction action = {};
  action.sa_handler = onSignal;  // without SA_RESTART, so that a blocking read returns
  sigaction(SIGINT, &action, nullptr);
  sigaction(SIGTERM, &action, nullptr);
}

bool interruptRequested() {
  return requested;
}

void stopIfInterrupted() {
  if (requested) throw Interrupted();
}

}  // namespace pelorin::cli

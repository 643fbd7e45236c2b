#include "cli/frame/interrupt.h"

#include <signal.h>

namespace pelorin::cli {
namespace {

std::stop_source source;

// Nobody registers a callback with the token, so that this is a change of one lock-free number.
void onSignal(int) {
  source.request_stop();
}

}  // namespace

void installInterruptHandler() {
  struct sigaction action = {};
  action.sa_handler = onSignal;  // without SA_RESTART, so that a blocking read returns
  sigaction(SIGINT, &action, nullptr);
  sigaction(SIGTERM, &action, nullptr);
}

std::stop_token interruptToken() {
  return source.get_token();
}

bool interruptRequested() {
  return source.stop_requested();
}

void stopIfInterrupted() {
  if (interruptRequested()) throw Interrupted();
}

}  // namespace pelorin::cli

#include "cli/frame/interrupt.h"

#include <signal.h>
#include <sys/time.h>
#include <unistd.h>

#include <atomic>
#include <string_view>

#include "cli/frame/exit_code.h"
#include "photo/temporaries.h"

namespace pelorin::cli {
namespace {

std::stop_source source;
thread_local const photo::TimeLimit* timeOfThisThread = nullptr;
std::atomic<const char*> lastWords = nullptr;
static_assert(std::atomic<const char*>::is_always_lock_free);

void write(int descriptor, std::string_view text) {
  [[maybe_unused]] const ssize_t said = ::write(descriptor, text.data(), text.size());
}

// Nothing is half-written when a process ends anywhere: files take their place in one step.
void leave(int) {
  photo::removeTemporaries();
  if (const char* const words = lastWords) write(STDOUT_FILENO, words);
  write(STDERR_FILENO, "\ninterrupted; finished files stand\n");
  ::_exit(static_cast<int>(ExitCode::interrupted));
}

// Nobody registers a callback with the token, so that this is a change of one lock-free number.
void onSignal(int signal) {
  if (source.stop_requested()) leave(signal);
  source.request_stop();
  // What is at work gets half a second to come to a stop of its own.
  const itimerval soon = {{0, 0}, {0, 500'000}};
  ::setitimer(ITIMER_REAL, &soon, nullptr);
}

void handle(int signal, void (*handler)(int)) {
  struct sigaction action = {};
  action.sa_handler = handler;  // without SA_RESTART, so that a blocking read returns
  sigemptyset(&action.sa_mask);
  for (const int other : {SIGINT, SIGTERM, SIGALRM}) sigaddset(&action.sa_mask, other);
  sigaction(signal, &action, nullptr);
}

}  // namespace

void installInterruptHandler() {
  handle(SIGINT, onSignal);
  handle(SIGTERM, onSignal);
  handle(SIGALRM, leave);
}

void setLastWords(const char* text) {
  lastWords = text;
}

TimeLimited::TimeLimited(std::uint32_t seconds) {
  if (seconds == 0) return;
  limit_.emplace(std::chrono::seconds(seconds), source.get_token());
  timeOfThisThread = &*limit_;
}

TimeLimited::~TimeLimited() {
  timeOfThisThread = nullptr;
}

std::stop_token interruptToken() {
  return timeOfThisThread != nullptr ? timeOfThisThread->token() : source.get_token();
}

bool interruptRequested() {
  return source.stop_requested();
}

void stopIfInterrupted() {
  if (interruptToken().stop_requested()) throw Interrupted();
}

}  // namespace pelorin::cli

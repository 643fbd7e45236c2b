#include <unistd.h>

#include <atomic>
#include <cstdlib>
#include <exception>
#include <new>
#include <string_view>

#include "cli/frame/exit_code.h"

namespace pelorin::cli {
namespace {

std::atomic<bool> ranOut = false;
std::terminate_handler usual = nullptr;

void remember() {
  ranOut = true;
  throw std::bad_alloc();
}

// Memory can run out where nothing catches: in tables that are made before `main`, while options
// are set up, in functions of the C++ library that promise not to throw, which do not say what was thrown.
[[noreturn]] void leave() {
  if (!ranOut) {
    usual();
    std::abort();
  }
  constexpr std::string_view message = "quenby: not enough memory\n";
  [[maybe_unused]] const auto written = ::write(STDERR_FILENO, message.data(), message.size());
  std::_Exit(static_cast<int>(ExitCode::someFailed));
}

// Before every other initialiser of the program.
[[gnu::constructor(101)]] void install() {
  std::set_new_handler(remember);
  usual = std::set_terminate(leave);
}

}  // namespace
}  // namespace pelorin::cli

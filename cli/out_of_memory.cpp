#include <unistd.h>

#include <cstdlib>
#include <exception>
#include <new>
#include <string_view>

#include "cli/frame/exit_code.h"

namespace pelorin::cli {
namespace {

// Memory can run out where nothing catches: in tables that are made before `main`, while options
// are set up. Nothing has been written by then.
[[noreturn]] void leave() {
  try {
    if (const std::exception_ptr error = std::current_exception()) std::rethrow_exception(error);
  } catch (const std::bad_alloc&) {
    constexpr std::string_view message = "quenby: not enough memory\n";
    [[maybe_unused]] const auto written = ::write(STDERR_FILENO, message.data(), message.size());
    std::_Exit(static_cast<int>(ExitCode::someFailed));
  } catch (...) {
    std::abort();
  }
  std::abort();
}

// Before every other initialiser of the program.
[[gnu::constructor(101)]] void install() {
  std::set_terminate(leave);
}

}  // namespace
}  // namespace pelorin::cli

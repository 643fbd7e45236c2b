#include <emscripten/emscripten.h>

#include <exception>
#include <new>
#include <string>

#include "photo/selftest.h"

/// The table of `quenby selftest`, without its first line; lives as long as the module. Empty when there
/// is not enough memory.
extern "C" EMSCRIPTEN_KEEPALIVE const char* quenby_wasm_selftest() noexcept {
  try {
    static const std::string table = pelorin::photo::selftestTable();
    return table.c_str();
  } catch (const std::exception&) {
    return "";
  }
}

#include <dlfcn.h>
#include <sqlite3.h>

#include <string>

#include "cli/frame/errors.h"

// SQLite's library is loaded when a database is opened: of all it took the longest to load, and most
// runs of the command open none. What is called of it is defined here instead of being linked.

namespace pelorin::cli {
namespace {

template <typename Function>
Function* inLibrary(Function&, const char* name) {
  static void* const library = ::dlopen("libsqlite3.so.0", RTLD_NOW | RTLD_LOCAL);
  void* const function = library == nullptr ? nullptr : ::dlsym(library, name);
  if (function != nullptr) return reinterpret_cast<Function*>(function);
  const char* const reason = ::dlerror();
  throw FileError("no cache and no list of photos can be opened without libsqlite3.so.0" +
                  (reason == nullptr ? std::string() : ": " + std::string(reason)));
}

}  // namespace
}  // namespace pelorin::cli

// clang-format off
#define FORWARD(Result, name, parameters, arguments)                    \
  Result name parameters {                                              \
    static auto* const function = pelorin::cli::inLibrary(name, #name); \
    return function arguments;                                          \
  }

using Statement = sqlite3_stmt;
using Release = void (*)(void*);
using Row = int (*)(void*, int, char**, char**);
using Int64 = sqlite3_int64;

FORWARD(int, sqlite3_bind_blob, (Statement* s, int i, const void* v, int n, Release r), (s, i, v, n, r))
FORWARD(int, sqlite3_bind_blob64, (Statement* s, int i, const void* v, sqlite3_uint64 n, Release r),
        (s, i, v, n, r))
FORWARD(int, sqlite3_bind_double, (Statement* s, int i, double v), (s, i, v))
FORWARD(int, sqlite3_bind_int, (Statement* s, int i, int v), (s, i, v))
FORWARD(int, sqlite3_bind_int64, (Statement* s, int i, Int64 v), (s, i, v))
FORWARD(int, sqlite3_bind_text, (Statement* s, int i, const char* v, int n, Release r), (s, i, v, n, r))
FORWARD(int, sqlite3_busy_timeout, (sqlite3* d, int milliseconds), (d, milliseconds))
FORWARD(int, sqlite3_clear_bindings, (Statement* s), (s))
FORWARD(int, sqlite3_close, (sqlite3* d), (d))
FORWARD(const void*, sqlite3_column_blob, (Statement* s, int i), (s, i))
FORWARD(int, sqlite3_column_bytes, (Statement* s, int i), (s, i))
FORWARD(double, sqlite3_column_double, (Statement* s, int i), (s, i))
FORWARD(int, sqlite3_column_int, (Statement* s, int i), (s, i))
FORWARD(Int64, sqlite3_column_int64, (Statement* s, int i), (s, i))
FORWARD(const unsigned char*, sqlite3_column_text, (Statement* s, int i), (s, i))
FORWARD(int, sqlite3_column_type, (Statement* s, int i), (s, i))
FORWARD(const char*, sqlite3_errstr, (int code), (code))
FORWARD(int, sqlite3_exec, (sqlite3* d, const char* sql, Row row, void* v, char** error),
        (d, sql, row, v, error))
FORWARD(int, sqlite3_finalize, (Statement* s), (s))
FORWARD(const char*, sqlite3_libversion, (), ())
FORWARD(int, sqlite3_open_v2, (const char* file, sqlite3** d, int flags, const char* system),
        (file, d, flags, system))
FORWARD(int, sqlite3_prepare_v2,
        (sqlite3* d, const char* sql, int n, Statement** s, const char** tail), (d, sql, n, s, tail))
FORWARD(int, sqlite3_reset, (Statement* s), (s))
FORWARD(int, sqlite3_step, (Statement* s), (s))

#include "photo/collection/database.h"

#include <fcntl.h>
#include <sqlite3.h>
#include <unistd.h>

#include <utility>

namespace pelorin::photo {

void Database::Close::operator()(sqlite3* database) const {
  sqlite3_close(database);
}
void Database::Close::operator()(sqlite3_stmt* statement) const {
  sqlite3_finalize(statement);
}

Database::Database(const std::string& file, int millisecondsToWait, Fail fail)
    : fail_(std::move(fail)) {
  // A new one is its user's alone, and so is what SQLite puts beside it.
  const int made = ::open(file.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
  if (made >= 0) ::close(made);
  sqlite3* database = nullptr;
  const int code =
      sqlite3_open_v2(file.c_str(), &database, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE, nullptr);
  database_.reset(database);
  check(code);
  check(sqlite3_busy_timeout(database, millisecondsToWait));
}

void Database::execute(const char* sql) {
  check(sqlite3_exec(database_.get(), sql, nullptr, nullptr, nullptr));
}

bool Database::succeeds(const char* sql) {
  return sqlite3_exec(database_.get(), sql, nullptr, nullptr, nullptr) == SQLITE_OK;
}

std::int64_t Database::number(const char* sql) {
  const Statement statement = prepare(sql);
  return step(statement.get()) ? sqlite3_column_int64(statement.get(), 0) : 0;
}

Database::Statement Database::prepare(const char* sql) {
  sqlite3_stmt* statement = nullptr;
  check(sqlite3_prepare_v2(database_.get(), sql, -1, &statement, nullptr));
  return Statement(statement);
}

void Database::check(int code) {
  if (code != SQLITE_OK) fail_(code);
}

bool Database::step(sqlite3_stmt* statement) {
  const int code = sqlite3_step(statement);
  if (code != SQLITE_ROW && code != SQLITE_DONE) fail_(code);
  return code == SQLITE_ROW;
}

StatementUse::~StatementUse() {
  sqlite3_reset(statement_);
  sqlite3_clear_bindings(statement_);
}

}  // namespace pelorin::photo

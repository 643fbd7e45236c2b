#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

struct sqlite3;
struct sqlite3_stmt;

namespace pelorin::photo {

/// A SQLite file. One object serves one thread.
class Database {
 public:
  struct Close {
    void operator()(sqlite3* database) const;
    void operator()(sqlite3_stmt* statement) const;
  };
  using Statement = std::unique_ptr<sqlite3_stmt, Close>;
  /// Is told what SQLite says and throws what the caller is to see.
  using Fail = std::function<void(int code)>;

  /// Opens the file or makes a new one.
  Database(const std::string& file, int millisecondsToWait, Fail fail);

  /// Runs statements.
  void execute(const char* sql);
  /// The same for what need not succeed.
  bool succeeds(const char* sql);
  /// The number that a statement gives first; 0 where it gives none.
  std::int64_t number(const char* sql);
  Statement prepare(const char* sql);
  /// For what SQLite's other functions return, such as those that bind values.
  void check(int code);
  /// @returns whether there is a row.
  bool step(sqlite3_stmt* statement);

 private:
  Fail fail_;
  std::unique_ptr<sqlite3, Close> database_;
};

/// Makes a statement ready for its next use on every way out.
class StatementUse {
 public:
  explicit StatementUse(sqlite3_stmt* statement) : statement_(statement) {}
  ~StatementUse();
  StatementUse(const StatementUse&) = delete;
  StatementUse& operator=(const StatementUse&) = delete;

 private:
  sqlite3_stmt* statement_;
};

}  // namespace pelorin::photo

#include "photo/collection/ledger.h"

#include <fmt/format.h>
#include <sqlite3.h>

#include <cerrno>
#include <filesystem>
#include <utility>

#include "photo/file_io.h"

namespace fs = std::filesystem;

namespace pelorin::photo {
namespace {

constexpr int applicationId = 0x51426C67;  // "QBlg": whose file it is
constexpr int layoutVersion = 1;

constexpr const char* makeTable =
    "CREATE TABLE photos ("
    "  path BLOB PRIMARY KEY, bytes INTEGER NOT NULL, modified INTEGER NOT NULL,"
    "  result BLOB NOT NULL, resultBytes INTEGER, resultModified INTEGER,"
    "  begun INTEGER NOT NULL) WITHOUT ROWID";
constexpr const char* allPhotos =
    "SELECT path, bytes, modified, result, resultBytes, resultModified, begun FROM photos";
constexpr const char* putPhoto = "REPLACE INTO photos VALUES (?1, ?2, ?3, ?4, ?5, ?6, ?7)";

struct Unusable {
  int code;
};

std::string blob(sqlite3_stmt* statement, int column) {
  const void* const bytes = sqlite3_column_blob(statement, column);
  const int size = sqlite3_column_bytes(statement, column);
  if (bytes == nullptr && size > 0) throw Unusable{SQLITE_NOMEM};
  return {static_cast<const char*>(bytes), bytes == nullptr ? 0 : static_cast<std::size_t>(size)};
}

int bind(sqlite3_stmt* statement, int column, const std::string& bytes) {
  return sqlite3_bind_blob64(statement, column, bytes.data(), bytes.size(), SQLITE_TRANSIENT);
}

}  // namespace

Ledger::Ledger(const std::string& file, LedgerUse use) : file_(file) {
  const bool looks = use == LedgerUse::look;
  for (const bool again : {false, true}) {
    try {
      looks ? look() : open();
      return;
    } catch (const Unusable& reason) {
      put_.reset();
      database_.reset();
      entries_.clear();
      if (reason.code == SQLITE_BUSY) {
        throw LedgerInUse(file_ + ": is in use by another process that watches for this folder");
      }
      const bool isDamaged = reason.code == SQLITE_CORRUPT || reason.code == SQLITE_NOTADB ||
                             reason.code == SQLITE_ERROR;
      if (!isDamaged || again || looks) {
        trouble(sqlite3_errstr(reason.code));
        return;
      }
      setAside();
    }
  }
}

void Ledger::open() {
  database_.emplace(file_, /*millisecondsToWait=*/0, [](int code) { throw Unusable{code}; });
  // From the first lock on until the file is closed.
  database_->execute("PRAGMA locking_mode = EXCLUSIVE");
  database_->execute("BEGIN EXCLUSIVE");
  if (database_->number("SELECT count(*) FROM sqlite_master") == 0) {
    database_->execute(makeTable);
    database_->execute(fmt::format("PRAGMA application_id = {}", applicationId).c_str());
    database_->execute(fmt::format("PRAGMA user_version = {}", layoutVersion).c_str());
  }
  database_->execute("COMMIT");
  check();
  read();
  put_ = database_->prepare(putPhoto);
}

void Ledger::look() {
  std::error_code ignored;
  if (!fs::exists(file_, ignored)) return;
  database_.emplace(file_, /*millisecondsToWait=*/0, [](int code) { throw Unusable{code}; });
  check();
  read();
  database_.reset();
}

void Ledger::check() {
  if (database_->number("PRAGMA application_id") != applicationId ||
      database_->number("PRAGMA user_version") != layoutVersion) {
    throw Unusable{SQLITE_NOTADB};
  }
  const Database::Statement check = database_->prepare("PRAGMA integrity_check(1)");
  if (!database_->step(check.get()) || blob(check.get(), 0) != "ok") {
    throw Unusable{SQLITE_CORRUPT};
  }
}

void Ledger::read() {
  const Database::Statement all = database_->prepare(allPhotos);
  sqlite3_stmt* const row = all.get();
  while (database_->step(row)) {
    LedgerEntry entry{};
    entry.photo = {static_cast<std::uint64_t>(sqlite3_column_int64(row, 1)),
                   sqlite3_column_int64(row, 2)};
    entry.result = blob(row, 3);
    if (sqlite3_column_type(row, 4) != SQLITE_NULL) {
      entry.stamp = {static_cast<std::uint64_t>(sqlite3_column_int64(row, 4)),
                     sqlite3_column_int64(row, 5)};
    }
    entry.begun = sqlite3_column_int(row, 6) != 0;
    entries_.insert_or_assign(blob(row, 0), std::move(entry));
  }
}

void Ledger::setAside() {
  for (int number = 1; number < 1000; ++number) {
    const std::string aside = fmt::format("{}.damaged-{}", file_, number);
    if (renameToNew(file_.c_str(), aside.c_str()) == 0) {
      std::error_code ignored;
      fs::remove(file_ + "-journal", ignored);  // of no use without the rest
      trouble_ = fmt::format("{}: is damaged or no ledger; set aside as {}", file_, aside);
      return;
    }
    if (errno != EEXIST) return;
  }
}

void Ledger::trouble(const std::string& what) {
  put_.reset();
  database_.reset();
  trouble_ = fmt::format("{}: cannot be used: {}; what is done now counts until this run ends",
                         file_, what);
}

std::string Ledger::takeTrouble() {
  return std::exchange(trouble_, {});
}

const LedgerEntry* Ledger::find(const std::string& photo) const {
  const auto found = entries_.find(photo);
  return found == entries_.end() ? nullptr : &found->second;
}

void Ledger::put(const std::string& photo, const LedgerEntry& entry) {
  put(std::map<std::string, LedgerEntry>{{photo, entry}});
}

void Ledger::put(const std::map<std::string, LedgerEntry>& entries) {
  for (const auto& [photo, entry] : entries) entries_.insert_or_assign(photo, entry);
  if (!database_ || entries.empty()) return;
  try {
    database_->execute("BEGIN");
    for (const auto& [photo, entry] : entries) write(photo, entry);
    database_->execute("COMMIT");
  } catch (const Unusable& reason) {
    trouble(sqlite3_errstr(reason.code));
  }
}

void Ledger::write(const std::string& photo, const LedgerEntry& entry) {
  const StatementUse use(put_.get());
  database_->check(bind(put_.get(), 1, photo));
  database_->check(sqlite3_bind_int64(put_.get(), 2, static_cast<std::int64_t>(entry.photo.bytes)));
  database_->check(sqlite3_bind_int64(put_.get(), 3, entry.photo.modified));
  database_->check(bind(put_.get(), 4, entry.result));
  if (entry.stamp) {
    database_->check(
        sqlite3_bind_int64(put_.get(), 5, static_cast<std::int64_t>(entry.stamp->bytes)));
    database_->check(sqlite3_bind_int64(put_.get(), 6, entry.stamp->modified));
  }
  database_->check(sqlite3_bind_int(put_.get(), 7, entry.begun ? 1 : 0));
  database_->step(put_.get());
}

}  // namespace pelorin::photo

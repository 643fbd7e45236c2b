#pragma once

#include <map>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>

#include "photo/collection/database.h"
#include "photo/collection/photo_record.h"

namespace pelorin::photo {

/// Another process has the ledger; `what()` names it.
class LedgerInUse : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// What a ledger knows of a photo.
struct LedgerEntry {
  FileStamp photo;                 ///< As it was when it was done.
  std::string result;              ///< The file it became.
  std::optional<FileStamp> stamp;  ///< Of the result; none while it is being made, or not ours.
  bool begun;                      ///< Being made, perhaps by a process that was killed.

  friend bool operator==(const LedgerEntry&, const LedgerEntry&) = default;
};

/// What a ledger is opened for.
enum class LedgerUse {
  keep,  ///< To be kept, by one process at a time.
  look,  ///< To be read once: nothing is made, locked or set aside.
};

/// Which photos were done, in a SQLite file, by one process at a time: the file is locked until this
/// ends, however it ends. Each entry is on the disk before `put` returns, where the disk takes it.
///
/// Nothing here is fatal but another process: what is damaged or no ledger is set aside under another
/// name, and what cannot be written counts until the end of this process.
class Ledger {
 public:
  /// Opens the ledger or makes a new one; where one only looks, what is put counts until this ends.
  /// @throws LedgerInUse.
  explicit Ledger(const std::string& file, LedgerUse use = LedgerUse::keep);

  /// What went wrong since it was last asked; mostly empty.
  std::string takeTrouble();

  /// Null for a photo that is not known; valid until the next `put`.
  const LedgerEntry* find(const std::string& photo) const;

  /// Replaces what is known of a photo.
  void put(const std::string& photo, const LedgerEntry& entry);
  /// The same for many, in the time of one.
  void put(const std::map<std::string, LedgerEntry>& entries);

 private:
  void open();
  void look();
  void check();
  void read();
  void setAside();
  void trouble(const std::string& what);
  void write(const std::string& photo, const LedgerEntry& entry);

  std::string file_, trouble_;
  std::map<std::string, LedgerEntry> entries_;
  std::optional<Database> database_;  // none where it cannot be used
  Database::Statement put_;
};

}  // namespace pelorin::photo

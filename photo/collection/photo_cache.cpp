#include "photo/collection/photo_cache.h"

#include <fmt/format.h>
#include <sqlite3.h>

#include <bit>
#include <cmath>
#include <cstring>
#include <filesystem>
#include <limits>
#include <string_view>

#include "image_processing/quality/niqe.h"

namespace pelorin::photo {
namespace {

using image_processing::GreenCDF;
using image_processing::niqeModelId;

constexpr int applicationId = 0x51426443;  // "QBdC": whose file it is
constexpr int layoutVersion = 2;
constexpr int millisecondsToWait = 60'000;  // for another run that is writing

constexpr const char* makeTables =
    "CREATE TABLE photos ("
    "  path BLOB NOT NULL, bytes INTEGER NOT NULL, modified INTEGER NOT NULL,"
    "  engine TEXT NOT NULL, scale INTEGER NOT NULL,"
    "  width INTEGER NOT NULL, height INTEGER NOT NULL, orientation INTEGER NOT NULL,"
    "  time TEXT, seconds REAL, zone INTEGER,"
    "  cdf BLOB NOT NULL, checksum INTEGER NOT NULL,"
    "  PRIMARY KEY (path, scale)) WITHOUT ROWID;"
    "CREATE TABLE scores ("
    "  path BLOB NOT NULL, bytes INTEGER NOT NULL, modified INTEGER NOT NULL,"
    "  engine TEXT NOT NULL, model TEXT NOT NULL,"
    "  score REAL, checksum INTEGER NOT NULL,"  // null: too small
    "  PRIMARY KEY (path, model)) WITHOUT ROWID";
constexpr const char* findPhoto =
    "SELECT width, height, orientation, time, seconds, zone, cdf, checksum FROM photos "
    "WHERE path = ?1 AND bytes = ?2 AND modified = ?3 AND engine = ?4 AND scale = ?5";
constexpr const char* storePhoto =
    "REPLACE INTO photos VALUES (?1, ?2, ?3, ?4, ?5, ?6, ?7, ?8, ?9, ?10, ?11, ?12, ?13)";
constexpr const char* findScoreOfPhoto =
    "SELECT score, checksum FROM scores "
    "WHERE path = ?1 AND bytes = ?2 AND modified = ?3 AND engine = ?4 AND model = ?5";
constexpr const char* storeScoreOfPhoto = "REPLACE INTO scores VALUES (?1, ?2, ?3, ?4, ?5, ?6, ?7)";

struct Key {
  std::string path;
  FileStamp stamp;
};

Key keyOf(const std::string& photo, const FileStamp& stamp) {
  // Not as text: "link/.." is where the link leads.
  const std::filesystem::path path = std::filesystem::absolute(photo);
  std::error_code failed;
  const std::filesystem::path folder =
      std::filesystem::weakly_canonical(path.parent_path(), failed);
  return {(failed ? path : folder / path.filename()).string(), stamp};
}

// SQLite notices damage to its own structure but not to what is kept in it, nor that a row is found
// in the place of another. FNV-1a.
std::int64_t checksum(const Key& key, std::string_view content) {
  const std::string text =
      fmt::format("{} {} {} {}", key.path, key.stamp.bytes, key.stamp.modified, content);
  std::uint64_t hash = 0xCBF29CE484222325u;
  for (const char byte : text) {
    hash = (hash ^ static_cast<unsigned char>(byte)) * 0x100000001B3u;
  }
  return static_cast<std::int64_t>(hash);
}

std::int64_t checksum(const Key& key, int scale, const PhotoRecord& record, const GreenCDF& cdf) {
  std::string text =
      fmt::format("{} {} {} {} ", scale, record.width, record.height, record.orientation);
  if (record.captureTime) {
    const CaptureTime& time = *record.captureTime;
    text += fmt::format("{} {} {} {}", time.text, std::bit_cast<std::uint64_t>(time.seconds),
                        time.hasZone, time.zoneSeconds);
  }
  text.append(reinterpret_cast<const char*>(cdf.data()), sizeof cdf);
  return checksum(key, text);
}

std::int64_t checksum(const Key& key, float score) {
  const std::string text = std::isnan(score) ? "too small" : fmt::format("{}", score);
  return checksum(key, fmt::format("{} {}", niqeModelId, text));
}

void bindKey(Database& database, sqlite3_stmt* statement, const Key& key) {
  database.check(
      sqlite3_bind_blob64(statement, 1, key.path.data(), key.path.size(), SQLITE_TRANSIENT));
  database.check(sqlite3_bind_int64(statement, 2, static_cast<std::int64_t>(key.stamp.bytes)));
  database.check(sqlite3_bind_int64(statement, 3, key.stamp.modified));
  database.check(sqlite3_bind_text(statement, 4, PELORIN_VERSION, -1, SQLITE_STATIC));
}

void bindRecord(Database& database, sqlite3_stmt* statement, const Key& key, int scale,
                const PhotoRecord& record) {
  database.check(sqlite3_bind_int64(statement, 6, record.width));
  database.check(sqlite3_bind_int64(statement, 7, record.height));
  database.check(sqlite3_bind_int(statement, 8, record.orientation));
  if (record.captureTime) {  // a value not bound is null
    const CaptureTime& time = *record.captureTime;
    database.check(sqlite3_bind_text(statement, 9, time.text.c_str(), -1, SQLITE_TRANSIENT));
    database.check(sqlite3_bind_double(statement, 10, time.seconds));
    if (time.hasZone) database.check(sqlite3_bind_int(statement, 11, time.zoneSeconds));
  }
  const GreenCDF cdf = record.cdf.unpacked();
  database.check(sqlite3_bind_blob(statement, 12, cdf.data(), sizeof cdf, SQLITE_TRANSIENT));
  database.check(sqlite3_bind_int64(statement, 13, checksum(key, scale, record, cdf)));
}

// Empty when the row is not what was stored.
std::optional<PhotoRecord> readRecord(Database& database, sqlite3_stmt* statement, const Key& key,
                                      int scale) {
  PhotoRecord record{};
  record.width = static_cast<std::uint32_t>(sqlite3_column_int64(statement, 0));
  record.height = static_cast<std::uint32_t>(sqlite3_column_int64(statement, 1));
  record.orientation = sqlite3_column_int(statement, 2);
  if (sqlite3_column_type(statement, 3) != SQLITE_NULL) {
    const auto* const text = sqlite3_column_text(statement, 3);
    if (text == nullptr) database.check(SQLITE_NOMEM);
    CaptureTime& time = record.captureTime.emplace();
    time.text = reinterpret_cast<const char*>(text);
    time.seconds = sqlite3_column_double(statement, 4);
    time.hasZone = sqlite3_column_type(statement, 5) != SQLITE_NULL;
    time.zoneSeconds = sqlite3_column_int(statement, 5);
  }
  const void* stored = sqlite3_column_blob(statement, 6);
  GreenCDF cdf;
  if (sqlite3_column_bytes(statement, 6) != sizeof cdf) return std::nullopt;
  if (stored == nullptr) database.check(SQLITE_NOMEM);
  std::memcpy(cdf.data(), stored, sizeof cdf);
  if (checksum(key, scale, record, cdf) != sqlite3_column_int64(statement, 7)) return std::nullopt;
  record.cdf = {cdf, countedPixels(record.width, record.height, scale)};
  return record;
}

}  // namespace

PhotoCache::PhotoCache(const std::string& file)
    : file_(file), database_(file, millisecondsToWait, [this](int code) { fail(code); }) {
  prepareTables();
  find_ = database_.prepare(findPhoto);
  store_ = database_.prepare(storePhoto);
  findScore_ = database_.prepare(findScoreOfPhoto);
  storeScore_ = database_.prepare(storeScoreOfPhoto);
}

PhotoCache::~PhotoCache() = default;

void PhotoCache::prepareTables() {
  const auto isNew = [this] { return database_.number("SELECT count(*) FROM sqlite_master") == 0; };
  // Only an empty file is written to before it is known to be ours.
  if (isNew()) {
    database_.execute("BEGIN IMMEDIATE");
    if (isNew()) {  // else another run was faster
      database_.execute(makeTables);
      database_.execute(fmt::format("PRAGMA application_id = {}", applicationId).c_str());
      database_.execute(fmt::format("PRAGMA user_version = {}", layoutVersion).c_str());
    }
    database_.execute("COMMIT");
  }
  if (database_.number("PRAGMA application_id") != applicationId)
    refuse("is not a cache of photos");
  if (database_.number("PRAGMA user_version") != layoutVersion) {
    refuse("was made by another version");
  }
  // With a log, storing waits for no disk and readers for no writer. Where it cannot be had, the
  // cache is only slower.
  database_.succeeds("PRAGMA journal_mode = WAL");
  database_.execute("PRAGMA synchronous = NORMAL");
}

std::optional<PhotoRecord> PhotoCache::find(const std::string& photo, const FileStamp& stamp,
                                            int scale) {
  const StatementUse use(find_.get());
  const Key key = keyOf(photo, stamp);
  bindKey(database_, find_.get(), key);
  database_.check(sqlite3_bind_int(find_.get(), 5, scale));
  if (!database_.step(find_.get())) return std::nullopt;
  std::optional<PhotoRecord> record = readRecord(database_, find_.get(), key, scale);
  if (!record) refuse("is damaged");
  return record;
}

void PhotoCache::store(const std::string& photo, const FileStamp& stamp, int scale,
                       const PhotoRecord& record) {
  const StatementUse use(store_.get());
  const Key key = keyOf(photo, stamp);
  bindKey(database_, store_.get(), key);
  database_.check(sqlite3_bind_int(store_.get(), 5, scale));
  bindRecord(database_, store_.get(), key, scale, record);
  database_.step(store_.get());
}

std::optional<float> PhotoCache::findScore(const std::string& photo, const FileStamp& stamp) {
  sqlite3_stmt* const statement = findScore_.get();
  const StatementUse use(statement);
  const Key key = keyOf(photo, stamp);
  bindKey(database_, statement, key);
  database_.check(sqlite3_bind_text(statement, 5, niqeModelId, -1, SQLITE_STATIC));
  if (!database_.step(statement)) return std::nullopt;
  const bool tooSmall = sqlite3_column_type(statement, 0) == SQLITE_NULL;
  const float score = tooSmall ? std::numeric_limits<float>::quiet_NaN()
                               : static_cast<float>(sqlite3_column_double(statement, 0));
  if (checksum(key, score) != sqlite3_column_int64(statement, 1)) refuse("is damaged");
  return score;
}

void PhotoCache::storeScore(const std::string& photo, const FileStamp& stamp, float score) {
  sqlite3_stmt* const statement = storeScore_.get();
  const StatementUse use(statement);
  const Key key = keyOf(photo, stamp);
  bindKey(database_, statement, key);
  database_.check(sqlite3_bind_text(statement, 5, niqeModelId, -1, SQLITE_STATIC));
  if (!std::isnan(score)) database_.check(sqlite3_bind_double(statement, 6, score));
  database_.check(sqlite3_bind_int64(statement, 7, checksum(key, score)));
  database_.step(statement);
}

void PhotoCache::fail(int code) {
  if (code == SQLITE_NOTADB) refuse("is not a cache of photos");
  // A table that is not there or not as it was made.
  if (code == SQLITE_CORRUPT || code == SQLITE_ERROR) refuse("is damaged");
  if (code == SQLITE_BUSY) {
    throw CacheError(file_ + ": is in use by another run; wait for it or name another file");
  }
  throw CacheError(fmt::format("{}: cannot be used as a cache: {}; check the path and the disk",
                               file_, sqlite3_errstr(code)));
}

void PhotoCache::refuse(const std::string& why) {
  throw CacheError(fmt::format("{}: {}; delete the file or name another one", file_, why));
}

}  // namespace pelorin::photo

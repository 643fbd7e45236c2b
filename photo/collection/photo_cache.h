#pragma once

#include <optional>
#include <stdexcept>
#include <string>

#include "photo/collection/database.h"
#include "photo/collection/photo_record.h"

namespace pelorin::photo {

/// The cache cannot be used; `what()` names the file and says what to do.
class CacheError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// Photo records and scores in a SQLite file, so that a second run reads no pixels. They are found
/// again while the file's path, size and time of change and the engine's version are the same, and
/// for a record the scale, for a score the model it refers to.
///
/// Each stands as soon as it is stored, whatever happens to the process then. Several
/// processes may use one file; one object serves one thread.
class PhotoCache {
 public:
  /// Opens the cache or makes a new one.
  /// @throws CacheError when the file is damaged, is something else (it is left as it was) or
  ///         cannot be opened, as everything here.
  explicit PhotoCache(const std::string& file);
  ~PhotoCache();
  PhotoCache(const PhotoCache&) = delete;
  PhotoCache& operator=(const PhotoCache&) = delete;

  std::optional<PhotoRecord> find(const std::string& photo, const FileStamp& stamp, int scale);

  /// Replaces what is known of that path at that scale.
  void store(const std::string& photo, const FileStamp& stamp, int scale,
             const PhotoRecord& record);

  /// The NIQE score of the full-size picture; NaN when it is too small for one.
  std::optional<float> findScore(const std::string& photo, const FileStamp& stamp);

  /// Replaces the score of that path.
  void storeScore(const std::string& photo, const FileStamp& stamp, float score);

 private:
  void prepareTables();
  [[noreturn]] void fail(int code);
  [[noreturn]] void refuse(const std::string& why);

  std::string file_;
  Database database_;
  Database::Statement find_, store_, findScore_, storeScore_;
};

}  // namespace pelorin::photo

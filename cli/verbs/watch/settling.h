#pragma once

#include <cstdint>
#include <map>
#include <string>

#include "photo/collection/photo_record.h"

namespace pelorin::cli {

/// Tells files that are complete from those that are still written: the former stay as they are.
class Settling {
 public:
  /// @param quiet  for how long a file must stay the same, in the unit of `now`.
  explicit Settling(std::int64_t quiet) : quiet_(quiet) {}

  /// Takes down how a file is now.
  /// @param now  of a clock that never goes back.
  /// @returns whether it has been so for long enough; it is then forgotten.
  bool isComplete(const std::string& file, const photo::FileStamp& stamp, std::int64_t now);

  /// Whether files are waited for.
  bool isWaiting() const { return !files_.empty(); }

  /// Forgets files that were not taken down at `now`: they are gone.
  void forgetAllBut(std::int64_t now);

 private:
  struct Seen {
    photo::FileStamp stamp;
    std::int64_t first, last;
  };

  std::int64_t quiet_;
  std::map<std::string, Seen> files_;
};

}  // namespace pelorin::cli

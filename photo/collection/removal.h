#pragma once

#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "photo/collection/best_photo.h"
#include "photo/collection/photo_record.h"

namespace pelorin::photo {

/// A file as it was when somebody decided about it.
struct KnownFile {
  std::string path;
  FileStamp stamp;

  friend bool operator==(const KnownFile&, const KnownFile&) = default;
};

/// What stays of a group of duplicates and what may go.
struct Removal {
  std::vector<KnownFile> kept, removed;  ///< Neither is empty.
};

/// The file behind a photo, by its whole path; none for one of standard input.
std::optional<KnownFile> knownFile(const ScannedPhoto& photo);

/// What ranking the groups suggests; groups of which nothing would go are left out.
std::vector<Removal> planRemovals(const std::vector<DupeGroup>& groups,
                                  const std::vector<ScannedPhoto>& photos);

/// A file is left alone; `what()` is a clause that says why.
class RemovalError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// Looks once more before a file goes: it and all that stay are there as they were known, it is a file
/// and no symbolic link, and none of those that stay.
/// @throws RemovalError.
void checkRemoval(const Removal& removal, const KnownFile& file);

/// Which of the files that stay has the same bytes as `file`, every one of them; null when none has.
/// @throws std::system_error.
const KnownFile* sameBytes(const Removal& removal, const KnownFile& file);

/// Makes `file` another name of `kept`, in one step: it is never missing. Its times and permissions are
/// those of `kept` from then on.
/// @param backup  the folder that keeps the old file; empty for none.
/// @returns false where they were one file already.
/// @throws RemovalError on another disk, std::system_error; `file` is then as it was.
bool linkTo(const KnownFile& kept, const KnownFile& file, const std::string& backup);

}  // namespace pelorin::photo

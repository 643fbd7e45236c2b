#include "photo/collection/removal.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <system_error>
#include <utility>

#include "photo/backup.h"
#include "photo/file_io.h"

namespace fs = std::filesystem;

namespace pelorin::photo {
namespace {

bool isUnchanged(const KnownFile& file) {
  return stampOf(file.path) == file.stamp;
}

}  // namespace

std::optional<KnownFile> knownFile(const ScannedPhoto& photo) {
  if (!photo.bytes || !photo.modified) return std::nullopt;
  // Links on the way are followed ("link/../a.jpg" is not "a.jpg"), the last one is not.
  const fs::path path = fs::absolute(photo.path);
  const fs::path place = fs::weakly_canonical(path.parent_path()) / path.filename();
  return KnownFile{place.string(), {*photo.bytes, *photo.modified}};
}

std::vector<Removal> planRemovals(const std::vector<DupeGroup>& groups,
                                  const std::vector<ScannedPhoto>& photos) {
  std::vector<Removal> plan;
  for (const DupeGroup& group : groups) {
    Removal removal;
    for (const Ranked& ranked : rankGroup(group, photos)) {
      const std::optional<KnownFile> file = knownFile(photos[ranked.photo]);
      if (file) (ranked.keep ? removal.kept : removal.removed).push_back(*file);
    }
    if (!removal.kept.empty() && !removal.removed.empty()) plan.push_back(std::move(removal));
  }
  return plan;
}

void checkRemoval(const Removal& removal, const KnownFile& file) {
  std::error_code failed;
  const fs::path path = fs::canonical(file.path, failed);
  if (failed || !isUnchanged(file)) {
    throw RemovalError("has changed since it was compared; left as it is");
  }
  if (fs::is_symlink(file.path, failed)) throw RemovalError("is a symbolic link; left as it is");
  if (removal.kept.empty()) throw RemovalError("nothing would be kept instead; left as it is");
  for (const KnownFile& kept : removal.kept) {
    if (!isUnchanged(kept)) {
      throw RemovalError("left as it is, because " + kept.path +
                         " has changed since it was compared");
    }
    if (fs::canonical(kept.path, failed) == path) {
      throw RemovalError("is itself the photo to keep; left as it is");
    }
  }
}

const KnownFile* sameBytes(const Removal& removal, const KnownFile& file) {
  std::vector<std::uint8_t> bytes;
  for (const KnownFile& kept : removal.kept) {
    if (kept.stamp.bytes != file.stamp.bytes) continue;
    if (bytes.empty()) bytes = readFile(file.path);
    if (readFile(kept.path) == bytes) return &kept;
  }
  return nullptr;
}

bool linkTo(const KnownFile& kept, const KnownFile& file, const std::string& backup) {
  if (fs::equivalent(kept.path, file.path)) return false;
  const fs::path folder = fs::path(file.path).parent_path();
  // Called like a temporary, so that a killed run's is swept.
  const std::string link = folder / (".quenby-" + std::to_string(::getpid()) + "-0.tmp");
  // A kept symbolic link would otherwise be linked itself.
  if (::link(fs::canonical(kept.path).c_str(), link.c_str()) != 0) {
    if (errno == EXDEV) throw RemovalError("is on another disk than " + kept.path);
    throw std::system_error(errno, std::generic_category(), file.path);
  }
  try {
    if (!backup.empty()) {
      keepBackup(backup, file.path);
      recordResult(backup, file.path, readFile(link));
    }
    if (!isUnchanged(file)) throw RemovalError("has changed since it was compared");
    if (::rename(link.c_str(), file.path.c_str()) != 0) {
      throw std::system_error(errno, std::generic_category(), file.path);
    }
  } catch (...) {
    ::unlink(link.c_str());
    throw;
  }
  syncFolder(folder.string());
  return true;
}

}  // namespace pelorin::photo

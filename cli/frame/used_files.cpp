#include "cli/frame/used_files.h"

#include <fmt/format.h>
#include <sys/stat.h>

#include <filesystem>
#include <set>
#include <utility>

#include "cli/frame/errors.h"
#include "photo/file_io.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

std::string number(const struct stat& status) {
  return fmt::format("{} on {}", status.st_ino, status.st_dev);
}

// Its name in its folder, whatever path leads there, and itself where it has no other names: a
// second one keeps the old content when the first is replaced.
std::vector<std::string> identities(const std::string& path) {
  struct stat status = {};
  const bool exists = ::stat(path.c_str(), &status) == 0;
  if (path.empty() || path == "-" || (exists && !S_ISREG(status.st_mode))) return {};
  std::vector<std::string> all;
  if (exists && status.st_nlink == 1) all.push_back(number(status));
  std::error_code failed;
  const fs::path whole = fs::absolute(path);
  const fs::path canonical = fs::weakly_canonical(whole, failed);
  const fs::path place = failed ? whole.lexically_normal() : canonical;
  const bool inFolder = ::stat(place.parent_path().c_str(), &status) == 0;
  all.push_back(inFolder ? number(status) + "/" + place.filename().string() : place.string());
  return all;
}

}  // namespace

void UsedFiles::add(const std::string& path, const std::string& what) {
  for (std::string& identity : identities(path)) all_.emplace(std::move(identity), what);
}

const std::string* UsedFiles::find(const std::string& path) const {
  for (const std::string& identity : identities(path)) {
    const auto found = all_.find(identity);
    if (found != all_.end()) return &found->second;
  }
  return nullptr;
}

UsedFiles usedFiles(const std::vector<Input>& inputs) {
  UsedFiles used;
  for (const Input& input : inputs) used.add(input.path, "an input");
  return used;
}

void refuseSharedFiles(const std::vector<std::string>& outputs, UsedFiles used) {
  for (const std::string& output : outputs) {
    if (const std::string* const what = used.find(output)) {
      throw UsageError(output + ": is itself " + *what + "; choose another output");
    }
    used.add(output, "another output");
  }
}

void sweepFolders(const std::vector<std::string>& outputs) {
  std::set<std::string> folders;
  for (const std::string& output : outputs) {
    if (output != "-") folders.insert(fs::path(output).parent_path().string());
  }
  for (const std::string& folder : folders) photo::sweepLeftovers(folder);
}

}  // namespace pelorin::cli

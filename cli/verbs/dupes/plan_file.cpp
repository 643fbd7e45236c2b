#include "cli/verbs/dupes/plan_file.h"

#include <charconv>
#include <cstdint>
#include <nlohmann/json.hpp>
#include <set>
#include <system_error>

#include "cli/frame/base64.h"
#include "cli/frame/errors.h"
#include "cli/frame/shown_text.h"
#include "photo/file_io.h"

namespace pelorin::cli {
namespace {

constexpr int schema = 1;

[[noreturn]] void refuse(const std::string& path, const std::string& reason) {
  throw UsageError("--plan: " + path + ": " + reason);
}

photo::KnownFile readEntry(const std::string& plan, const Json& entry) {
  photo::KnownFile file{};
  file.path = entry.at("file").get<std::string>();
  if (entry.contains("fileBase64")) {
    const auto bytes = fromBase64(entry["fileBase64"].get<std::string>());
    if (!bytes) refuse(plan, "has a \"fileBase64\" that is none");
    file.path = *bytes;
  }
  if (file.path.empty() || file.path[0] != '/' || file.path.find('\0') != std::string::npos) {
    refuse(plan, "has a \"file\" that is no whole path");
  }
  file.stamp.bytes = entry.at("bytes").get<std::uint64_t>();
  const std::string modified = entry.at("modified").get<std::string>();
  const char* const end = modified.data() + modified.size();
  const auto read = std::from_chars(modified.data(), end, file.stamp.modified);
  if (read.ec != std::errc() || read.ptr != end) {
    refuse(plan, "has a \"modified\" that is no number in a text");
  }
  return file;
}

}  // namespace

std::string planEntry(const photo::KnownFile& file) {
  const std::string text = textOf({{"file", file.path},
                                   {"bytes", file.stamp.bytes},
                                   {"modified", std::to_string(file.stamp.modified)}});
  return Json::parse(text).dump(/*indent=*/-1, ' ', /*ensure_ascii=*/true);
}

std::vector<photo::Removal> readPlan(const std::string& path) {
  std::vector<photo::Removal> plan;
  std::set<std::string> kept, removed;
  try {
    const Json document = Json::parse(photo::readFile(path));
    if (document.at("plan") != "dupes" || document.at("schema") != schema) {
      refuse(path, "is no plan of this version");
    }
    for (const Json& group : document.at("groups")) {
      photo::Removal removal;
      for (const Json& entry : group.at("keep")) removal.kept.push_back(readEntry(path, entry));
      for (const Json& entry : group.at("remove")) {
        removal.removed.push_back(readEntry(path, entry));
      }
      if (removal.removed.empty()) continue;
      if (removal.kept.empty()) refuse(path, "has a group that keeps nothing");
      for (const photo::KnownFile& file : removal.kept) kept.insert(file.path);
      for (const photo::KnownFile& file : removal.removed) removed.insert(file.path);
      plan.push_back(std::move(removal));
    }
  } catch (const std::system_error& error) {
    refuse(path, explain(error));
  } catch (const Json::exception&) {
    refuse(path, "is no plan; a report that --html writes saves one");
  }
  for (const std::string& file : removed) {
    if (kept.contains(file)) refuse(path, shownName(file) + " is to stay and to go");
  }
  return plan;
}

}  // namespace pelorin::cli

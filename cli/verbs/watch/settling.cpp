#include "cli/verbs/watch/settling.h"

namespace pelorin::cli {

bool Settling::isComplete(const std::string& file, const photo::FileStamp& stamp,
                          std::int64_t now) {
  Seen& seen = files_.try_emplace(file, Seen{stamp, now, now}).first->second;
  if (seen.stamp != stamp) seen = {stamp, now, now};
  seen.last = now;
  if (now - seen.first < quiet_) return false;
  files_.erase(file);
  return true;
}

void Settling::forgetAllBut(std::int64_t now) {
  std::erase_if(files_, [now](const auto& file) { return file.second.last != now; });
}

}  // namespace pelorin::cli

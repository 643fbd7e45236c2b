#include "cli/frame/mark_option.h"

#include <fmt/chrono.h>

#include <charconv>
#include <cstdlib>
#include <cstring>
#include <ctime>

namespace pelorin::cli {

void addMarkOptions(Verb verb, MarkChoice& choice) {
  verb.flag("--no-mark", choice.without,
            "Leave out the mark, in the XMP's history, by which edited files are known; raw pixels "
            "carry none")
      .group("Output");
  verb.flag("--again", choice.again, "Edit photos that carry the mark of the same filter already")
      .group("Output");
}

photo::EditMark commandMark(const std::string& filter, const std::string& params) {
  photo::EditMark mark = photo::markOf(filter, params);
  const char* const text = std::getenv("SOURCE_DATE_EPOCH");
  if (text == nullptr) return mark;
  const char* const end = text + std::strlen(text);
  std::int64_t seconds = 0;
  const auto read = std::from_chars(text, end, seconds);
  constexpr std::int64_t lastOfYear9999 = 253402300799;
  if (read.ec != std::errc() || read.ptr != end || seconds < 0 || seconds > lastOfYear9999)
    return mark;
  const std::time_t when = static_cast<std::time_t>(seconds);
  std::tm parts = {};
  if (gmtime_r(&when, &parts) != nullptr) mark.when = fmt::format("{:%Y-%m-%dT%H:%M:%SZ}", parts);
  return mark;
}

}  // namespace pelorin::cli

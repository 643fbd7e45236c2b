#include "cli/frame/talk.h"

#include <fmt/format.h>
#include <unistd.h>

#include <cstdio>
#include <utility>

#include "cli/frame/shown_text.h"

namespace pelorin::cli {

void addReportOptions(Verb verb, ReportOptions& options) {
  Option json = verb.flag("--json", options.json,
                          "Print data as JSON: an object for one file, else an array");
  json.group("Reporting");
  verb.flag("--jsonl", options.jsonLines, "Print data as JSON, one object a line and file")
      .excludes(json)
      .group("Reporting");
  verb.flag("-q,--quiet", options.quiet, "Say nothing but errors").group("Reporting");
}

Talk::Talk(std::string verb, bool quiet, std::size_t files)
    : verb_(std::move(verb)),
      quiet_(quiet),
      hasBar_(!quiet && files > 1 && isatty(STDERR_FILENO) == 1),
      files_(files) {
  showBar();
}

Talk::~Talk() {
  hideBar();
}

void Talk::error(const std::string& file, const std::string& clause) {
  const std::lock_guard lock(mutex_);
  say(fmt::format("quenby {}: {}: {}", verb_, file, clause));
}

void Talk::note(const std::string& line) {
  if (quiet_) return;
  const std::lock_guard lock(mutex_);
  say(line);
}

void Talk::noteOnce(const std::string& topic, const std::string& line) {
  if (quiet_) return;
  const std::lock_guard lock(mutex_);
  if (topics_.insert(topic).second) say(line);
}

void Talk::fileDone() {
  const std::lock_guard lock(mutex_);
  ++done_;
  showBar();
}

void Talk::say(const std::string& line) {
  hideBar();
  fmt::print(stderr, "{}\n", shownText(line));
  showBar();
}

void Talk::hideBar() {
  if (hasBar_) fmt::print(stderr, "\r\033[K");
}

void Talk::showBar() {
  if (!hasBar_) return;
  constexpr std::size_t width = 40;
  const std::size_t filled = done_ * width / files_;
  fmt::print(stderr, "\r[{:#<{}}{:<{}}] {}/{}", "", filled, "", width - filled, done_, files_);
  std::fflush(stderr);
}

}  // namespace pelorin::cli

#include "cli/frame/talk.h"

#include <fmt/format.h>
#include <unistd.h>

#include <algorithm>
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
  verb.option(
          "--progress", options.progress,
          "Tell how far the work is: auto, unless given, with a bar on a terminal; json as lines "
          "of JSON on standard error")
      .oneOf({"auto", "json", "none"})
      .group("Reporting");
}

Talk::Talk(std::string verb, bool quiet, std::size_t files)
    : verb_(std::move(verb)),
      quiet_(quiet),
      hasBar_(!quiet && files > 1 && isatty(STDERR_FILENO) == 1),
      files_(files) {
  showBar();
}

Talk::Talk(std::string verb, const ReportOptions& report, std::size_t files)
    : Talk(std::move(verb), report.quiet || report.progress != "auto", files) {
  quiet_ = report.quiet;
  printsProgress_ = report.progress == "json" && files > 0;
  printProgress();
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
  printProgress();
}

void Talk::say(const std::string& line) {
  hideBar();
  fmt::print(stderr, "{}\n", shownText(line));
  showBar();
}

void Talk::hideBar() {
  if (hasBar_) fmt::print(stderr, "\r\033[K");
}

double Talk::elapsed() const {
  return std::chrono::duration<double>(std::chrono::steady_clock::now() - start_).count();
}

double Talk::secondsLeft(double elapsed) const {
  if (done_ == 0) return -1.0;
  return elapsed * static_cast<double>(files_ - done_) / static_cast<double>(done_);
}

void Talk::showBar() {
  if (!hasBar_) return;
  constexpr std::size_t width = 40;
  const std::size_t filled = done_ * width / files_;
  fmt::print(stderr, "\r[{:#<{}}{:<{}}] {}/{}", "", filled, "", width - filled, done_, files_);
  const double seconds = elapsed(), left = secondsLeft(seconds);
  if (seconds > 0.0 && left >= 0.0) {
    fmt::print(stderr, "  {:.1f}/s", static_cast<double>(done_) / seconds);
    const auto whole = static_cast<long>(std::min(left + 0.5, 1e9));
    if (done_ < files_) fmt::print(stderr, "  {}:{:02} left", whole / 60, whole % 60);
  }
  fmt::print(stderr, "\033[K");
  std::fflush(stderr);
}

void Talk::printProgress() {
  if (!printsProgress_) return;
  const double seconds = elapsed(), left = secondsLeft(seconds);
  fmt::print(stderr, R"({{"schema":1,"verb":"{}","done":{},"total":{},"seconds":{:.3f})", verb_,
             done_, files_, seconds);
  if (left >= 0.0) {
    fmt::print(stderr, R"(,"rate":{:.3f},"secondsLeft":{:.3f})",
               static_cast<double>(done_) / std::max(seconds, 1e-3), left);
  }
  fmt::print(stderr, "}}\n");
  std::fflush(stderr);
}

}  // namespace pelorin::cli

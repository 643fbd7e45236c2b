#pragma once

#include <chrono>
#include <cstddef>
#include <mutex>
#include <set>
#include <string>

#include "cli/frame/verb.h"

namespace pelorin::cli {

/// How a verb reports, as the user said it.
struct ReportOptions {
  bool json = false;
  bool jsonLines = false;
  bool quiet = false;
  std::string progress = "auto";  ///< "auto", "json" or "none".
};

/// Adds `--json`, `--jsonl`, `--quiet` and `--progress` to a verb.
void addReportOptions(Verb verb, ReportOptions& options);

/// Everything that is said to a person, on stderr: errors, notes, and how far the work is: one bar
/// when stderr is a terminal and there are several files, or a line of JSON a file for programs. Any
/// thread may speak.
class Talk {
 public:
  Talk(std::string verb, const ReportOptions& report, std::size_t files);
  /// Tells no progress but to a person.
  Talk(std::string verb, bool quiet, std::size_t files);
  ~Talk();
  Talk(const Talk&) = delete;
  Talk& operator=(const Talk&) = delete;

  /// "quenby enhance: a.jpg: is empty, not a photo". Said even when quiet.
  void error(const std::string& file, const std::string& clause);
  void note(const std::string& line);
  /// A note that is not said again when one with the same topic was said.
  void noteOnce(const std::string& topic, const std::string& line);
  /// Moves the bar on by one file.
  void fileDone();

 private:
  void say(const std::string& line);
  void hideBar();
  void showBar();
  void printProgress();
  /// Seconds until all files are done; negative where nothing is known yet.
  double secondsLeft(double elapsed) const;
  double elapsed() const;

  std::string verb_;
  bool quiet_, hasBar_, printsProgress_ = false;
  std::chrono::steady_clock::time_point start_ = std::chrono::steady_clock::now();
  std::size_t files_, done_ = 0;
  std::set<std::string> topics_;
  std::mutex mutex_;
};

}  // namespace pelorin::cli

#pragma once

#include <nlohmann/json.hpp>
#include <string>

#include "cli/frame/talk.h"

namespace pelorin::cli {

using Json = nlohmann::ordered_json;

/// An object in one line, as `JsonOutput` writes it.
std::string textOf(const Json& object);

/// The version of the JSON that is printed, the first member of every object; docs/json.md tells what it
/// promises.
constexpr int jsonSchema = 1;

/// Data on stdout: nothing without `--json` or `--jsonl`; one object a line with `--jsonl`; with
/// `--json` one object, or an array of them unless the user named a single file, which has its end also
/// when the process is forced to end between two of them. At most one of these lives at a time.
///
/// JSON is UTF-8 and file names may be any bytes: where a member's text is no UTF-8, a member of the
/// same name with "Base64" behind it holds its bytes, and the text has U+FFFD in their place.
class JsonOutput {
 public:
  JsonOutput(const ReportOptions& options, bool singleFile);
  JsonOutput(const JsonOutput&) = delete;
  JsonOutput& operator=(const JsonOutput&) = delete;
  /// Completes the document.
  ~JsonOutput();

  bool wanted() const { return json_ || lines_; }
  /// @param members  of an object.
  void add(const Json& members);

 private:
  bool json_, lines_, single_;
  bool begun_ = false;
};

}  // namespace pelorin::cli

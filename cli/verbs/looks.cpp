#include <fmt/format.h>

#include <algorithm>
#include <memory>

#include "cli/frame/json_output.h"
#include "cli/verbs/verbs.h"
#include "image_processing/filters/default_filter_factory.h"

namespace pelorin::cli {
namespace {

ExitCode runLooks(const ReportOptions& report) {
  const auto registry = image_processing::DefaultFilterFactory::filterFactory();
  std::size_t nameWidth = 0, displayWidth = 0;
  for (const auto& [name, look] : registry->descriptions) {
    nameWidth = std::max(nameWidth, name.size());
    displayWidth = std::max(displayWidth, look->displayName.size());
  }
  JsonOutput json(report, false);
  for (const auto& [name, look] : registry->descriptions) {
    json.add(
        {{"name", name}, {"displayName", look->displayName}, {"description", look->description}});
    if (json.wanted()) continue;
    fmt::print("{:{}}  {:{}}  {}\n", name, nameWidth, look->displayName, displayWidth,
               look->description);
  }
  return ExitCode::allDone;
}

}  // namespace

void addLooks(CommandLine& commandLine) {
  const auto report = std::make_shared<ReportOptions>();
  Verb verb = commandLine.addVerb("looks", "List the looks: name, display name and description",
                                  "quenby looks\n"
                                  "quenby looks --json",
                                  [report] { return runLooks(*report); });
  Option json = verb.flag("--json", report->json, "Print the list as a JSON array");
  verb.flag("--jsonl", report->jsonLines, "Print the list as JSON, one look a line").excludes(json);
}

}  // namespace pelorin::cli

#include "cli/frame/print_plan.h"

#include <fmt/format.h>

namespace pelorin::cli {

Json planAsJson(const PlannedFile& file, const char* status) {
  return {{"input", file.input.path}, {"output", file.output}, {"status", status}};
}

ExitCode printPlan(const std::vector<PlannedFile>& plan, const char* existing,
                   const std::string& edited, Talk& talk, JsonOutput& json) {
  bool something = false, failed = false;
  for (const PlannedFile& file : plan) {
    if (!file.input.trouble.empty()) {
      failed = true;
      talk.error(file.input.shownName(), file.input.trouble);
      Json object = planAsJson(file, "failed");
      object["error"] = file.input.trouble;
      json.add(object);
      continue;
    }
    const bool isEdited = !file.skipped && !file.earlier.empty();
    something = something || (!file.skipped && !isEdited);
    Json object = planAsJson(file, file.skipped ? "exists" : isEdited ? "edited" : "planned");
    if (isEdited) object["earlier"] = file.earlier;
    json.add(object);
    if (json.wanted()) continue;
    fmt::print("{} -> {}{}\n", shownText(file.input.path), shownText(file.output),
               file.skipped ? existing
               : isEdited   ? fmt::format(" ({}: {}; skipped without --again)", edited,
                                          shownText(file.earlier))
                            : "");
  }
  if (failed) return ExitCode::someFailed;
  return something ? ExitCode::allDone : ExitCode::nothingToDo;
}

}  // namespace pelorin::cli

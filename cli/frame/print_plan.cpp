#include "cli/frame/print_plan.h"

#include <fmt/format.h>

namespace pelorin::cli {

Json planAsJson(const PlannedFile& file, const char* status) {
  return {{"input", file.input.path}, {"output", file.output}, {"status", status}};
}

ExitCode printPlan(const std::vector<PlannedFile>& plan, const char* existing, Talk& talk,
                   JsonOutput& json) {
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
    something = something || !file.skipped;
    json.add(planAsJson(file, file.skipped ? "exists" : "planned"));
    if (json.wanted()) continue;
    fmt::print("{} -> {}{}\n", shownText(file.input.path), shownText(file.output),
               file.skipped ? existing : "");
  }
  if (failed) return ExitCode::someFailed;
  return something ? ExitCode::allDone : ExitCode::nothingToDo;
}

}  // namespace pelorin::cli

#include "photo/selftest.h"

#include <fmt/format.h>
#include <hwy/highway.h>

#include <cstdint>
#include <memory>
#include <string>

#include "cli/frame/talk.h"
#include "cli/verbs/verbs.h"

namespace pelorin::cli {
namespace {

struct SelftestOptions {
  bool quiet = false;
};

ExitCode runSelftest(const SelftestOptions& options) {
  Talk talk("selftest", options.quiet, 0);
  const std::int64_t own = hwy::SupportedTargets();
  std::string first;
  bool equal = true;
  for (std::int64_t left = own & HWY_TARGETS; left != 0; left &= left - 1) {
    hwy::SetSupportedTargetsForTest(own & -left);
    const std::string table = photo::selftestTable();
    const char* const name = hwy::TargetName(left & -left);
    if (first.empty()) {
      first = table;
      talk.note(fmt::format("with {}", name));
    } else if (table == first) {
      talk.note(fmt::format("the same with {}", name));
    } else {
      equal = false;
      talk.error(name, "gives another table:\n" + table);
    }
  }
  hwy::SetSupportedTargetsForTest(0);
  fmt::print("quenby {}\n{}", PELORIN_VERSION, first);
  return equal ? ExitCode::allDone : ExitCode::someFailed;
}

}  // namespace

void addSelftest(CommandLine& commandLine) {
  const auto options = std::make_shared<SelftestOptions>();
  Verb verb = commandLine.addVerb("selftest",
                                  "Print hashes of every filter's results, which every machine and "
                                  "every front end has the same",
                                  "quenby selftest\n"
                                  "quenby selftest > this_machine.txt",
                                  [options] { return runSelftest(*options); });
  verb.flag("-q,--quiet", options->quiet, "Do not tell which instruction sets were compared");
}

}  // namespace pelorin::cli

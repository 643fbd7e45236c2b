#include "cli/frame/jobs_option.h"

namespace pelorin::cli {

void addJobsOption(Verb verb, int& atOnce) {
  verb.option("-j,--jobs", atOnce, "Files at once; as many as cores unless given, or 0")
      .between(0, 1024)
      .type("N")
      .group("Reporting");
}

void addThreadsOption(Verb verb, int& threads) {
  verb.option("--threads", threads,
              "Threads on each file; 0: as many as there are cores for it, which is usual for one "
              "file, 1 for several")
      .between(0, 1024)
      .type("N")
      .group("Reporting");
}

}  // namespace pelorin::cli

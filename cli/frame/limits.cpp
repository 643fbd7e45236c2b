#include "cli/frame/limits.h"

#include <climits>

namespace pelorin::cli {
namespace {

Limits limitsOfThisRun;

}  // namespace

const Limits& limits() {
  return limitsOfThisRun;
}

void addLimitOptions(Verb verb) {
  verb.option("--max-pixels", limitsOfThisRun.decode.pixels,
              "Refuse photos of more pixels; 268M unless given")
      .inThousands()
      .group("Limits");
  verb.option("--max-bytes", limitsOfThisRun.bytes,
              "Refuse files of more bytes; 1074M unless given")
      .inThousands()
      .group("Limits");
  verb.option("--timeout", limitsOfThisRun.seconds,
              "Give a photo up after so many seconds; 0, as long as it takes, unless given")
      .between(0, INT_MAX)
      .type("SECONDS")
      .group("Limits");
}

}  // namespace pelorin::cli

#include "cli/frame/limits.h"

#include <climits>

namespace pelorin::cli {
namespace {

Limits limitsOfThisRun;
std::uint64_t askedPixels = 0;  // 0: not given

}  // namespace

Limits limits() {
  Limits limits = limitsOfThisRun;
  // Who names a number of pixels gets as many, also from a file that is small for them.
  if (askedPixels > 0) limits.decode.pixels = limits.decode.compressedPixels = askedPixels;
  return limits;
}

void addLimitOptions(Verb verb) {
  verb.option("--max-pixels", askedPixels,
              "Refuse photos of more pixels; unless given 268M, or 40M for a file of a few kB that "
              "only says to have them")
      .inThousands()
      .group("Limits");
  verb.option("--max-bytes", limitsOfThisRun.decode.bytes,
              "Refuse files of more bytes; 1074M unless given")
      .inThousands()
      .group("Limits");
  verb.option("--max-scans", limitsOfThisRun.decode.scans,
              "Refuse JPEG files of more scans; 100 unless given")
      .between(1, INT_MAX)
      .group("Limits");
  verb.option("--max-segments", limitsOfThisRun.decode.segments,
              "Refuse JPEG files of more segments before the picture; 4096 unless given")
      .between(1, INT_MAX)
      .group("Limits");
  verb.option("--timeout", limitsOfThisRun.seconds,
              "Give a photo up after so many seconds; 0, as long as it takes, unless given")
      .between(0, INT_MAX)
      .type("SECONDS")
      .group("Limits");
}

}  // namespace pelorin::cli

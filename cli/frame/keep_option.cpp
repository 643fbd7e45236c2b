#include "cli/frame/keep_option.h"

#include "cli/frame/errors.h"

namespace pelorin::cli {

void addKeepOptions(Verb verb, KeepChoice& choice) {
  verb.option("--strip", choice.strip,
              "Leave out of the file: gps (with videos, which tell the place too), thumbnail, or "
              "all but the colour profile; may be repeated")
      .oneValueEach()
      .type("gps|thumbnail|all")
      .group("Output");
  verb.option("--gain-map", choice.gainMap,
              "Keep or drop the gain map of an HDR photo; kept unless given")
      .oneOf({"keep", "drop"})
      .group("Output");
  verb.flag("--strict-metadata", choice.strict,
            "Fail where metadata would be lost, instead of naming it")
      .group("Output");
}

photo::KeepOptions keepOptions(const KeepChoice& choice) {
  photo::KeepOptions keep = {.gainMap = choice.gainMap == "keep"};
  for (const std::string& part : choice.strip) {
    if (part == "gps") {
      keep.location = false;
    } else if (part == "thumbnail") {
      keep.thumbnail = false;
    } else if (part == "all") {
      keep.everything = false;
    } else {
      throw UsageError("--strip: '" + part + "' is none of gps, thumbnail, all");
    }
  }
  return keep;
}

std::string lossText(const photo::Loss& loss) {
  return loss.what + " lost: " + loss.why;
}

void refuseLosses(const std::vector<photo::Loss>& lost, bool strict) {
  if (strict && !lost.empty()) throw FileError(lossText(lost.front()) + " (--strict-metadata)");
}

}  // namespace pelorin::cli

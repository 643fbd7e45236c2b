#include "cli/verbs/verbs.h"

#include <algorithm>

namespace pelorin::cli {

void addVerbs(CommandLine& commandLine, std::string_view wanted) {
  struct NamedVerb {
    std::string_view name;
    void (*add)(CommandLine&);
  };
  constexpr NamedVerb verbs[] = {
      {"enhance", addEnhance}, {"look", addLook},           {"looks", addLooks},
      {"sheet", addSheet},     {"info", addInfo},           {"curve", addCurve},
      {"masks", addMasks},     {"dupes", addDupes},         {"compare", addCompare},
      {"score", addScore},     {"keypoints", addKeypoints}, {"selftest", addSelftest},
      {"undo", addUndo},       {"watch", addWatch},         {"pages", addPages}};
  // Which writes the pages of all others.
  const bool one =
      wanted != "pages" && std::ranges::find(verbs, wanted, &NamedVerb::name) != std::end(verbs);
  for (const NamedVerb& verb : verbs)
    if (!one || verb.name == wanted) verb.add(commandLine);
}

}  // namespace pelorin::cli

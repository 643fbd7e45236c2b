#include <algorithm>
#include <string_view>

#include "cli/verbs/verbs.h"

int main(int argc, char** argv) {
  using namespace pelorin::cli;
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
  const std::string_view asked = argc > 1 ? argv[1] : "";
  // Making the options of all takes longer than what many a run is for.
  const bool one =
      asked != "pages" && std::ranges::find(verbs, asked, &NamedVerb::name) != std::end(verbs);
  const bool none = argc == 2 && (asked == "--version" || asked == "-V");
  CommandLine commandLine;
  for (const NamedVerb& verb : verbs)
    if (one ? verb.name == asked : !none) verb.add(commandLine);
  return static_cast<int>(commandLine.run(argc, argv));
}

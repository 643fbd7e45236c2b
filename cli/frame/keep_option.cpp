#include "cli/frame/keep_option.h"

#include <utility>

#include "cli/frame/errors.h"

namespace pelorin::cli {
namespace {

photo::MetadataKind kindNamed(const std::string& name) {
  using Kind = photo::MetadataKind;
  constexpr std::pair<const char*, Kind> kinds[] = {
      {"copyright", Kind::copyright}, {"time", Kind::time},
      {"exif", Kind::exif},           {"xmp", Kind::xmp},
      {"iptc", Kind::iptc},           {"gain-map", Kind::gainMap}};
  for (const auto& [known, kind] : kinds) {
    if (name == known) return kind;
  }
  throw UsageError("--keep: '" + name + "' is none of copyright, time, exif, xmp, iptc, gain-map");
}

}  // namespace

void addKeepOptions(Verb verb, KeepChoice& choice) {
  verb.option("--strip", choice.strip,
              "Leave out of the file: gps (with videos, which tell the place too), thumbnail, or "
              "all but the colour profile; may be repeated")
      .oneValueEach()
      .type("gps|thumbnail|all")
      .group("Output");
  verb.option(
          "--keep", choice.keep,
          "Leave out all but these and the colour profile: copyright (who made it, in EXIF, XMP "
          "and IPTC), time (when), exif, xmp, iptc, gain-map; separated by commas")
      .separatedBy(',')
      .type("KIND,...")
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
  bool stripAll = false;
  for (const std::string& part : choice.strip) {
    if (part == "gps") {
      keep.location = false;
    } else if (part == "thumbnail") {
      keep.thumbnail = false;
    } else if (part == "all") {
      stripAll = true;
    } else {
      throw UsageError("--strip: '" + part + "' is none of gps, thumbnail, all");
    }
  }
  if (!stripAll && choice.keep.empty()) return keep;
  keep.only.emplace();
  for (const std::string& kind : choice.keep) keep.only->insert(kindNamed(kind));
  return keep;
}

std::string lossText(const photo::Loss& loss) {
  return loss.what + " lost: " + loss.why;
}

void refuseLosses(const std::vector<photo::Loss>& lost, bool strict) {
  if (strict && !lost.empty()) throw FileError(lossText(lost.front()) + " (--strict-metadata)");
}

}  // namespace pelorin::cli

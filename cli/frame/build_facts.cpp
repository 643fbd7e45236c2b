#include "cli/frame/build_facts.h"

#include <hwy/targets.h>

#include <cstdint>

#include "photo/library_versions.h"

namespace pelorin::cli {
namespace {

#if defined(__clang__)
constexpr const char* compiler = __VERSION__;  // "Debian Clang 14.0.6"
#else
constexpr const char* compiler = "GCC " __VERSION__;
#endif

// Of a set of targets, the best first: in their numbers the lower bit is the better one.
Json namesOf(std::int64_t targets) {
  Json names = Json::array();
  for (; targets != 0; targets &= targets - 1) names.push_back(hwy::TargetName(targets & -targets));
  return names;
}

}  // namespace

Json buildFacts() {
  Json libraries = Json::object();
  for (const photo::LibraryVersion& library : photo::libraryVersions()) {
    libraries[library.name] = library.version;
  }
  const Json usable = namesOf(hwy::SupportedTargets() & HWY_TARGETS);
  return {{"version", PELORIN_VERSION},
          {"compiler", compiler},
          {"instructionSets", namesOf(HWY_TARGETS)},
          {"instructionSet", usable.empty() ? Json() : usable[0]},
          {"libraries", libraries}};
}

}  // namespace pelorin::cli

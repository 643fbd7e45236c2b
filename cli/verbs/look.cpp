#include <fmt/format.h>
#include <fmt/ranges.h>

#include <algorithm>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "cli/frame/errors.h"
#include "cli/frame/filter_files.h"
#include "cli/frame/filter_parameters.h"
#include "cli/frame/look_name.h"
#include "cli/frame/number_text.h"
#include "cli/verbs/verbs.h"
#include "image_processing/core/parameter_strings.h"

namespace pelorin::cli {
namespace {

using image_processing::FilterDescription;

struct LookOptions {
  FilterFilesOptions files;
  std::string look, params;
  Verb verb;
};

std::string strength(const std::string& option, const std::string& text) {
  readSlider(option, text);
  return text;
}

std::string radius(const std::string& option, const std::string& text) {
  if (readFiniteNumber(option, text) > 0.0f) return text;
  throw UsageError(option + ": " + text + " is not above 0");
}

// The filter drops a number that no comma follows.
std::string curve(const std::string& option, const std::string& text) {
  const std::string ended = text.ends_with(',') ? text : text + ",";
  for (const std::string& number : image_processing::splitStringAt(ended, ",")) {
    readSlider(option, number);
  }
  return ended;
}

std::string yes(const std::string&, const std::string&) {
  return "1";
}

std::string no(const std::string&, const std::string&) {
  return "0";
}

/// An option that stands for one key of the parameter string.
struct Setting {
  const char* option;
  const char* type;  ///< What the help calls its value; null for a flag.
  const char* key;
  /// What the filter shall read for the text that the user gave to `option`.
  /// @throws UsageError for a text that is no value.
  std::string (*valueOf)(const std::string& option, const std::string& text);
  const char* description;
};

constexpr Setting settings[] = {
    {"--mask-radius", "R", "maskRadius", radius,
     "Where the vignette ends, in halves of the picture's height"},
    {"--mask-alpha", "A", "maskAlpha", strength, "How strong the vignette is, from 0 (none) to 1"},
    {"--mask", nullptr, "applyMask", yes,
     "With a vignette; all looks but LowDimRGBCurve have one anyway"},
    {"--no-mask", nullptr, "applyMask", no, "Without the vignette"},
    {"--r", "N,N,...", "r", curve,
     "Red out for red in at equal steps, two or more numbers from 0 (none) to 1 (full)"},
    {"--g", "N,N,...", "g", curve, "The same for green"},
    {"--b", "N,N,...", "b", curve, "The same for blue"},
    {"--s1", "S", "s1", strength, "First parameter of LowDimRGBCurve, 0 to 1; 0.5 unless given"},
    {"--s2", "S", "s2", strength, "The second one"},
    {"--s3", "S", "s3", strength, "The third one"},
    {"--s4", "S", "s4", strength, "The fourth one"},
    {"--slider", "S", "slider", strength,
     "Strength of AE0 and AE08bit, 0 (none) to 1; 0.4 unless given"},
};

void addSettings(Verb verb) {
  for (const Setting& setting : settings) {
    if (setting.type == nullptr) {
      verb.flag(setting.option, setting.description);
    } else {
      verb.option(setting.option, setting.description).type(setting.type);
    }
  }
  for (const char* vignette : {"--mask", "--mask-radius", "--mask-alpha"}) {
    verb.named("--no-mask").excludes(verb.named(vignette));
  }
}

std::string builtParameters(Verb verb, const FilterDescription& look) {
  const std::vector<std::string> known = parameterNames(look.name);
  const bool hasVignette = look.name != "LowDimRGBCurve" || verb.named("--mask").given();
  std::string params;
  for (const Setting& setting : settings) {
    const std::string name = setting.option;
    if (!verb.named(name).given()) continue;
    if (std::find(known.begin(), known.end(), setting.key) == known.end()) {
      throw UsageError(name + ": has no effect on " + look.name);
    }
    if (!hasVignette && (name == "--mask-radius" || name == "--mask-alpha")) {
      throw UsageError(name + ": " + look.name + " has no vignette; add --mask to give it one");
    }
    const std::string text = verb.named(name).text();
    params += setting.key + ("=" + setting.valueOf(name, text)) + ";";
  }
  return params.empty() && isAutoEnhance(look.name) ? "slider=0.4;" : params;
}

void refuseSettingsBesideParams(Verb verb) {
  for (const Setting& setting : settings) {
    if (!verb.named(setting.option).given()) continue;
    throw UsageError(std::string("--params: takes the place of ") + setting.option +
                     "; give only one of them");
  }
}

ExitCode runLook(const LookOptions& options) {
  const FilterDescription& look = lookNamed(options.look);
  if (!options.files.faces.empty() && !isAutoEnhance(look.name)) {
    throw UsageError("--face: has no effect on " + look.name);
  }
  const bool verbatim = options.verb.named("--params").given();
  if (verbatim) refuseSettingsBesideParams(options.verb);
  const std::string params = verbatim ? options.params : builtParameters(options.verb, look);
  const std::vector<std::string> warnings = checkParameters(look.name, params);

  Talk talk("look", options.files.report.quiet, 0);
  const std::vector<std::string> others = othersShownAs(look);
  if (!others.empty() && !equalInAnyCase(options.look, look.name)) {
    talk.note(fmt::format("note: '{}' is taken for {}; {} has the same display name", options.look,
                          look.name, fmt::join(others, ", ")));
  }
  for (const std::string& warning : warnings) {
    talk.note((verbatim ? "note: --params: " : "note: ") + warning);
  }
  return filterFiles("look", options.files, {look.name, params, {{"look", look.displayName}}});
}

}  // namespace

void addLook(CommandLine& commandLine) {
  const auto options = std::make_shared<LookOptions>();
  Verb verb = commandLine.addVerb(
      "look", "Give photos a look: a season, black and white, vintage, curves of your own",
      "quenby look winter photo.jpg -o winter.jpg\n"
      "quenby look Vintage -r holiday -o vintage/ -j 4 --name '{stem}_{look}.jpg'\n"
      "quenby look snow photo.jpg -o snow.jpg --no-mask\n"
      "quenby look summer photo.jpg -o summer.jpg --mask-radius 1.5 --mask-alpha 0.6\n"
      "quenby look fall photo.jpg -o fall.jpg --b 0,0.4,1\n"
      "quenby look StarFish photo.jpg -o mild.jpg --s1 0.7 --s3 0.4\n"
      "quenby look spring --raw 640x480 in.rgba -o out.rgba --params \"applyMask=0;\"",
      [options] { return runLook(*options); });
  options->verb = verb;
  verb.option("LOOK", options->look,
              "A name or display name of `quenby looks`, in any case; Auto is AE0")
      .required()
      .type("")
      .group("Input");
  addSettings(verb);
  verb.option("--params", options->params,
              "The look's own parameters in place of all these settings, "
              "for example \"applyMask=0;r=0,0.5,1,;\"");
  addFilterFilesOptions(verb, options->files, "{stem}, {filter} and {look}");
}

}  // namespace pelorin::cli

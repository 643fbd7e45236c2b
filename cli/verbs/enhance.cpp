#include <memory>
#include <string>

#include "cli/frame/errors.h"
#include "cli/frame/filter_files.h"
#include "cli/frame/filter_parameters.h"
#include "cli/frame/number_text.h"
#include "cli/verbs/verbs.h"

namespace pelorin::cli {
namespace {

struct EnhanceOptions {
  FilterFilesOptions files;
  std::string filter = "AE0";
  std::string slider = "0.4";
  std::string params;
  bool globalOnly = false;
  Option sliderGiven, paramsGiven;
};

std::string builtParameters(const EnhanceOptions& options) {
  if (!isAutoEnhance(options.filter)) {
    if (!options.sliderGiven.given() && !options.globalOnly) return "";
    throw UsageError("--filter: " + options.filter + " has no slider; use --params");
  }
  readSlider("--slider", options.slider);  // refuses what is none
  return "slider=" + options.slider + ";" + (options.globalOnly ? "gtmOnly=true;" : "");
}

ExitCode runEnhance(const EnhanceOptions& options) {
  requireFilter(options.filter);
  const bool verbatim = options.paramsGiven.given();
  if (verbatim && (options.sliderGiven.given() || options.globalOnly)) {
    throw UsageError("--params: takes the place of --slider and --global-only; give it alone");
  }
  const std::string params = verbatim ? options.params : builtParameters(options);
  const std::vector<std::string> warnings = checkParameters(options.filter, params);
  Talk talk("enhance", options.files.report.quiet, 0);
  for (const std::string& warning : warnings) talk.note("note: --params: " + warning);
  return filterFiles("enhance", options.files,
                     {options.filter, params, {{"slider", verbatim ? "" : options.slider}}});
}

}  // namespace

void addEnhance(CommandLine& commandLine) {
  const auto options = std::make_shared<EnhanceOptions>();
  Verb verb = commandLine.addVerb(
      "enhance", "Make photos better: tone, faces, detail and colour",
      "quenby enhance photo.jpg -o better.jpg\n"
      "quenby enhance photo.jpg -o better.jpg --slider 0.8 --face 0.4,0.1,0.6,0.4\n"
      "quenby enhance -r holiday -o better/ -j 4 --name '{stem}_{slider}.jpg'\n"
      "quenby enhance *.jpg -o better/ -n\n"
      "find . -name '*.jpg' | quenby enhance @- -o better/\n"
      "quenby enhance - -o - < photo.jpg > better.jpg\n"
      "quenby enhance --raw 640x480 in.rgba -o out.rgba --filter AE08bit",
      [options] { return runEnhance(*options); });
  verb.option("--filter", options->filter, "AE0 unless given; AE08bit needs less memory")
      .type("NAME");
  options->sliderGiven =
      verb.option("--slider", options->slider, "Strength from 0 (none) to 1; 0.4 unless given")
          .type("S");
  verb.flag("--global-only", options->globalOnly,
            "One tone curve for the whole picture, without local masks");
  options->paramsGiven =
      verb.option("--params", options->params,
                  "The filter's own parameters in place of --slider and --global-only, "
                  "for example \"slider=0.4;gtmOnly=true;\"");
  addFilterFilesOptions(verb, options->files, "{stem}, {filter} and {slider}");
}

}  // namespace pelorin::cli

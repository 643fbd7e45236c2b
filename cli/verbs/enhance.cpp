#include <memory>
#include <string>

#include "cli/frame/filter_files.h"
#include "cli/frame/filter_options.h"
#include "cli/frame/look_name.h"
#include "cli/verbs/verbs.h"
#include "image_processing/core/parameter_strings.h"

namespace pelorin::cli {
namespace {

struct EnhanceOptions {
  FilterFilesOptions files;
  std::string filter = "AE0";
  FilterOptions parameters;
};

ExitCode runEnhance(const EnhanceOptions& options) {
  const auto& filter = filterNamed(options.filter);
  Talk talk("enhance", options.files.report.quiet, 0);
  const std::string params = options.parameters.read(filter, talk);
  std::string slider;
  if (!options.parameters.verbatim()) {
    const image_processing::FilterParams given(params);
    if (given.items().contains("slider")) slider = given.at("slider");
  }
  return filterFiles("enhance", options.files,
                     {filter, params, {{"slider", slider}}, "enhanced already"});
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
      "quenby enhance -r holiday -o better/ --report better.html\n"
      "find . -name '*.jpg' -print0 | quenby enhance @- -o better/\n"
      "quenby enhance - -o - < photo.jpg > better.jpg\n"
      "quenby enhance --raw 640x480 in.rgba -o out.rgba --filter AE08bit",
      [options] { return runEnhance(*options); });
  verb.option("--filter", options->filter, "AE0 unless given; AE08bit needs less memory")
      .type("FILTER");
  options->parameters =
      FilterOptions(verb, {&filterNamed(options->filter)}, "slider=0.4;gtmOnly=true;");
  addFilterFilesOptions(verb, options->files, "{stem}, {filter}, {ext} and {slider}");
}

}  // namespace pelorin::cli

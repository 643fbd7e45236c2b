#include <fmt/format.h>
#include <fmt/ranges.h>

#include <memory>
#include <string>
#include <vector>

#include "cli/frame/filter_files.h"
#include "cli/frame/filter_options.h"
#include "cli/frame/look_name.h"
#include "cli/verbs/verbs.h"

namespace pelorin::cli {
namespace {

struct LookOptions {
  FilterFilesOptions files;
  std::string look;
  FilterOptions parameters;
};

ExitCode runLook(const LookOptions& options) {
  const auto& look = lookNamed(options.look);
  Talk talk("look", options.files.report.quiet, 0);
  const std::string params = options.parameters.read(look, talk);
  const std::vector<std::string> others = othersShownAs(look);
  if (!others.empty() && !equalInAnyCase(options.look, look.name)) {
    talk.note(fmt::format("note: '{}' is taken for {}; {} has the same display name", options.look,
                          look.name, fmt::join(others, ", ")));
  }
  return filterFiles("look", options.files,
                     {look, params, {{"look", look.displayName}}, "has the look already"});
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
  verb.option("LOOK", options->look,
              "A name or display name of `quenby looks`, in any case; Auto is AE0")
      .required()
      .type("")
      .group("Input");
  options->parameters = FilterOptions(verb, allFilters(), "applyMask=0;r=0,0.5,1,;");
  addFilterFilesOptions(verb, options->files, "{stem}, {filter}, {ext} and {look}");
}

}  // namespace pelorin::cli

#include <algorithm>
#include <filesystem>
#include <memory>
#include <vector>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/face_choice.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/json_output.h"
#include "cli/frame/lone_files.h"
#include "cli/frame/nearest_name.h"
#include "cli/frame/outputs.h"
#include "cli/frame/photo_files.h"
#include "cli/frame/raw_option.h"
#include "cli/pictures/grey_picture.h"
#include "cli/verbs/verbs.h"
#include "image_processing/autoenhance/auto_enhance_filter.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"

namespace pelorin::cli {
namespace {

using image_processing::Image;

struct MasksOptions {
  std::string input, raw;
  LoneOutputOptions outputs;
  ReportOptions report;
  std::string filter = "AE0";
  FaceOptions faces;
  bool exact = false;
};

struct Masks {
  std::shared_ptr<Image<float>> bilateral, ltm;
};

Masks masksOf(photo::Photo photo, const std::string& filter, const std::vector<Face>& faces,
              bool exact) {
  image_processing::FilterConfig config = image_processing::defaultFilterConfigValue;
  config.useBilateralGrid = exact ? 0 : 1;
  image_processing::FilteredImage session(
      photo.image, metadataWithFaces(faces, photo.image->width, photo.image->height), "", config,
      image_processing::DefaultFilterFactory::filterFactory());
  const auto prepared = session.setupFilter(filter, "");
  const auto& withMasks = dynamic_cast<const image_processing::AEFilterBase&>(*prepared);
  return {withMasks.getBilateralMask(), withMasks.getLtmMask()};
}

void writeMask(const std::string& path, const Image<float>& mask, bool raw,
               const photo::ReplaceOptions& replace) {
  if (raw) {
    writeOutput(path, {reinterpret_cast<const std::uint8_t*>(mask.data.get()), mask.byteSize()},
                replace);
  } else {
    savePicture(path, greyPicture(mask), {},
                {.colour = photo::ColourDetail::none, .replace = replace});
  }
}

void writeMasks(const Masks& masks, const std::string& bilateralPath, const std::string& ltmPath,
                bool raw, const photo::ReplaceOptions& replace) {
  const bool isNew = !std::filesystem::exists(bilateralPath);
  writeMask(bilateralPath, *masks.bilateral, raw, replace);
  try {
    writeMask(ltmPath, *masks.ltm, raw, replace);
  } catch (...) {
    // One mask without the other is half a result.
    if (isNew) std::filesystem::remove(bilateralPath);
    throw;
  }
}

ExitCode runMasks(const MasksOptions& options) {
  const std::vector<std::string> filters = {"AE0", "AE08bit"};
  if (std::find(filters.begin(), filters.end(), options.filter) == filters.end()) {
    throw UsageError("--filter: " + unknownName("filter with masks", options.filter, filters));
  }
  const FaceChoice faces(options.faces);
  photo::OpenOptions photoOptions = {.faces = faces.asksPhoto()};
  photoOptions.raw = readRawSize(options.raw);
  const bool raw = photoOptions.raw.has_value();

  const Input input = loneInput(options.input);
  const std::filesystem::path folder = options.outputs.output;
  const std::string extension = raw ? ".f32" : ".png";
  const std::string bilateralPath = folder / ("bilateral" + extension);
  const std::string ltmPath = folder / ("ltm" + extension);
  const std::vector<std::string> paths = {bilateralPath, ltmPath};
  Talk talk("masks", options.report, 1);
  JsonOutput json(options.report, true);
  if (const auto code = stopBeforeWork({input}, paths, options.outputs, talk, json)) return *code;

  const PhotoTally tally = eachPhoto<Masks>(
      {input}, /*jobs=*/1, talk,
      {.work =
           [&](std::size_t) {
             photo::Photo photo = loadPhoto(input, photoOptions, talk);
             const std::vector<Face> known = allFaces(faces.of(input), photo.faces);
             const Masks masks = masksOf(std::move(photo), options.filter, known, options.exact);
             const OutputFolders folders(paths);
             writeMasks(masks, bilateralPath, ltmPath, raw,
                        {.mayReplace = options.outputs.overwrite});
             return masks;
           },
       .done =
           [&](std::size_t, const Masks& masks) {
             json.add({{"file", input.path},
                       {"width", masks.ltm->width},
                       {"height", masks.ltm->height},
                       {"filter", options.filter},
                       {"outputs", paths}});
           }});
  return tally.exitCode(talk);
}

}  // namespace

void addMasks(CommandLine& commandLine) {
  const auto options = std::make_shared<MasksOptions>();
  options->outputs.makesFolder = true;
  Verb verb = commandLine.addVerb(
      "masks", "Write what auto-enhance sees of a photo: its two masks, as pictures",
      "quenby masks photo.jpg -o masks/\n"
      "quenby masks photo.jpg -o masks/ --face 0.4,0.1,0.6,0.4\n"
      "quenby masks pixels.rgba --raw 640x480 -o planes/\n",
      [options] { return runMasks(*options); });
  addLoneInput(verb, options->input);
  addLoneOutputOptions(verb, options->outputs, "DIR",
                       "The folder (made where it is missing) for bilateral.png, the smoothed "
                       "lightness, and ltm.png, the "
                       "flatness; with --raw bilateral.f32 and ltm.f32");
  verb.named("--output").required();
  verb.option("--filter", options->filter, "AE0 (unless given) or AE08bit").type("NAME");
  addFaceOptions(verb, options->faces);
  verb.flag("--exact", options->exact,
            "Smooth with the exact bilateral filter in place of the grid; slow");
  addRawOption(verb, options->raw);
  verb.named("--raw").help(
      "Read packed RGBA bytes of this size and write the masks as 32-bit floats of this "
      "machine's byte order, rows back to back");
  addReportOptions(verb, options->report);
}

}  // namespace pelorin::cli

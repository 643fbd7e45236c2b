#include <fmt/format.h>

#include <filesystem>
#include <memory>
#include <vector>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/face_choice.h"
#include "cli/frame/json_output.h"
#include "cli/frame/lone_files.h"
#include "cli/frame/number_text.h"
#include "cli/frame/photo_files.h"
#include "cli/frame/raw_option.h"
#include "cli/pictures/tone_curve_plot.h"
#include "cli/verbs/verbs.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/filters/filter_config.h"

namespace pelorin::cli {
namespace {

using image_processing::ImageStatistics;

struct CurveOptions {
  std::string input, raw;
  std::string slider = "0.4";
  LoneOutputOptions outputs;
  ReportOptions report;
  FaceOptions faces;
  bool text = false;
};

struct Curve {
  std::uint32_t width, height;
  std::size_t faces;
  ImageStatistics statistics;
  std::vector<float> samples;
};

Curve curveOf(const photo::Photo& photo, float slider, const std::vector<Face>& faces) {
  Curve curve{photo.image->width, photo.image->height, faces.size(), {}, {}};
  image_processing::analyzeImage(*photo.image, metadataWithFaces(faces, curve.width, curve.height),
                                 curve.statistics);
  image_processing::FilterConfig config = image_processing::defaultFilterConfigValue;
  image_processing::updateFilterConfigForSliderValue(slider, &config);
  curve.samples = image_processing::buildToneCurve(curve.statistics, config);
  return curve;
}

Plot plotOf(const Curve& curve, const Input& input, float slider) {
  const std::string name = input.isStandardInput()
                               ? "standard input"
                               : std::filesystem::path(input.path).filename().string();
  std::string about =
      fmt::format("{} \xC3\x97 {} pixels, slider {:g}", curve.width, curve.height, slider);
  if (curve.faces > 0)
    about += fmt::format(", {} {}", curve.faces, curve.faces == 1 ? "face" : "faces");
  return toneCurvePlot("Tone curve of " + name, about, curve.samples, curve.statistics.cdf,
                       curve.statistics.faceMedianBin);
}

Json numbers(const std::vector<float>& values) {
  Json list = Json::array();
  for (const float value : values) list.push_back(nineDigits(value));
  return list;
}

Json describe(const Curve& curve, const Input& input, float slider) {
  return {{"file", input.path},
          {"width", curve.width},
          {"height", curve.height},
          {"slider", nineDigits(slider)},
          {"faceMedianBin", curve.statistics.faceMedianBin},
          {"cdf", numbers(curve.statistics.cdf)},
          {"curve", numbers(curve.samples)}};
}

ExitCode runCurve(const CurveOptions& options) {
  const float slider = readSlider("--slider", options.slider);
  const FaceChoice faces(options.faces);
  photo::OpenOptions photoOptions = {.faces = faces.asksPhoto()};
  photoOptions.raw = readRawSize(options.raw);
  const Input input = loneInput(options.input);
  const std::string& output = options.outputs.output;
  JsonOutput json(options.report, true);
  if (output.empty() && !options.text && !json.wanted()) {
    throw UsageError("say what to make of the curve: -o PLOT.png, --text or --json");
  }
  if ((output == "-") + options.text + json.wanted() > 1) {
    throw UsageError("standard output takes one of -o -, --text and --json");
  }
  requireFormatOf(output, /*raw=*/false);
  Talk talk("curve", options.report, 1);
  const bool plotted = !output.empty();
  const std::vector<std::string> outputs(plotted ? 1 : 0, output);
  if (const auto code = stopBeforeWork({input}, outputs, options.outputs, talk, json)) return *code;

  const PhotoTally tally = eachPhoto<Curve>(
      {input}, /*jobs=*/1, talk,
      {.work =
           [&](std::size_t) {
             const photo::Photo photo = loadPhoto(input, photoOptions, talk);
             const Curve curve = curveOf(photo, slider, allFaces(faces.of(input), photo.faces));
             if (plotted) {
               savePicture(output, drawPlot(plotOf(curve, input, slider)), {},
                           drawing(options.outputs.overwrite));
             }
             return curve;
           },
       .done =
           [&](std::size_t, const Curve& curve) {
             for (const float sample : curve.samples) {
               if (options.text) fmt::print("{:.9g}\n", sample);
             }
             json.add(describe(curve, input, slider));
           }});
  return tally.exitCode(talk);
}

}  // namespace

void addCurve(CommandLine& commandLine) {
  const auto options = std::make_shared<CurveOptions>();
  Verb verb =
      commandLine.addVerb("curve", "Plot or print the tone curve that auto-enhance gives a photo",
                          "quenby curve photo.jpg --slider 0.6 -o curve.png\n"
                          "quenby curve photo.jpg --slider 0.6 --text\n"
                          "quenby curve photo.jpg --json\n",
                          [options] { return runCurve(*options); });
  addLoneInput(verb, options->input);
  verb.option("--slider", options->slider, "Strength from 0 (none) to 1; 0.4 unless given")
      .type("NUMBER");
  addFaceOptions(verb, options->faces);
  verb.flag("--text", options->text,
            "Print the 51 samples, one a line, with nine significant digits");
  addLoneOutputOptions(
      verb, options->outputs, "FILE",
      "The " + photo::pictureExtensions() + " file for the plot, or - (standard output)");
  addRawOption(verb, options->raw);
  addReportOptions(verb, options->report);
}

}  // namespace pelorin::cli

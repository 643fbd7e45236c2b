#include <fmt/format.h>

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "cli/frame/each_photo.h"
#include "cli/frame/face_choice.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/inputs.h"
#include "cli/frame/jobs_option.h"
#include "cli/frame/json_output.h"
#include "cli/frame/memory_option.h"
#include "cli/frame/number_text.h"
#include "cli/frame/photo_files.h"
#include "cli/frame/raw_option.h"
#include "cli/frame/shown_text.h"
#include "cli/verbs/histogram_chart.h"
#include "cli/verbs/verbs.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "image_processing/autoenhance/lightness/cdf.h"
#include "image_processing/autoenhance/photo_analysis.h"

namespace pelorin::cli {
namespace {

using image_processing::FilterConfig;
using image_processing::ImageStatistics;

struct InfoOptions {
  InputOptions inputs;
  ReportOptions report;
  FaceOptions faces;
  std::string raw;
  std::string slider = "0.4";
  int jobs = 0;
  int memory = usualMemory;
};

struct Info {
  std::uint32_t width, height;
  std::optional<photo::PhotoFacts> facts;
  std::vector<photo::KnownFace> faces;
  ImageStatistics statistics;
  std::vector<float> curve;
};

Info inspect(const Input& input, const photo::OpenOptions& options,
             const photo::RowResources& resources, const FaceChoice& faces, float slider,
             Talk& talk) {
  const photo::OpenedFile file = openInput(input, options);
  photo::PhotoRows photo(file.view(), limited(options), resources);
  Info info = {photo.size().width, photo.size().height, std::nullopt, photo.faces(), {}, {}};
  if (!options.raw) info.facts = photo.facts();
  const image_processing::ImageMetadata boxes =
      metadataWithFaces(allFaces(faces.of(input), photo.faces()), info.width, info.height);
  const image_processing::AnalysisSubject subject{info.width, info.height, boxes};
  info.statistics = *analysePhoto(subject, photo.sweep(/*again=*/false), {});
  tellNotices(input, photo.facts(), talk);
  FilterConfig config = image_processing::defaultFilterConfigValue;
  image_processing::updateFilterConfigForSliderValue(slider, &config);
  info.curve = image_processing::buildToneCurve(info.statistics, config);
  return info;
}

// As the face median: the first entry of the CDF that reaches one half.
std::size_t medianBin(const std::vector<float>& cdf) {
  const auto reached = std::find_if(cdf.begin(), cdf.end(), [](float sum) { return sum >= 0.5f; });
  return static_cast<std::size_t>(reached - cdf.begin());
}

double lightnessOf(std::size_t cdfEntry) {
  return static_cast<double>(cdfEntry) * 100.0 / 49.0;
}

std::vector<double> nineDigitsOf(const std::vector<float>& values) {
  std::vector<double> numbers;
  for (const float value : values) numbers.push_back(nineDigits(value));
  return numbers;
}

Json jsonOf(const Input& input, const Info& info, float slider) {
  Json object = {{"file", input.path}, {"width", info.width}, {"height", info.height}};
  if (info.facts) {
    object["storedWidth"] = info.facts->width;
    object["storedHeight"] = info.facts->height;
    object["components"] = info.facts->channels;
    object["progressive"] = info.facts->progressive;
    object["orientation"] = info.facts->orientation;
    object["captureTime"] = info.facts->captureTime ? Json(info.facts->captureTime->text) : Json();
    object["edits"] = Json::array();
    for (const photo::EditMark& mark : info.facts->edits) {
      object["edits"].push_back({{"filter", mark.filter},
                                 {"params", mark.params},
                                 {"version", mark.version},
                                 {"when", mark.when.empty() ? Json() : Json(mark.when)}});
    }
  }
  object["faces"] = Json::array();
  for (const photo::KnownFace& face : info.faces) {
    object["faces"].push_back({{"left", face.left},
                               {"top", face.top},
                               {"right", face.right},
                               {"bottom", face.bottom},
                               {"name", face.name}});
  }
  object["medianBin"] = medianBin(info.statistics.cdf);
  object["faceMedianBin"] = info.statistics.faceMedianBin;
  object["cdf"] = nineDigitsOf(info.statistics.cdf);
  object["slider"] = nineDigits(slider);
  object["curve"] = nineDigitsOf(info.curve);
  return object;
}

const char* kindOf(int components) {
  return components == 1 ? "grey" : components == 4 ? "CMYK" : "colour";
}

void printFacts(const Info& info) {
  fmt::print("  size         {} x {} (upright)\n", info.width, info.height);
  if (!info.facts) return;
  const photo::PhotoFacts& facts = *info.facts;
  fmt::print("  stored       {} x {}, {}, {}\n", facts.width, facts.height, kindOf(facts.channels),
             facts.progressive ? "progressive" : "baseline");
  fmt::print("  orientation  {}\n", facts.orientation);
  fmt::print("  taken        {}\n", facts.captureTime ? facts.captureTime->text : "unknown");
  for (const photo::EditMark& mark : facts.edits) {
    fmt::print("  edited       {} (Quenby {}{}{})\n", shownText(textOf(mark)),
               shownText(mark.version), mark.when.empty() ? "" : ", ", shownText(mark.when));
  }
  for (const photo::KnownFace& face : info.faces) {
    fmt::print("  face         {:.3f},{:.3f},{:.3f},{:.3f} {}\n", face.left, face.top, face.right,
               face.bottom, face.name);
  }
}

void printText(const Input& input, const Info& info, const std::string& slider) {
  fmt::print("{}\n", input.shownName());
  printFacts(info);
  fmt::print("  median       about lightness {:.0f} of 100\n",
             lightnessOf(medianBin(info.statistics.cdf)));
  if (info.statistics.faceMedianBin >= 0) {
    fmt::print("  face median  about lightness {:.0f} of 100\n",
               lightnessOf(static_cast<std::size_t>(info.statistics.faceMedianBin)));
  }
  std::vector<float> histogram;
  image_processing::computeHistogramFromCDF(info.statistics.cdf, histogram);
  fmt::print("  lightness histogram, dark to light\n{}", histogramChart(histogram, 8, "    "));
  fmt::print("  tone curve at slider {}, in percent\n    in  ", slider);
  for (std::size_t i = 0; i < info.curve.size(); i += 5) fmt::print("{:4}", 2 * i);
  fmt::print("\n    out ");
  for (std::size_t i = 0; i < info.curve.size(); i += 5) fmt::print("{:4.0f}", info.curve[i] * 100);
  fmt::print("\n");
}

ExitCode runInfo(const InfoOptions& options) {
  const float slider = readSlider("--slider", options.slider);
  const FaceChoice faces(options.faces);
  photo::OpenOptions photo = {.faces = faces.asksPhoto()};
  photo.raw = readRawSize(options.raw, options.inputs);
  const std::vector<Input> inputs = expandInputs(options.inputs);

  JsonOutput json(options.report, isSingleFile(options.inputs, inputs));
  Talk talk("info", options.report, inputs.size());
  KeptPixels pixels(options.memory, options.jobs, inputs.size());
  const PhotoTally tally = eachPhoto<Info>(
      inputs, options.jobs, talk,
      {.work =
           [&](std::size_t index) {
             const KeptPixels::Lent lent(pixels);
             return inspect(inputs[index], photo, lent.resources(), faces, slider, talk);
           },
       .done =
           [&](std::size_t index, const Info& info) {
             if (json.wanted()) {
               json.add(jsonOf(inputs[index], info, slider));
             } else {
               printText(inputs[index], info, options.slider);
             }
           },
       .failed =
           [&](std::size_t index, const std::string& reason) {
             json.add({{"file", inputs[index].path}, {"error", reason}});
           }});
  return tally.exitCode(talk);
}

}  // namespace

void addInfo(CommandLine& commandLine) {
  const auto options = std::make_shared<InfoOptions>();
  Verb verb = commandLine.addVerb(
      "info", "Tell a photo's size, orientation, time, lightness and tone curve",
      "quenby info photo.jpg\n"
      "quenby info --jsonl -r holiday\n"
      "quenby info photo.jpg --slider 0.8 --face 0.4,0.1,0.6,0.4\n"
      "quenby info --json --raw 640x480 - < in.rgba",
      [options] { return runInfo(*options); });
  addInputOptions(verb, options->inputs);
  verb.option("--slider", options->slider,
              "Strength, 0 to 1, whose tone curve is shown; 0.4 unless given")
      .type("S");
  addFaceOptions(verb, options->faces);
  addRawOption(verb, options->raw);
  addJobsOption(verb, options->jobs);
  addMemoryOption(verb, options->memory);
  addReportOptions(verb, options->report);
}

}  // namespace pelorin::cli

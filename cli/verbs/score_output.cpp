#include "cli/verbs/score_output.h"

#include <fmt/format.h>

#include <string>

#include "cli/frame/number_text.h"

namespace pelorin::cli {
namespace {

using image_processing::niqeModelId;

constexpr int featureCount = 36;

Json jsonOf(const Input& input, const ScoredPhoto& photo, bool withFeatures) {
  Json object = {{"file", input.path}, {"width", photo.width}, {"height", photo.height}};
  object["score"] = photo.isTooSmall() ? Json() : Json(nineDigits(photo.niqe.score));
  object["blocks"] = photo.blocks();
  object["blockColumns"] = photo.niqe.blockColumns;
  object["blockRows"] = photo.niqe.blockRows;
  object["model"] = niqeModelId;
  if (!withFeatures) return object;
  object["features"] = photo.isTooSmall() ? Json() : Json::array();
  for (const float mean : photo.niqe.meanFeatures) object["features"].push_back(nineDigits(mean));
  return object;
}

// A relative path may begin like a formula of a spreadsheet; behind "./" it is the same path.
std::string pathForCsv(const std::string& path) {
  const bool likeAFormula = path.find_first_of("=+-@\t\r") == 0;
  return likeAFormula && path != "-" ? "./" + path : path;
}

std::string quotedForCsv(const std::string& text) {
  if (text.find_first_of(",\"\r\n") == std::string::npos) return text;
  std::string quoted = "\"";
  for (const char letter : text) quoted.append(letter == '"' ? 2 : 1, letter);
  return quoted + "\"";
}

void printCsvHead(bool withFeatures) {
  fmt::print("file,width,height,score,blocks,model,error");
  for (int i = 0; withFeatures && i < featureCount; ++i) fmt::print(",feature{}", i);
  fmt::print("\n");
}

void printCsvRow(const Input& input, const ScoredPhoto& photo, bool withFeatures) {
  const std::string score = photo.isTooSmall() ? "" : fmt::format("{:.9g}", photo.niqe.score);
  fmt::print("{},{},{},{},{},{},", quotedForCsv(pathForCsv(input.path)), photo.width, photo.height,
             score, photo.blocks(), niqeModelId);
  if (withFeatures && photo.isTooSmall()) fmt::print("{:,<{}}", "", featureCount);
  for (const float mean : photo.niqe.meanFeatures) {
    if (withFeatures) fmt::print(",{:.9g}", mean);
  }
  fmt::print("\n");
}

void printCsvFailure(const Input& input, const std::string& error, bool withFeatures) {
  fmt::print("{},,,,,,{}{:,<{}}\n", quotedForCsv(pathForCsv(input.path)),
             quotedForCsv(shownText(error)), "", withFeatures ? featureCount : 0);
}

void printTableRow(const Input& input, const ScoredPhoto& photo) {
  const std::string score =
      photo.isTooSmall() ? "too small" : fmt::format("{:.4f}", photo.niqe.score);
  fmt::print("{:>9}  {:>6}  {}  {}\n", score, photo.blocks(), niqeModelId, input.shownName());
}

}  // namespace

ScoreOutput::ScoreOutput(const ScoreFormat& format, bool singleFile)
    : format_(format), singleFile_(singleFile), json_(format.report, singleFile) {
  if (json_.wanted()) return;
  if (format_.csv) {
    printCsvHead(format_.features);
  } else if (!format_.features) {
    fmt::print("{:>9}  {:>6}  {:<{}}  {}\n", "NIQE", "blocks", "model", sizeof(niqeModelId) - 1,
               "file");
  }
}

void ScoreOutput::add(const Input& input, const ScoredPhoto& photo) {
  if (json_.wanted()) {
    json_.add(jsonOf(input, photo, format_.features));
  } else if (format_.csv) {
    printCsvRow(input, photo, format_.features);
  } else if (!format_.features) {
    printTableRow(input, photo);
  } else {
    if (!singleFile_) fmt::print("# {}\n", input.shownName());
    for (const float mean : photo.niqe.meanFeatures) fmt::print("{:.9g}\n", mean);
  }
}

void ScoreOutput::addFailed(const Input& input, const std::string& error) {
  if (format_.csv && !json_.wanted()) printCsvFailure(input, error, format_.features);
  json_.add({{"file", input.path}, {"error", error}});
}

}  // namespace pelorin::cli

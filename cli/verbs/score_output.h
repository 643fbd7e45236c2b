#pragma once

#include <cstdint>

#include "cli/frame/inputs.h"
#include "cli/frame/json_output.h"
#include "image_processing/quality/niqe.h"

namespace pelorin::cli {

/// What a photo scores.
struct ScoredPhoto {
  std::uint32_t width, height;
  image_processing::NiqeAnalysis niqe;

  bool isTooSmall() const { return niqe.meanFeatures.empty(); }
  std::size_t blocks() const { return niqe.blockDistances.size(); }
};

/// How scores are printed, as the user said it; a table for a person unless one is set.
struct ScoreFormat {
  ReportOptions report;
  bool csv = false;
  bool features = false;
};

/// Scores on stdout, photo by photo.
class ScoreOutput {
 public:
  /// Prints what stands at the top.
  ScoreOutput(const ScoreFormat& format, bool singleFile);

  void add(const Input& input, const ScoredPhoto& photo);
  /// A photo that could not be read, for programs; a person is told elsewhere.
  void addFailed(const Input& input, const std::string& error);

 private:
  ScoreFormat format_;
  bool singleFile_;
  JsonOutput json_;
};

}  // namespace pelorin::cli

#pragma once

#include <string>
#include <vector>

#include "cli/frame/verb.h"
#include "photo/metadata/kept_metadata.h"

namespace pelorin::cli {

/// The options that say what a written file keeps of its photo's metadata.
struct KeepChoice {
  std::vector<std::string> strip, keep;
  std::string gainMap = "keep";
  bool strict = false;
};

/// Adds `--strip`, `--keep`, `--gain-map` and `--strict-metadata`.
void addKeepOptions(Verb verb, KeepChoice& choice);

/// @throws UsageError for something that cannot be stripped or kept.
photo::KeepOptions keepOptions(const KeepChoice& choice);

/// One line for a person: "C2PA manifest lost: an edit breaks its signature".
std::string lossText(const photo::Loss& loss);

/// @throws FileError when `strict` and something is lost.
void refuseLosses(const std::vector<photo::Loss>& lost, bool strict);

}  // namespace pelorin::cli

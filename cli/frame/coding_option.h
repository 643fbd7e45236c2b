#pragma once

#include <optional>
#include <string>

#include "cli/frame/verb.h"
#include "photo/options.h"

namespace pelorin::cli {

/// The options that say how JPEG files are coded.
struct CodingChoice {
  std::string quality, subsampling;
};

/// Adds `--quality`, which may be `auto`, and `--subsampling`.
void addCodingOptions(Verb verb, CodingChoice& choice);

/// @param otherwise  where the user did not say it.
/// @throws UsageError.
int qualityOf(const CodingChoice& choice, int otherwise);

/// Nothing where it is to be the photo's own.
std::optional<photo::ChromaSampling> samplingOf(const CodingChoice& choice);

}  // namespace pelorin::cli

#pragma once

#include <cstdint>

#include "cli/frame/verb.h"
#include "photo/decode_limits.h"

namespace pelorin::cli {

/// What a photo may cost at most. One for the process, which runs one verb: its options set it before
/// any work, and every thread reads it.
struct Limits {
  photo::DecodeLimits decode = {};
  std::uint32_t seconds = 0;  ///< For each photo; 0 for no limit.
};

/// Those of this run.
Limits limits();

/// Adds `--max-pixels`, `--max-bytes`, `--max-scans`, `--max-segments` and `--timeout` to a verb that reads
/// photos.
void addLimitOptions(Verb verb);

}  // namespace pelorin::cli

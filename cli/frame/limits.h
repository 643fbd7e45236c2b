#pragma once

#include <cstdint>

#include "cli/frame/verb.h"
#include "photo/decode_limits.h"
#include "photo/file_io.h"

namespace pelorin::cli {

/// What a photo may cost at most. One for the process, which runs one verb: its options set it before
/// any work, and every thread reads it.
struct Limits {
  photo::DecodeLimits decode = {};
  std::uint64_t bytes = photo::ReadOptions{}.largest;  ///< Of a photo's file.
  std::uint32_t seconds = 0;                           ///< For each photo; 0 for no limit.
};

/// Those of this run.
Limits limits();

/// Adds `--max-pixels`, `--max-bytes` and `--timeout` to a verb that reads photos.
void addLimitOptions(Verb verb);

}  // namespace pelorin::cli

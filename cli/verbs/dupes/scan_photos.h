#pragma once

#include <string>
#include <vector>

#include "cli/frame/inputs.h"
#include "cli/frame/talk.h"
#include "photo/collection/photo_cache.h"
#include "photo/collection/photo_library.h"

namespace pelorin::cli {

struct ScanOptions {
  int scale = photo::automaticScale;
  int jobs = 1;                 ///< As for `runJobs`.
  bool assumeFileTime = false;  ///< Photos without a capture time take that of their file.
  photo::PhotoCache* cache = nullptr;
};

struct ScanResult {
  photo::PhotoLibrary library;
  std::vector<photo::FailedPhoto> failed;
  std::string cacheTrouble;  ///< Why the cache could no longer be written; mostly empty.
  bool interrupted = false;
};

/// Reduces every input to what the search needs, each decoded at most once, or taken from the
/// cache. A file that cannot be read is said and listed, and stops nothing.
/// @throws CacheError when the cache cannot be read.
ScanResult scanPhotos(const std::vector<Input>& inputs, const ScanOptions& options, Talk& talk);

/// The inputs without those that name the same path again, also through links.
std::vector<Input> withoutRepetitions(const std::vector<Input>& inputs);

}  // namespace pelorin::cli

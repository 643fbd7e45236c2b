#pragma once

#include <cstddef>

#include "cli/frame/verb.h"
#include "photo/photo_rows.h"

namespace pelorin::cli {

/// MiB of `--memory` where it is not given.
inline constexpr int usualMemory = 128;

/// For verbs that go over a photo no more than twice, where `--memory` is not given: as much for photos
/// that must be kept, but the others are decoded again unless all at once are small.
inline constexpr int thriftyMemory = -1;

/// Adds `--memory MIB` to a verb.
void addMemoryOption(Verb verb, int& mebibytes);

/// The memory that files at once share for their decoded pixels.
class KeptPixels {
 public:
  /// @param mebibytes  as `--memory` says, or `thriftyMemory`.
  /// @param jobs       as `-j` says.
  KeptPixels(int mebibytes, int jobs, std::size_t files);

  /// For one of the files. They refer to this, and to what stays with the thread that calls.
  photo::RowResources resources();

 private:
  std::uint64_t each_, spared_;
  photo::PixelBudget budget_;
};

}  // namespace pelorin::cli

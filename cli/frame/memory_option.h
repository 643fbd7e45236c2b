#pragma once

#include <cstddef>

#include "cli/frame/verb.h"
#include "photo/photo_rows.h"

namespace pelorin::cli {

/// MiB of `--memory` where it is not given.
inline constexpr int usualMemory = 128;

/// Adds `--memory MIB` to a verb.
void addMemoryOption(Verb verb, int& mebibytes);

/// The memory that files at once share for their decoded pixels.
class KeptPixels {
 public:
  /// @param mebibytes  as `--memory` says.
  /// @param jobs       as `-j` says.
  KeptPixels(int mebibytes, int jobs, std::size_t files);

  /// For one of the files. They refer to this, and to what stays with the thread that calls.
  photo::RowResources resources();

 private:
  std::uint64_t each_;
  photo::PixelBudget budget_;
};

}  // namespace pelorin::cli

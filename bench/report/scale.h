#pragma once

#include <string>
#include <vector>

#include "cli/pictures/plot.h"

namespace pelorin::bench {

/// How time and memory grow with a photo.
struct Scale {
  std::string tables;  ///< Of times and of memory, in Markdown.
  cli::Plot time, memory;
};

/// Filters photos of 1 to 200 megapixels, each in a process of its own.
/// @param command  the quenby command.
Scale measureScale(const std::string& command);

}  // namespace pelorin::bench

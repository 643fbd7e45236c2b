#pragma once

#include <exception>

namespace pelorin::image_processing {

/// What workers throw that were told to stop: no error of the work, which nobody wants any more.
class WorkStopped : public std::exception {
 public:
  const char* what() const noexcept override { return "stopped"; }
};

}  // namespace pelorin::image_processing

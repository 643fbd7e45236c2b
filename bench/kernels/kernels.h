#pragma once

#include <functional>
#include <string>
#include <vector>

#include "image_processing/core/image.h"

namespace pelorin::bench {

/// A loop over the pixels of one picture, ready to run any number of times.
struct Kernel {
  std::string name;             ///< Without blanks; what tables and recorded counts call it.
  std::function<void()> run;    ///< On the instruction set that Highway was told to use.
  std::function<void()> plain;  ///< The definition that `run` is compared with; may be empty.
};

/// Every kernel of the engine on `photo`, whose pixels are shared, and the steps they make up.
/// What one kernel needs of another is computed here, once.
std::vector<Kernel> kernelsOn(const image_processing::Image<image_processing::RGBA8Pixel>& photo);

}  // namespace pelorin::bench

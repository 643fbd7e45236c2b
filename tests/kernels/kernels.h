#pragma once

#include <cstddef>
#include <functional>
#include <span>
#include <string>
#include <vector>

#include "tests/kernels/kernel_pictures.h"

namespace pelorin::test_support {

/// A loop over the pixels of one picture, ready to run any number of times. It holds what it needs.
struct Kernel {
  std::function<void()> vectors;     ///< On the instruction set that Highway was told to use.
  std::function<void()> definition;  ///< Empty for a step.
  /// What either wrote last, and the room behind it that nobody may write into; empty for a step.
  std::function<std::span<std::byte>()> written;
};

enum class Shape {
  row,      ///< One pixel after the other, whatever the width.
  picture,  ///< By rows and columns.
  step,     ///< Made up of kernels, with no definition of its own.
};

/// How a kernel is known to the test of definitions, `./quenby bench`, its --check and its
/// --report.
struct KernelRow {
  std::string name;  ///< Without blanks; what tables and recorded counts call it.
  Shape shape;
  /// Makes the kernel on a picture, whose pixels are shared. What it needs of other kernels is
  /// computed here.
  Kernel (*on)(const Image<RGBA8Pixel>& photo);
  /// What it is timed on besides a photo, because the time depends on it.
  std::vector<PictureKind> otherPictures = {};
};

/// Every kernel of the engine, and the steps they make up.
const std::vector<KernelRow>& kernelRows();

}  // namespace pelorin::test_support

#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "cli/frame/inputs.h"
#include "cli/frame/verb.h"
#include "image_processing/core/image.h"

namespace pelorin::cli {

/// Size of pictures given as packed RGBA bytes, rows back to back.
struct RawSize {
  std::uint32_t width, height;
};

/// Adds `--raw WxH`; `text` is for `readRawSize`.
void addRawOption(Verb verb, std::string& text);

/// @throws UsageError when `text` is not like "640x480" with both sides above 0.
RawSize readRawSize(const std::string& text);

/// @throws FileError when there are more or fewer bytes than the size needs,
///         std::system_error when they cannot be read.
std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> readRawPixels(
    const Input& input, RawSize size);

}  // namespace pelorin::cli

#pragma once

#include <optional>
#include <string>

#include "cli/frame/inputs.h"
#include "cli/frame/verb.h"
#include "photo/picture_size.h"

namespace pelorin::cli {

/// Adds `--raw WxH`; `text` is for `readRawSize`.
void addRawOption(Verb verb, std::string& text);

/// @returns nothing when `text` is empty.
/// @throws UsageError when it is not like "640x480" with both sides above 0.
std::optional<photo::PictureSize> readRawSize(const std::string& text);

/// The same for a verb that takes several inputs.
/// @throws UsageError also for folders, which hold photos.
std::optional<photo::PictureSize> readRawSize(const std::string& text, const InputOptions& inputs);

}  // namespace pelorin::cli

#pragma once

#include <string>

#include "cli/frame/verb.h"
#include "photo/picture_size.h"

namespace pelorin::cli {

/// Adds `--raw WxH`; `text` is for `readRawSize`.
void addRawOption(Verb verb, std::string& text);

/// @throws UsageError when `text` is not like "640x480" with both sides above 0.
photo::PictureSize readRawSize(const std::string& text);

}  // namespace pelorin::cli

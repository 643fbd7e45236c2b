#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "photo/metadata/capture_time.h"
#include "photo/metadata/edit_mark.h"

namespace pelorin::photo {

/// What a file says of its picture; the size is the stored one, before scaling and turning.
struct PhotoFacts {
  std::string_view format = {};  ///< Its name in the table of formats: "JPEG".
  std::uint32_t width = 0, height = 0;
  int channels = 3;          ///< 1 grey, 2 grey and alpha, 3 colour, 4 CMYK or colour and alpha.
  bool progressive = false;  ///< Or interlaced: its rows come only when all of it was read.
  bool hasAlpha = false;
  int orientation = 1;  ///< EXIF, 1 ... 8.
  std::optional<CaptureTime> captureTime = {};
  std::vector<EditMark> edits = {};  ///< Those that Quenby left marks of, in their order.
  std::vector<std::string> notices =
      {};  ///< What a user should know: "16 bits a channel, read as 8".
};

}  // namespace pelorin::photo

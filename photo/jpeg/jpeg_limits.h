#pragma once

#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/libjpeg_reader.h"

namespace pelorin::photo {

/// After readHeader and before anything else: whether the file stays within `limits`.
/// @throws PhotoError when it does not.
void checkLimits(LibjpegReader& reader, const DecodeLimits& limits);

}  // namespace pelorin::photo

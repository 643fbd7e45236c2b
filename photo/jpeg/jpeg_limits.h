#pragma once

#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/libjpeg_reader.h"

namespace pelorin::imgproc {

/// After readHeader and before anything else: whether the file stays within `limits`.
/// @throws JpegError when it does not.
void checkLimits(LibjpegReader& reader, const DecodeLimits& limits);

}  // namespace pelorin::imgproc

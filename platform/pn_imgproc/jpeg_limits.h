#pragma once

#include "platform/pn_imgproc/jpeg_codec.h"
#include "platform/pn_imgproc/libjpeg_reader.h"

namespace pelorin::imgproc {

/// After readHeader and before anything else: whether the file stays within `limits`.
/// @throws JpegError when it does not.
void checkLimits(LibjpegReader& reader, const DecodeLimits& limits);

}  // namespace pelorin::imgproc

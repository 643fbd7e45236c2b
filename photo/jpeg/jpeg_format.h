#pragma once

#include "photo/format.h"

namespace pelorin::photo {

extern const Format jpegFormat;

}  // namespace pelorin::photo

#pragma once

#include "photo/format.h"

namespace pelorin::photo {

extern const Format pngFormat;

}  // namespace pelorin::photo

#pragma once

#include "photo/format.h"

namespace pelorin::photo {

extern const Format rawFormat;

}  // namespace pelorin::photo

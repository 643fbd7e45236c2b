#pragma once

#include <string>

namespace pelorin::photo {

/// What this build makes of pictures that are computed: lines of a filter, score or codec, its
/// parameters, the picture and a hash of the result. The same on every machine, to the byte.
/// @throws std::bad_alloc.
std::string selftestTable();

}  // namespace pelorin::photo

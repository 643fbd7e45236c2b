#pragma once

#include <string>

namespace pelorin::bench {

/// The table of one picture of 12 megapixels on several cores.
std::string threadsTable();

}  // namespace pelorin::bench

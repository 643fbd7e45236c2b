#pragma once

#include <string>

namespace pelorin::bench {

/// Peak memory of the quenby command, from start to end of the process, on photos of 12 and of 200
/// megapixels, verb by verb.
/// @param command  the quenby command.
/// @returns a Markdown table.
std::string memoryTable(const std::string& command);

}  // namespace pelorin::bench

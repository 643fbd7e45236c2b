#pragma once

#include <string>

namespace pelorin::bench {

/// Times the quenby command on one JPEG file of 12 megapixels, from start to end of the process, on
/// each instruction set of the columns, beside the codec's floor.
/// @param command   the quenby command.
/// @param avx2Command  the same command, kept to AVX2.
/// @returns a Markdown table.
std::string wholeFileTable(const std::string& command, const std::string& avx2Command);

}  // namespace pelorin::bench

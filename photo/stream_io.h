#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "photo/file_io.h"

namespace pelorin::photo {

// Pipes, terminals and devices, where anything may have to be waited for: never for ever where nobody
// is at the other end, and never deaf to a stop token.

/// All that comes out of an open stream. Where it does not block, as pipes are opened here, nobody may
/// write to it yet.
/// @throws as `readFile`.
std::vector<std::uint8_t> readToEnd(int descriptor, const std::string& path,
                                    const ReadOptions& options);

/// Writes into a file that is no ordinary one.
/// @throws std::system_error; PhotoError when nobody reads from a pipe; Stopped.
void writeStream(const std::string& path, std::span<const std::uint8_t> bytes, const Waiting& wait);

}  // namespace pelorin::photo

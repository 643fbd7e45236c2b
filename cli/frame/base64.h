#pragma once

#include <cstdint>
#include <span>
#include <string>

namespace pelorin::cli {

/// Bytes as text in the usual alphabet, padded with "=".
std::string base64(std::span<const std::uint8_t> bytes);

}  // namespace pelorin::cli

#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace pelorin::cli {

/// Bytes as text in the usual alphabet, padded with "=".
std::string base64(std::span<const std::uint8_t> bytes);

/// The bytes behind such a text; nothing where it is none.
std::optional<std::string> fromBase64(std::string_view text);

}  // namespace pelorin::cli

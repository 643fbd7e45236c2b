#pragma once

#include <nlohmann/json.hpp>
#include <string>

namespace pelorin::test_support {

/// `nlohmann::json::parse`, which is slow to compile, compiled once.
/// @throws nlohmann::json::parse_error.
nlohmann::json parsedJson(const std::string& text);

}  // namespace pelorin::test_support

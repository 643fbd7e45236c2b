#include "tests/cli/parsed_json.h"

namespace pelorin::test_support {

nlohmann::json parsedJson(const std::string& text) {
  return nlohmann::json::parse(text);
}

}  // namespace pelorin::test_support

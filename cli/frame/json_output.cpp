#include "cli/frame/json_output.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <string>
#include <utility>

#include "cli/frame/base64.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/shown_text.h"

namespace pelorin::cli {
namespace {

bool isBytes(const Json& value) {
  return value.is_string() && !isUtf8(value.get_ref<const std::string&>());
}

std::string base64Of(const Json& text) {
  const std::string& bytes = text.get_ref<const std::string&>();
  return base64({reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size()});
}

// The bytes of a text, or of a list of texts of which one is none of UTF-8; else nothing.
Json bytesOf(const Json& value) {
  if (isBytes(value)) return base64Of(value);
  if (!value.is_array() || std::none_of(value.begin(), value.end(), isBytes)) return nullptr;
  Json list = Json::array();
  for (const Json& entry : value) list.push_back(entry.is_string() ? Json(base64Of(entry)) : entry);
  return list;
}

Json withBytes(const Json& value) {
  if (!value.is_structured()) return value;
  Json result = value.is_array() ? Json::array() : Json::object();
  for (const auto& [name, member] : value.items()) {
    if (value.is_array()) {
      result.push_back(withBytes(member));
      continue;
    }
    result[name] = withBytes(member);
    if (Json bytes = bytesOf(member); !bytes.is_null()) result[name + "Base64"] = std::move(bytes);
  }
  return result;
}

std::string textOf(const Json& object, int indent) {
  return withBytes(object).dump(indent, ' ', false, Json::error_handler_t::replace);
}

}  // namespace

std::string textOf(const Json& object) {
  return textOf(object, -1);
}

JsonOutput::JsonOutput(const ReportOptions& options, bool singleFile)
    : json_(options.json), lines_(options.jsonLines), single_(singleFile) {
  if (json_ && !single_) setLastWords("[]\n");
}

void JsonOutput::add(const Json& members) {
  Json object = {{"schema", jsonSchema}};
  object.update(members);
  if (lines_) {
    std::printf("%s\n", textOf(object, -1).c_str());
    std::fflush(stdout);
  } else if (json_ && single_) {
    std::printf("%s\n", textOf(object, 2).c_str());
  } else if (json_) {
    setLastWords(nullptr);
    std::printf("%s%s", begun_ ? ",\n" : "[\n", textOf(object, -1).c_str());
    std::fflush(stdout);
    setLastWords("\n]\n");
    begun_ = true;
  }
}

JsonOutput::~JsonOutput() {
  if (!json_ || single_) return;
  setLastWords(nullptr);
  std::fputs(begun_ ? "\n]\n" : "[]\n", stdout);
}

}  // namespace pelorin::cli

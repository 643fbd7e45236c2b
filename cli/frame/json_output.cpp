#include "cli/frame/json_output.h"

#include <cstdio>
#include <string>

namespace pelorin::cli {
namespace {

// File names may be any bytes; JSON is UTF-8.
std::string textOf(const Json& object, int indent) {
  return object.dump(indent, ' ', false, Json::error_handler_t::replace);
}

}  // namespace

void JsonOutput::add(const Json& object) {
  if (lines_) {
    std::printf("%s\n", textOf(object, -1).c_str());
    std::fflush(stdout);
  } else if (json_ && single_) {
    std::printf("%s\n", textOf(object, 2).c_str());
  } else if (json_) {
    std::printf("%s%s", begun_ ? ",\n" : "[\n", textOf(object, -1).c_str());
    begun_ = true;
  }
}

JsonOutput::~JsonOutput() {
  if (json_ && !single_) std::fputs(begun_ ? "\n]\n" : "[]\n", stdout);
}

}  // namespace pelorin::cli

#include "cli/frame/raw_option.h"

#include <string_view>

#include "cli/frame/errors.h"
#include "cli/frame/number_text.h"

namespace pelorin::cli {

void addRawOption(Verb verb, std::string& text) {
  verb.option("--raw", text, "Read packed RGBA bytes of this size instead of photos")
      .type("WxH")
      .group("Raw pixels");
}

std::optional<photo::PictureSize> readRawSize(const std::string& text) {
  if (text.empty()) return std::nullopt;
  const std::size_t x = text.find('x');
  if (x == std::string::npos) {
    throw UsageError("--raw: '" + text + "' is not a size, for example 640x480");
  }
  const std::string_view sides = text;
  return photo::PictureSize{readPositiveInteger("--raw", sides.substr(0, x)),
                            readPositiveInteger("--raw", sides.substr(x + 1))};
}

std::optional<photo::PictureSize> readRawSize(const std::string& text, const InputOptions& inputs) {
  if (!text.empty() && inputs.recursive) {
    throw UsageError("--raw: name the files, folders hold photos");
  }
  return readRawSize(text);
}

}  // namespace pelorin::cli

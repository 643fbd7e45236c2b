#include "photo/raw/raw_pixels.h"

#include <fmt/format.h>

#include <filesystem>
#include <utility>
#include <vector>

#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/number_text.h"
#include "image_processing/core/checked_size.h"

namespace pelorin::cli {

using image_processing::Image;
using image_processing::RGBA8Pixel;

void addRawOption(Verb verb, std::string& text) {
  verb.option("--raw", text, "Read and write packed RGBA bytes of this size instead of JPEG files")
      .type("WxH")
      .group("Raw pixels");
}

RawSize readRawSize(const std::string& text) {
  const std::size_t x = text.find('x');
  if (x == std::string::npos) {
    throw UsageError("--raw: '" + text + "' is not a size, for example 640x480");
  }
  const std::string_view sides = text;
  return {readPositiveInteger("--raw", sides.substr(0, x)),
          readPositiveInteger("--raw", sides.substr(x + 1))};
}

std::shared_ptr<Image<RGBA8Pixel>> readRawPixels(const Input& input, RawSize size) {
  const std::uint64_t needed =
      image_processing::checkedProduct(size.width, size.height, sizeof(RGBA8Pixel));
  const auto requireNeeded = [&](std::uint64_t found) {
    if (found == needed) return;
    throw FileError(fmt::format("holds {} bytes, but {}x{} raw pixels are {} bytes; check --raw",
                                found, size.width, size.height, needed));
  };
  std::error_code ignored;
  if (std::filesystem::is_regular_file(input.path, ignored)) {
    requireNeeded(std::filesystem::file_size(input.path));
  }
  auto bytes = std::make_shared<std::vector<std::uint8_t>>(readInput(input));
  requireNeeded(bytes->size());
  auto* first = reinterpret_cast<RGBA8Pixel*>(bytes->data());
  return std::make_shared<Image<RGBA8Pixel>>(size.width, size.height,
                                             std::shared_ptr<RGBA8Pixel>(std::move(bytes), first));
}

}  // namespace pelorin::cli

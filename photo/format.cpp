#include "photo/format.h"

#include <algorithm>
#include <array>
#include <cctype>

#include "photo/jpeg/jpeg_format.h"
#include "photo/photo_error.h"
#include "photo/png/png_format.h"
#include "photo/raw/raw_format.h"
#include "photo/unsupported_formats.h"

namespace pelorin::photo {
namespace {

// The usual one first; raw pixels last: no bytes tell that they are some.
std::span<const Format> table() {
  static const std::array rows = {jpegFormat, pngFormat, rawFormat};
  return rows;
}

std::span<const Format> pictureTable() {
  return table().first(table().size() - 1);
}

bool sameExtension(std::string_view a, std::string_view b) {
  return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](char x, char y) {
    return std::tolower(static_cast<unsigned char>(x)) ==
           std::tolower(static_cast<unsigned char>(y));
  });
}

bool has(const Format& format, std::string_view extension) {
  return std::any_of(format.extensions.begin(), format.extensions.end(),
                     [&](std::string_view known) { return sameExtension(known, extension); });
}

std::string listed(const std::vector<std::string_view>& names) {
  std::string text;
  for (std::size_t i = 0; i < names.size(); ++i) {
    if (i > 0) text += i + 1 == names.size() ? " or " : ", ";
    text += names[i];
  }
  return text;
}

}  // namespace

std::span<const Format> formats() {
  return table();
}

const Format& rawPixels() {
  return table().back();
}

const Format& usualFormat() {
  return table().front();
}

const Format& formatOf(std::span<const std::uint8_t> file) {
  if (file.empty()) throw PhotoError(PhotoError::Kind::empty, "is empty, not a photo");
  for (const Format& format : pictureTable()) {
    if (format.recognises(file)) return format;
  }
  if (const UnsupportedFormat* other = unsupportedFormatOf(file)) {
    throw PhotoError(PhotoError::Kind::unsupported,
                     std::string(other->name) +
                         "; convert it first, for example with: " + std::string(other->conversion));
  }
  throw PhotoError(PhotoError::Kind::notAPhoto, "not a " + pictureFormats() + " file");
}

const Format* formatNamed(std::string_view name) {
  const auto found = std::find_if(table().begin(), table().end(),
                                  [&](const Format& format) { return format.name == name; });
  return found == table().end() ? nullptr : &*found;
}

const Format* formatWithExtension(std::string_view extension) {
  const auto found = std::find_if(table().begin(), table().end(),
                                  [&](const Format& format) { return has(format, extension); });
  return found == table().end() ? nullptr : &*found;
}

bool isPictureExtension(std::string_view extension) {
  const Format* format = formatWithExtension(extension);
  return format != nullptr && format != &rawPixels();
}

std::string pictureFormats() {
  std::vector<std::string_view> names;
  for (const Format& format : pictureTable()) names.push_back(format.name);
  return listed(names);
}

std::string pictureExtensions() {
  std::vector<std::string_view> names;
  for (const Format& format : pictureTable())
    names.insert(names.end(), format.extensions.begin(), format.extensions.end());
  return listed(names);
}

std::string lossyFormats() {
  std::vector<std::string_view> names;
  for (const Format& format : pictureTable()) {
    if (format.losesDetail) names.push_back(format.name);
  }
  return listed(names);
}

}  // namespace pelorin::photo

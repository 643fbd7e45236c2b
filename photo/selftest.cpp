#include "photo/selftest.h"

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <memory>
#include <string_view>
#include <vector>

#include "image_processing/core/number_text.h"
#include "image_processing/dupe/green_cdf.h"
#include "image_processing/features/brief.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "image_processing/quality/niqe.h"
#include "photo/faces.h"
#include "photo/photo.h"

namespace pelorin::photo {
namespace {

using namespace image_processing;
using Picture = Image<RGBA8Pixel>;

struct Sample {
  std::string name;
  std::shared_ptr<Picture> picture;
};

std::string hexadecimal(std::uint64_t value) {
  char text[16];
  return {text, std::to_chars(text, text + sizeof text, value, 16).ptr};
}

// FNV-1a in 64 bits.
std::string hashOf(const void* bytes, std::size_t count) {
  const auto* const byte = static_cast<const unsigned char*>(bytes);
  std::uint64_t hash = 0xCBF29CE484222325u;
  for (std::size_t i = 0; i < count; ++i) hash = (hash ^ byte[i]) * 0x100000001B3u;
  const std::string text = hexadecimal(hash);
  return std::string(16 - text.size(), '0') + text;
}

std::string hashOf(const Picture& picture) {
  return hashOf(picture.data.get(), picture.byteSize());
}

// Shading, hard edges, saturated areas and grain, of integers alone.
Sample sample(std::uint32_t width, std::uint32_t height) {
  auto picture = std::make_shared<Picture>(width, height);
  std::uint32_t random = width * 65537 + height;
  const auto wave = [](std::uint32_t at, std::uint32_t period) {
    const std::uint32_t phase = at % (2 * period);
    return static_cast<int>((phase < period ? phase : 2 * period - phase) * 255 / period);
  };
  const auto byte = [](int value) { return static_cast<std::uint8_t>(std::clamp(value, 0, 255)); };
  for (std::uint32_t y = 0; y < height; ++y) {
    for (std::uint32_t x = 0; x < width; ++x) {
      random = random * 1664525 + 1013904223;
      const int grain = static_cast<int>(random >> 28) - 8;
      int light = (2 * wave(x + 2 * y, 149) + wave(3 * x + y, 61)) / 3 + grain;
      if (x / 23 % 3 == 1 && y / 31 % 2 == 0) light = light / 4;
      const int tint = y / 17 % 4 == 2 ? wave(x, 37) - 128 : 16;
      picture->row(y)[x] = {byte(light + tint), byte(light), byte(light - tint),
                            byte(255 - static_cast<int>(x % 7))};
    }
  }
  return {std::to_string(width) + "x" + std::to_string(height), picture};
}

std::vector<std::string> parametersFor(const FilterDescription& filter) {
  const auto rows = filter.parameters().rows;
  const auto has = [&](std::string_view name) {
    return std::any_of(rows.begin(), rows.end(), [&](const auto& row) { return row.name == name; });
  };
  if (has("slider")) {
    return {"slider=0;", "slider=0.4;", "slider=1;", "slider=0.7;gtmOnly=true;"};
  }
  if (has("s1")) return {"", "s1=0.9;s2=0.2;s3=0.35;s4=0.8;applyMask=1;"};
  if (has("applyMask")) return {"", "applyMask=0;"};
  return {""};
}

class Table {
 public:
  void add(std::string_view what, std::string_view parameters, std::string_view picture,
           std::string_view hash) {
    addColumn(what, 14);
    addColumn(parameters.empty() ? "-" : parameters, 42);
    addColumn(picture, 12);
    text.append(hash) += '\n';
  }
  std::string text;

 private:
  void addColumn(std::string_view words, std::size_t width) {
    text.append(words).append(std::max(width, words.size()) - words.size() + 1, ' ');
  }
};

void addFilters(Table& table, Sample from) {
  const std::uint32_t width = from.picture->width, height = from.picture->height;
  for (const bool faces : {false, true}) {
    const std::vector<Face> boxes = {{0.25f, 0.2f, 0.5f, 0.6f}, {0.6f, 0.5f, 1.1f, 0.9f}};
    FilteredImage session(from.picture,
                          metadataWithFaces(faces ? boxes : std::vector<Face>(), width, height), "",
                          defaultFilterConfigValue, DefaultFilterFactory::filterFactory());
    for (const auto& [name, filter] : DefaultFilterFactory::filterFactory()->descriptions) {
      if (faces && !filter->parameters().readsFaces) continue;
      for (const std::string& parameters : parametersFor(*filter)) {
        Picture output(width, height);
        session.applyFilterWithParams(name, parameters, defaultFilterConfigValue, output);
        table.add(name, parameters, from.name + (faces ? ",faces" : ""), hashOf(output));
      }
    }
  }
}

void addMeasures(Table& table, const Sample& from) {
  GreenCDF cdf;
  computeGreenCDF(*from.picture, cdf);
  table.add("green CDF", "", from.name, hashOf(cdf.data(), sizeof(cdf)));
  const NiqeAnalysis niqe = analyzeNiqe(*from.picture);
  if (!niqe.meanFeatures.empty()) {
    table.add("NIQE", roundedText(niqe.score, 6), from.name,
              hashOf(niqe.meanFeatures.data(), niqe.meanFeatures.size() * sizeof(float)));
  }
  Image<unsigned char> grey(from.picture->width, from.picture->height);
  for (std::uint32_t y = 0; y < grey.height; ++y) {
    for (std::uint32_t x = 0; x < grey.width; ++x) grey.row(y)[x] = from.picture->row(y)[x].g;
  }
  std::string descriptors;
  for (const BriefDescriptor& found : computeBriefDescriptors(grey, 20)) {
    descriptors += std::to_string(found.center.x) + " " + std::to_string(found.center.y);
    for (const std::uint32_t word : found.descriptor)
      descriptors.append(" ").append(hexadecimal(word));
  }
  table.add("keypoints", "20", from.name, hashOf(descriptors.data(), descriptors.size()));
}

void addCodec(Table& table, const Sample& from) {
  for (const int quality : {90, 40}) {
    SaveOptions options;
    options.quality = quality;
    const std::vector<std::uint8_t> file = save(*from.picture, "JPEG", {}, options);
    const std::string parameters = "quality " + std::to_string(quality);
    table.add("JPEG coded", parameters, from.name, hashOf(file.data(), file.size()));
    table.add("JPEG decoded", parameters, from.name, hashOf(*open(file).image));
    table.add("JPEG halved", parameters, from.name, hashOf(*open(file, {.scale = 2}).image));
  }
}

}  // namespace

std::string selftestTable() {
  Table table;
  for (const auto& [width, height] : {std::pair{160u, 120u}, {333u, 250u}, {97u, 131u}, {1u, 1u}}) {
    const Sample from = sample(width, height);
    addFilters(table, from);
    addMeasures(table, from);
    addCodec(table, from);
  }
  return table.text;
}

}  // namespace pelorin::photo

// An editing session as a sequence of calls, with faces: what a call gives depends on the calls of the same
// filter before it, which keeps some parameters, and on nothing else.
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <map>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include "fuzz/bytes.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"

using namespace pelorin::image_processing;

namespace {

std::int32_t placeAlong(std::uint32_t side, Bytes& bytes) {
  return static_cast<std::int32_t>(bytes.next() % (2 * side)) - static_cast<std::int32_t>(side / 2);
}

struct Call {
  std::string params;
  FilterConfig config;
};

Image<RGBA8Pixel> filteredAlone(const Image<RGBA8Pixel>& picture, const ImageMetadata& faces,
                                const std::string& filter, const std::vector<Call>& calls) {
  auto photo = std::make_shared<Image<RGBA8Pixel>>(picture);
  FilteredImage session(photo, faces, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(picture.width, picture.height);
  for (const Call& call : calls)
    session.applyFilterWithParams(filter, call.params, call.config, output);
  return output;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Bytes bytes(data, size);
  const std::uint32_t width = 1 + bytes.next() % 40, height = 1 + bytes.next() % 40;
  auto photo = std::make_shared<Image<RGBA8Pixel>>(width, height);
  const std::uint8_t slope = bytes.next(), texture = bytes.next();
  for (std::uint32_t i = 0; i < width * height; ++i) {
    const auto level = static_cast<std::uint8_t>(i * slope / 8 + i * i % (texture + 1u));
    photo->data.get()[i] = {level, static_cast<std::uint8_t>(level / 2 + 40),
                            static_cast<std::uint8_t>(255 - level), 255};
  }
  ImageMetadata metadata;
  for (int faces = bytes.next() % 4; faces > 0; --faces) {
    const std::int32_t left = placeAlong(width, bytes), top = placeAlong(height, bytes);
    metadata.faces.push_back(
        std::make_shared<BoundingBox>(BoundingBox{.left = left,
                                                  .right = placeAlong(width, bytes),
                                                  .bottom = placeAlong(height, bytes),
                                                  .top = top}));
  }

  const auto factory = DefaultFilterFactory::filterFactory();
  FilteredImage session(photo, metadata, "", defaultFilterConfigValue, factory);
  std::map<std::string, std::vector<Call>> callsOf;
  for (int i = 0; i < 6 && !bytes.empty(); ++i) {
    const auto& filters = factory->descriptions;
    const std::string& name = std::next(filters.begin(), bytes.next() % filters.size())->first;
    std::string params = "slider=" + std::to_string(bytes.next() / 200.0) + ";";
    if (bytes.next() % 4 == 0) params += "gtmOnly=true;maskAlpha=0.5;s1=0.7;";
    FilterConfig config = defaultFilterConfigValue;
    updateFilterConfigForSliderValue(static_cast<float>(bytes.next()) / 128.0f, &config);
    Image<RGBA8Pixel> output(width, height);
    if (!session.applyFilterWithParams(name, params, config, output)) std::abort();
    std::vector<Call>& calls = callsOf[name];
    calls.push_back({params, config});
    const Image<RGBA8Pixel> expected = filteredAlone(*photo, metadata, name, calls);
    if (std::memcmp(output.data.get(), expected.data.get(), output.byteSize()) != 0) std::abort();
    if (session.applyFilterWithParams("none", params, config, output)) std::abort();
  }
  return 0;
}

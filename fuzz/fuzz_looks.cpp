// A parameter string and a small picture through every look: the filter must not fail, and what it
// does must equal the scalar definition.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <string>
#include <vector>

#include "image_processing/filters/looks/low_dim_rgb_curve_filter.h"
#include "image_processing/filters/looks/preset_looks.h"

namespace pelorin::image_processing {
namespace {

template <typename Filter>
void check(const std::string& params, const Image<RGBA8Pixel>& picture) {
  Filter filter(std::make_shared<FilteredImageState>(
      FilteredImageState{std::make_shared<Image<RGBA8Pixel>>(picture), {}, "", {}}));
  filter.init(params);
  Image<RGBA8Pixel> output(picture.width, picture.height);
  output.set({});
  filter.applyConfig(params, defaultFilterConfigValue, output);

  std::vector<float> red, green, blue;
  filter.getRGBCurves(red, green, blue, params);
  replaceCurves(red, green, blue, params);
  Look look{{LookCurve(red), LookCurve(green), LookCurve(blue)}, Filter::channelMix};
  float edge, centre;
  bool applyMask;
  filter.getRadialMaskParameters(edge, centre, look.maskRadius, look.maskAlpha, applyMask);
  replaceMaskSettings(look.maskRadius, look.maskAlpha, applyMask, params);
  const CubicRadialMask mask(edge, centre, 400);
  if (applyMask) look.vignette = &mask;
  Image<RGBA8Pixel> expected(picture.width, picture.height);
  expected.set({});
  applyLookScalar(look, picture, expected);
  if (std::memcmp(output.data.get(), expected.data.get(), output.byteSize()) != 0) std::abort();
}

// Keys and values by number, so that random bytes find them.
std::string pickedParameters(const std::uint8_t* bytes, std::size_t count) {
  static constexpr const char* keys[] = {"maskRadius", "maskAlpha", "applyMask", "r",  "g",
                                         "b",          "s1",        "s2",        "s3", "s4"};
  static constexpr const char* values[] = {"0", "1",   "0.5",  "-1",   "nan",   "inf",   "1e-40",
                                           "",  "1e9", "2.28", "-inf", "-0.01", "1e300", "0.25"};
  std::string params;
  for (std::size_t i = 0; i < count; ++i) {
    const std::size_t which = bytes[i] / 3;
    if (bytes[i] % 3 == 0) {
      params.append(";").append(keys[which % std::size(keys)]).append("=");
    } else {
      params.append(values[which % std::size(values)]).append(bytes[i] % 3 == 1 ? "," : "");
    }
  }
  return params.append(";");
}

// The bytes as pixels, again from the first when they do not suffice.
Image<RGBA8Pixel> pictureOf(std::uint32_t width, std::uint32_t height, const std::uint8_t* bytes,
                            std::size_t count) {
  Image<RGBA8Pixel> picture(width, height);
  std::uint8_t* const channels = &picture.data->r;
  for (std::size_t i = 0; i < picture.byteSize(); ++i) channels[i] = bytes[i % count];
  return picture;
}

}  // namespace
}  // namespace pelorin::image_processing

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace pelorin::image_processing;
  if (size < 5) return 0;
  const std::uint32_t width = 1 + data[0] % 64;
  const bool large = data[1] == 17;
  const std::uint8_t* const body = data + 4;
  const std::size_t bodySize = size - 4;
  const std::size_t picked = std::min<std::size_t>(data[2] % 32, bodySize);
  const std::size_t text = std::min<std::size_t>(data[3], bodySize - picked);
  const std::string params =
      pickedParameters(body, picked) + std::string(body + picked, body + picked + text);
  const std::uint32_t rows = static_cast<std::uint32_t>(bodySize / 4 / width + 1);
  // Some paths pay on large pictures only.
  const Image<RGBA8Pixel> picture =
      large ? pictureOf(512 + width, 320, body, bodySize) : pictureOf(width, rows, body, bodySize);
  check<ZebraBWFilter>(params, picture);
  check<SummerRGBFilter>(params, picture);
  check<VintageRGBFilter>(params, picture);
  check<LowDimRGBCurveFilter>(params, picture);
  return 0;
}

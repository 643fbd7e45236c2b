#include "tests/cli/verbs/dupes/photo_library_files.h"

namespace pelorin::test_support {

namespace {

// Dark land under a bright sky, each of some texture. Between shots of two of them the distance is
// above 0.6, between shots of one below 0.2, in exposures of 60 to 100 percent.
struct Scene {
  int dark, darkTexture, bright, brightTexture, percentDark;
};
constexpr Scene scenes[] = {
    {60, 8, 220, 30, 75}, {0, 0, 120, 15, 0}, {20, 8, 180, 60, 75}, {90, 8, 220, 30, 75}};

}  // namespace

Image<RGBA8Pixel> sceneShot(int scene, int exposure, std::uint32_t width, std::uint32_t height) {
  const auto [dark, darkTexture, bright, brightTexture, percentDark] = scenes[scene];
  Image<RGBA8Pixel> picture(width, height);
  for (std::uint32_t y = 0; y < height; ++y) {
    const bool isLand = y * 100 >= height * static_cast<std::uint32_t>(100 - percentDark);
    for (std::uint32_t x = 0; x < width; ++x) {
      const int texture = static_cast<int>((x / 8 * 7 + y / 8 * 5) % 31) - 15;
      const int light =
          isLand ? dark + texture * darkTexture / 15 : bright + texture * brightTexture / 15;
      const auto green = static_cast<std::uint8_t>(light * exposure / 100);
      const auto dim = static_cast<std::uint8_t>(green / 2);
      picture.row(y)[x] = {isLand ? green : dim, green, isLand ? dim : green, 255};
    }
  }
  return picture;
}

Bytes sceneJpeg(int scene, int exposure, const ExifFields& exif, std::uint32_t width,
                std::uint32_t height) {
  std::vector<photo::MetadataSegment> metadata;
  if (exif.orientation != 0 || !exif.dateTime.empty()) {
    metadata.push_back({0xE1, exifPayload(exif, /*littleEndian=*/true)});
  }
  return jpegOf(sceneShot(scene, exposure, width, height), metadata);
}

ExifFields takenAt(const std::string& clock, const std::string& subSeconds,
                   const std::string& offset, int orientation) {
  return {orientation, "2024:05:01 " + clock, subSeconds, offset};
}

}  // namespace pelorin::test_support

#pragma once

#include <string>

#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {

/// A picture of scene 0, 1, 2 or 3, which differ in any exposure.
/// @param exposure  percent of the scene's light.
Image<RGBA8Pixel> sceneShot(int scene, int exposure, std::uint32_t width = 320,
                            std::uint32_t height = 240);

/// The same as a JPEG file with these Exif fields.
Bytes sceneJpeg(int scene, int exposure, const ExifFields& exif, std::uint32_t width = 320,
                std::uint32_t height = 240);

/// Exif fields of a photo taken at "12:34:56" on one day, upright unless said otherwise.
ExifFields takenAt(const std::string& clock, const std::string& subSeconds = "",
                   const std::string& offset = "", int orientation = 1);

}  // namespace pelorin::test_support

#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

#include "image_processing/core/image.h"

namespace pelorin::test_support {

/// A folder of its own for a test, gone with it.
class TemporaryFolder {
 public:
  TemporaryFolder();
  ~TemporaryFolder();
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  std::string file(const std::string& name) const { return (path_ / name).string(); }
  /// Names of the files in it, in order.
  std::vector<std::string> names() const;

 private:
  std::filesystem::path path_;
};

/// Writes `picture` with the codec the tests use.
void writePicture(const std::string& path,
                  const image_processing::Image<image_processing::RGBA8Pixel>& picture);

std::vector<std::uint8_t> contentOf(const std::string& path);

}  // namespace pelorin::test_support

#include "tests/jni/support/picture_files.h"

#include <stdlib.h>

#include <algorithm>
#include <stdexcept>

#include "photo/file_io.h"
#include "photo/jpeg/jpeg_codec.h"

namespace pelorin::test_support {

TemporaryFolder::TemporaryFolder() {
  std::string pattern = (std::filesystem::temp_directory_path() / "natives-XXXXXX").string();
  if (mkdtemp(pattern.data()) == nullptr) throw std::runtime_error("no temporary folder");
  path_ = pattern;
}

TemporaryFolder::~TemporaryFolder() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

std::vector<std::string> TemporaryFolder::names() const {
  std::vector<std::string> all;
  for (const auto& entry : std::filesystem::directory_iterator(path_))
    all.push_back(entry.path().filename().string());
  std::sort(all.begin(), all.end());
  return all;
}

void writePicture(const std::string& path,
                  const image_processing::Image<image_processing::RGBA8Pixel>& picture) {
  photo::writeFileAtomically(
      path, photo::encodeJpeg(&picture.data.get()->r, picture.width, picture.height, 95));
}

std::vector<std::uint8_t> contentOf(const std::string& path) {
  return photo::readFile(path);
}

}  // namespace pelorin::test_support

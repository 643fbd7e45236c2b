#include "bench/report/photos.h"

#include <unistd.h>

#include <algorithm>
#include <filesystem>

#include "bench/report/child.h"
#include "photo/file_io.h"
#include "photo/jpeg/jpeg_codec.h"
#include "tests/support/pictures.h"

namespace fs = std::filesystem;

namespace pelorin::bench {

using image_processing::Image;
using image_processing::RGBA8Pixel;

void fillWithPhoto(Image<RGBA8Pixel>& picture) {
  static const Image<RGBA8Pixel> tile = test_support::photoLikePicture(2000, 1500, 1);
  for (std::uint32_t y = 0; y < picture.height; ++y) {
    for (std::uint32_t x = 0; x < picture.width; x += tile.width) {
      std::copy_n(tile.row(y % tile.height), std::min(tile.width, picture.width - x),
                  picture.row(y) + x);
    }
  }
}

PhotoFiles::PhotoFiles(PhotoSize size, int count)
    : folder_(fs::temp_directory_path() / ("quenby-report-" + std::to_string(getpid()))) {
  fs::create_directories(folder());
  fs::create_directories(results());
  // In a child, so that this process stays small.
  inChild([&] {
    Image<RGBA8Pixel> picture(size.width, size.height);
    fillWithPhoto(picture);
    photo::writeFileAtomically(
        first(), photo::encodeJpeg(&picture.data.get()->r, size.width, size.height, 90));
    return Spent{};
  });
  for (int i = 1; i < count; ++i) {
    fs::create_hard_link(first(), folder() + "/" + std::to_string(i) + ".jpg");
  }
}

PhotoFiles::~PhotoFiles() {
  std::error_code ignored;
  fs::remove_all(folder_, ignored);
}

}  // namespace pelorin::bench

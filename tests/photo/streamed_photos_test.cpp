#include <gtest/gtest.h>

#include <array>
#include <iterator>
#include <string>
#include <vector>

#include "image_processing/filters/default_filter_factory.h"
#include "photo/filter_photo.h"
#include "tests/photo/filtered_by_picture.h"
#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"
#include "tests/support/slow_build.h"

// Files that are filtered by rows, by one thread or many, against the whole picture in a session.
namespace pelorin::photo {
namespace {

using namespace image_processing;
using test_support::byPicture;
using test_support::Bytes;
using test_support::JpegRecipe;
using test_support::makeJpeg;
using test_support::noisePicture;
using test_support::photoLikePicture;
using test_support::Random;
using test_support::slowBuild;
using test_support::threads;

bool chance(Random& random, int percent) {
  return static_cast<int>(random.below(100)) < percent;
}

// Most sides are short, some are 300 pixels long.
std::uint32_t randomSide(Random& random) {
  const double x = static_cast<double>(random.below(1000)) / 1000;
  return 1 + static_cast<std::uint32_t>(x * x * x * 300);
}

struct RandomPhoto {
  explicit RandomPhoto(std::uint64_t seed) {
    Random random(seed);
    const std::uint32_t width = randomSide(random), height = randomSide(random);
    what = std::to_string(seed) + ": " + std::to_string(width) + " x " + std::to_string(height);
    makeFile(random, width, height);
    makeRequest(random);
  }

  void makeFile(Random& random, std::uint32_t width, std::uint32_t height) {
    if (chance(random, 15)) {  // with transparency
      file = save(chance(random, 50) ? noisePicture(width, height, random.next32())
                                     : photoLikePicture(width, height, random.next32()),
                  "PNG");
      what += " PNG";
      return;
    }
    JpegRecipe recipe{.width = width, .height = height};
    test_support::ExifFields exif;
    exif.orientation = static_cast<int>(random.below(9));
    recipe.metadata = {{0xE1, test_support::exifPayload(exif, chance(random, 50))}};
    if (chance(random, 30)) recipe.horizontalSampling = recipe.verticalSampling = 1;
    const int kind = static_cast<int>(random.below(4));
    if (kind == 1) recipe.samples = recipe.stored = JCS_GRAYSCALE;
    if (kind == 2) recipe.samples = recipe.stored = JCS_CMYK;
    if (kind == 3) recipe.scans = test_support::completeProgressiveScans();
    file = makeJpeg(recipe);
    what += std::array{" JPEG", " grey JPEG", " CMYK JPEG", " progressive JPEG"}[kind];
  }

  void makeRequest(Random& random) {
    const auto& filters = DefaultFilterFactory::filterFactory()->descriptions;
    auto filter = filters.begin();
    std::advance(filter, random.below(static_cast<std::uint32_t>(filters.size())));
    if (chance(random, 40)) filter = filters.find(chance(random, 50) ? "AE0" : "AE08bit");
    request.filter = filter->first;
    if (filter->first.starts_with("AE")) {
      request.params = "slider=0." + std::to_string(random.below(10)) + ";";
      if (chance(random, 10)) request.params += "gtmOnly=true;";
    }
    for (std::size_t i = random.below(3); i > 0 && filter->first.starts_with("AE"); --i) {
      const float left = static_cast<float>(random.below(80)) / 100, top = left / 2;
      request.faces.push_back({left, top, left + 0.2f, top + 0.4f});
    }
    request.open.rotate = chance(random, 15) ? 90 : 0;
    request.open.scale = chance(random, 15) ? 2 : 1;
    what += ", " + request.filter + " " + request.params;
  }

  std::string what;
  Bytes file;
  FilterRequest request;
};

TEST(StreamedPhotos, AreTheFilesOfWholePictures) {
  constexpr std::uint64_t photos = slowBuild ? 20 : 500;
  constexpr std::array<std::size_t, 4> counts = {1, 2, 3, 8};
  constexpr std::array<std::uint32_t, 4> bandHeights = {1, 16, 64, 0};
  for (std::uint64_t seed = 0; seed < photos; ++seed) {
    const RandomPhoto photo(seed);
    const Bytes expected = byPicture(photo.file, photo.request);
    for (std::size_t i = 0; i < counts.size(); ++i) {
      // All pairs of a number of threads and of rows within four photos.
      const RowResources resources{.pixels = (seed + i) % 3 == 0 ? 0 : std::uint64_t{1} << 30,
                                   .workers = counts[i] == 1 ? nullptr : &threads(counts[i]),
                                   .bandHeight = bandHeights[(seed + i) % bandHeights.size()]};
      ASSERT_EQ(filterPhoto(photo.file, photo.request, nullptr, resources).file, expected)
          << photo.what << ", " << counts[i] << " threads, bands of " << resources.bandHeight;
    }
  }
}

TEST(StreamedPhotos, AreNoFilesWhereTheEndOfAPhotoIsDamaged) {
  constexpr std::uint64_t photos = slowBuild ? 5 : 60;
  for (std::uint64_t seed = 1000; seed < 1000 + photos; ++seed) {
    RandomPhoto photo(seed);
    photo.file.resize(photo.file.size() * 9 / 10);
    for (Workers* const workers : {static_cast<Workers*>(nullptr), &threads(3)}) {
      for (const std::uint64_t pixels : {std::uint64_t{0}, std::uint64_t{1} << 30}) {
        EXPECT_THROW(
            filterPhoto(photo.file, photo.request, nullptr, {.pixels = pixels, .workers = workers}),
            PhotoError)
            << photo.what;
      }
    }
  }
}

}  // namespace
}  // namespace pelorin::photo

#include <gtest/gtest.h>
#include <sys/resource.h>

#include <cstdlib>
#include <memory>
#include <vector>

#include "photo/filter_photo.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/slow_build.h"

namespace pelorin::photo {
namespace {

using image_processing::RGBA8Pixel;
using test_support::Bytes;

/// A file of `count` times the same 16 rows, which are coded once: they stand between restart markers.
Bytes jpegOfRepeatedRows(std::uint32_t width, std::uint32_t count) {
  constexpr std::uint32_t rows = 16;
  Bytes pixels;
  for (std::uint32_t i = 0; i < rows * width; ++i) {
    const auto level = static_cast<std::uint8_t>(40 + i % width / 16 % 160);
    pixels.insert(pixels.end(), {level, static_cast<std::uint8_t>(level + 10), 90});
  }
  const Bytes once = test_support::makeJpeg(
      {.width = width, .height = rows, .restartInterval = static_cast<int>((width + 15) / 16)},
      pixels);
  const auto bytesFrom = [](std::uint32_t value) {
    return Bytes{static_cast<std::uint8_t>(value >> 8), static_cast<std::uint8_t>(value)};
  };
  const std::size_t frame = test_support::findSegment(once, 0xC0);
  const std::size_t scan = test_support::findSegment(once, 0xDA);
  const std::size_t data = scan + 2 + once[scan + 2] * 256u + once[scan + 3];
  const std::size_t end = once.size() - 2;
  Bytes file(once.begin(), once.begin() + static_cast<std::ptrdiff_t>(data));
  const Bytes height = bytesFrom(rows * count);
  std::copy(height.begin(), height.end(), file.begin() + static_cast<std::ptrdiff_t>(frame) + 5);
  file.reserve(data + (end - data + 2) * count);
  for (std::uint32_t i = 0; i < count; ++i) {
    file.insert(file.end(), once.begin() + static_cast<std::ptrdiff_t>(data),
                once.begin() + static_cast<std::ptrdiff_t>(end));
    file.push_back(0xFF);
    file.push_back(static_cast<std::uint8_t>(i + 1 < count ? 0xD0 + i % 8 : 0xD9));
  }
  return file;
}

// 1024 megapixels, which are 4096 MB decoded, in 256 MiB of addresses.
TEST(Gigapixel, PhotoIsEnhancedInAQuarterOfAGibibyte) {
  if (std::getenv("QUENBY_GIGAPIXEL") == nullptr)
    GTEST_SKIP() << "takes half a minute; `./quenby test gigapixel` runs it";
  if (test_support::slowBuild) GTEST_SKIP() << "sanitizers take more addresses than there are";
  constexpr rlim_t addresses = rlim_t{256} << 20;
  const rlimit limit = {addresses, addresses};
  ASSERT_EQ(setrlimit(RLIMIT_AS, &limit), 0);
  constexpr std::uint32_t side = 32000;
  OpenOptions open;
  open.limits.pixels = std::uint64_t{side} * side;
  const FilteredPhoto made =
      filterPhoto(jpegOfRepeatedRows(side, side / 16),
                  {.filter = "AE0", .params = "slider=0.4;", .open = open}, nullptr, {.pixels = 0});
  EXPECT_EQ(made.size, (PictureSize{side, side}));

  open.scale = 8;
  const std::unique_ptr<RowReader> reader = openRows(made.file, open);  // is whole
  std::vector<RGBA8Pixel> row(reader->size().width);
  std::uint64_t sum = 0;
  for (std::uint32_t y = 0; y < reader->size().height; ++y) {
    reader->read(row.data(), 1);
    sum += row[y % row.size()].g;
  }
  EXPECT_GT(sum / reader->size().height, 60u);
  rusage used;
  getrusage(RUSAGE_SELF, &used);
  RecordProperty("peak_MiB", static_cast<int>(used.ru_maxrss / 1024));
  EXPECT_LT(used.ru_maxrss, 200 * 1024);
}

}  // namespace
}  // namespace pelorin::photo

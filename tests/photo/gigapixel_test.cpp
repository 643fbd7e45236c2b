#include <gtest/gtest.h>
#include <sys/resource.h>

#include <cstdlib>
#include <memory>
#include <vector>

#include "photo/filter_photo.h"
#include "photo/long_file.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/slow_build.h"
#include "tests/support/temporary_folder.h"

namespace pelorin::photo {
namespace {

using image_processing::RGBA8Pixel;
using test_support::Bytes;

/// A file of `count` times the same 16 rows, which are coded once: they stand between restart markers.
class RepeatedRows : public ByteSource {
 public:
  RepeatedRows(std::uint32_t width, std::uint32_t count);

  const Bytes& head() const { return head_; }
  FileView file() { return {head_, this}; }
  std::uint64_t size() const override { return std::uint64_t{rows_.size()} * count_; }
  void read(std::uint64_t place, std::span<std::uint8_t> bytes) override;

 private:
  Bytes head_, rows_;  // of which the last byte says which they are
  std::uint32_t count_;
};

RepeatedRows::RepeatedRows(std::uint32_t width, std::uint32_t count) : count_(count) {
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
  head_.assign(once.begin(), once.begin() + static_cast<std::ptrdiff_t>(data));
  // Of the last rows, a file may have fewer.
  const Bytes height = bytesFrom(std::min(rows * count, 65500u));
  std::copy(height.begin(), height.end(), head_.begin() + static_cast<std::ptrdiff_t>(frame) + 5);
  rows_.assign(once.begin() + static_cast<std::ptrdiff_t>(data),
               once.begin() + static_cast<std::ptrdiff_t>(end));
  rows_.insert(rows_.end(), {0xFF, 0});
}

void RepeatedRows::read(std::uint64_t place, std::span<std::uint8_t> bytes) {
  for (std::uint8_t& byte : bytes) {
    const auto at = static_cast<std::size_t>(place % rows_.size());
    const auto number = static_cast<std::uint32_t>(place / rows_.size());
    const bool isMark = at + 1 == rows_.size();
    byte = !isMark ? rows_[at]
                   : static_cast<std::uint8_t>(number + 1 < count_ ? 0xD0 + number % 8 : 0xD9);
    ++place;
  }
}

// A limit of addresses holds for the rest of a process, and so does its peak: the test runs each photo
// in a process of its own.
void enhance(std::uint32_t side, bool inMemory, long mostMiB) {
  if (std::getenv("QUENBY_GIGAPIXEL") == nullptr)
    GTEST_SKIP() << "takes half a minute; `./quenby test gigapixel` runs it";
  if (test_support::slowBuild) GTEST_SKIP() << "sanitizers take more addresses than there are";
  constexpr rlim_t addresses = rlim_t{256} << 20;
  const rlimit limit = {addresses, addresses};
  ASSERT_EQ(setrlimit(RLIMIT_AS, &limit), 0);
  OpenOptions open;
  open.limits.pixels = std::uint64_t{side} * side;
  RepeatedRows source(side, (side + 15) / 16);
  const Bytes file = inMemory ? wholeOf(source.file()) : Bytes();
  const test_support::TemporaryFolder folder;
  TemporaryStore overflow(folder.path());
  const FilteredPhoto made = filterPhoto(inMemory ? file : source.file(),
                                         {.filter = "AE0",
                                          .params = "slider=0.4;",
                                          .open = open,
                                          .save = {.overflow = inMemory ? nullptr : &overflow}},
                                         nullptr, {.pixels = 0});
  EXPECT_EQ(made.size, (PictureSize{side, side}));

  open.scale = 8;
  const std::unique_ptr<RowReader> reader = openRows({made.file, &overflow}, open);  // is whole
  std::vector<RGBA8Pixel> row(reader->size().width);
  std::uint64_t sum = 0;
  for (std::uint32_t y = 0; y < reader->size().height; ++y) {
    reader->read(row.data(), 1);
    sum += row[y % row.size()].g;
  }
  EXPECT_GT(sum / reader->size().height, 60u);
  rusage used;
  getrusage(RUSAGE_SELF, &used);
  testing::Test::RecordProperty("peak_MiB", static_cast<int>(used.ru_maxrss / 1024));
  EXPECT_LT(used.ru_maxrss, mostMiB * 1024);
}

// 1024 megapixels, which are 4096 MB decoded, in 256 MiB of addresses, its two files in memory.
TEST(Gigapixel, PhotoIsEnhancedInAQuarterOfAGibibyte) {
  enhance(32000, /*inMemory=*/true, 200);
}

// The largest of all JPEG files, whose bytes come and go as they are needed.
TEST(Gigapixel, LargestPhotoIsEnhancedInLess) {
  enhance(65500, /*inMemory=*/false, 128);
}

}  // namespace
}  // namespace pelorin::photo

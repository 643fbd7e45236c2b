#include "photo/long_file.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>
#include <random>
#include <stdexcept>

#include "photo/filter_photo.h"
#include "photo/jpeg/jpeg_end.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/temporary_folder.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::TemporaryFolder;

/// The bytes of a vector from a place on, of which reading those from `broken` on fails.
class Kept : public ByteSource {
 public:
  Kept(const Bytes& bytes, std::size_t begin, std::size_t broken = SIZE_MAX)
      : bytes_(bytes), begin_(begin), broken_(broken) {}

  std::uint64_t size() const override { return bytes_.size() - begin_; }
  void read(std::uint64_t place, std::span<std::uint8_t> bytes) override {
    const std::size_t from = begin_ + static_cast<std::size_t>(place);
    if (from + bytes.size() > broken_) throw std::runtime_error("broken");
    ASSERT_LE(from + bytes.size(), bytes_.size());
    std::copy_n(bytes_.data() + from, bytes.size(), bytes.data());
  }

 private:
  const Bytes& bytes_;
  std::size_t begin_, broken_;
};

Bytes noise(std::size_t size, unsigned seed) {
  std::mt19937 random(seed);
  Bytes bytes(size);
  for (std::uint8_t& byte : bytes) byte = static_cast<std::uint8_t>(random());
  return bytes;
}

/// A JPEG file of some 11 MB.
const Bytes& largePhoto() {
  constexpr std::uint32_t width = 2000, height = 1500;
  static const Bytes file = test_support::makeJpeg({.width = width,
                                                    .height = height,
                                                    .horizontalSampling = 1,
                                                    .verticalSampling = 1,
                                                    .quality = 100},
                                                   noise(std::size_t{width} * height * 3, 1));
  return file;
}

Bytes filtered(const FileView& file, ByteStore* overflow = nullptr) {
  FilteredPhoto made = filterPhoto(
      file,
      {.filter = "AE0",
       .params = "slider=0.4;",
       .save = {.quality = 100, .sampling = ChromaSampling{1, 1}, .overflow = overflow}},
      nullptr, {.pixels = 0});
  return wholeOf({made.file, overflow});
}

TEST(FileView, OfAPhotoWhoseRestIsElsewhereGivesTheSameFile) {
  Bytes file = test_support::makeJpeg({.width = 300, .height = 200, .restartInterval = 7});
  const Bytes tail = noise(1000, 2);
  const Bytes whole = filtered(file);
  for (const bool hasTail : {false, true}) {
    if (hasTail) file.insert(file.end(), tail.begin(), tail.end());
    for (const std::size_t first : {std::size_t{700}, file.size() - 3, file.size()}) {
      Kept rest(file, first);
      EXPECT_TRUE(beginsPlainJpeg(std::span(file).first(first)));
      EXPECT_EQ(openRows({std::span(file).first(first), &rest})->metadata().tail,
                hasTail ? tail : Bytes());
      if (!hasTail) {
        EXPECT_EQ(filtered({std::span(file).first(first), &rest}), whole);
      }
    }
  }
}

TEST(FileView, ThatIsTruncatedOrCannotBeReadIsTheSameErrorAsInMemory) {
  Bytes file = test_support::makeJpeg({.width = 300, .height = 200});
  Kept broken(file, 700, file.size() - 10);
  EXPECT_THROW(filtered({std::span(file).first(700), &broken}), std::runtime_error);
  file.resize(file.size() * 2 / 3);
  Kept rest(file, 700);
  const std::string error = test_support::jpegErrorOf([&] { filtered(file); });
  EXPECT_FALSE(error.empty());
  EXPECT_EQ(test_support::jpegErrorOf([&] {
              filtered({std::span(file).first(700), &rest});
            }),
            error);
}

TEST(FileView, CanBePartOnlyOfAPlainFileWithItsWholeHeader) {
  const Bytes plain = test_support::makeJpeg({});
  const std::size_t scan = test_support::findSegment(plain, 0xDA);
  const std::size_t header = scan + 2 + plain[scan + 3];
  for (std::size_t size = 0; size < header; ++size)
    EXPECT_FALSE(beginsPlainJpeg(std::span(plain).first(size))) << size;
  EXPECT_TRUE(beginsPlainJpeg(std::span(plain).first(header)));
  EXPECT_FALSE(beginsPlainJpeg(test_support::makeJpeg({.scans = test_support::channelScans()})));
  EXPECT_FALSE(
      beginsPlainJpeg(test_support::makeJpeg({.scans = test_support::completeProgressiveScans()})));
  EXPECT_FALSE(beginsPlainJpeg(test_support::makeJpeg({.arithmetic = true})));
}

// Marks, stuffed zeros and lengths across the ends of what is read at once.
TEST(JpegEnd, IsTheSameWhereverTheBytesAre) {
  constexpr std::size_t window = 1 << 18;
  int ended = 0;
  for (unsigned seed = 0; seed < 120; ++seed) {
    std::mt19937 random(seed);
    Bytes bytes(2 * window + 20, 0x55);
    bytes[0] = 0xFF, bytes[1] = 0xD8;
    for (const std::size_t end : {window + 2, 2 * window, 2 * window + 2}) {
      for (std::size_t at = end - 8; at < end + 8; ++at) {
        constexpr std::uint8_t likely[] = {0xFF, 0xFF, 0xFF, 0x00, 0xD0, 0xDA, 0x00, 0x06};
        bytes[at] = likely[random() % 8];
      }
    }
    if (seed % 2 == 0) bytes[bytes.size() - 3] = 0xFF, bytes[bytes.size() - 2] = 0xD9;
    Kept rest(bytes, 100);
    const std::size_t end = jpegEnd(std::span<const std::uint8_t>(bytes));
    EXPECT_EQ(jpegEndIn(FileView(std::span(bytes).first(100), &rest)), end) << seed;
    ended += end < bytes.size();
  }
  EXPECT_GT(ended, 5);
}

TEST(JpegEnd, IsSeenAtTheEndOfWhatIsReadAtOnce) {
  constexpr std::size_t end = 2 + (1 << 18);
  Bytes bytes(end + 20, 0x55);
  bytes[0] = 0xFF, bytes[1] = 0xD8;
  bytes[end - 4] = 0xFF, bytes[end - 3] = 0;
  bytes[end - 2] = 0xFF, bytes[end - 1] = 0xD9;
  Kept rest(bytes, 100);
  EXPECT_EQ(jpegEndIn(FileView(std::span<const std::uint8_t>(bytes).first(100), &rest)), end);
}

TEST(LongFile, IsPartlyReadAndGivesTheResultOfAllOfItInMemory) {
  const TemporaryFolder folder;
  folder.write("large.jpg", largePhoto());
  const OpenedFile file = openFile(folder / "large.jpg", {}, beginsPlainJpeg);
  ASSERT_NE(file.rest, nullptr);
  EXPECT_LT(file.bytes.size(), std::size_t{2} << 20);
  EXPECT_EQ(wholeOf(file.view()), largePhoto());
  TemporaryStore overflow(folder / "");
  const Bytes made = filtered(file.view(), &overflow);
  EXPECT_GT(overflow.size(), 100'000u);
  EXPECT_EQ(made, filtered(largePhoto()));
  EXPECT_EQ(folder.content().size(), 1u);  // the temporary has no name
  const Bytes small = test_support::smallJpeg();
  folder.write("small.jpg", small);
  EXPECT_EQ(openFile(folder / "small.jpg", {}, beginsPlainJpeg).bytes, small);
}

TEST(LongFile, ThatChangesBetweenTwoReadingsIsAnError) {
  const TemporaryFolder folder;
  const std::string path = folder / "file";
  const Bytes bytes = noise(300'000, 3);
  const auto errorAfter = [&](const auto& change) {
    folder.write("file", bytes);
    LongFile file(Descriptor(path, O_RDONLY), path, 1000);
    Bytes some(100'000);
    file.read(0, some);
    EXPECT_TRUE(std::equal(some.begin(), some.end(), bytes.begin() + 1000));
    change();
    return test_support::jpegErrorOf([&] {
      file.read(0, some);
      forEachBlock(file, [](auto) {});
    });
  };
  EXPECT_EQ(errorAfter([] {}), "");
  const std::string changed = "changed while it was read";
  EXPECT_EQ(errorAfter([&] { EXPECT_EQ(truncate(path.c_str(), 200'000), 0); }), changed);
  EXPECT_EQ(errorAfter([&] {
              const timespec times[] = {{0, UTIME_OMIT}, {5, 0}};
              EXPECT_EQ(utimensat(AT_FDCWD, path.c_str(), times, 0), 0);
            }),
            changed);
  EXPECT_EQ(errorAfter([&] {  // with the time that it had
              struct stat before;
              EXPECT_EQ(stat(path.c_str(), &before), 0);
              Bytes other = bytes;
              ++other[2000];
              folder.write("file", other);
              const timespec times[] = {before.st_atim, before.st_mtim};
              EXPECT_EQ(utimensat(AT_FDCWD, path.c_str(), times, 0), 0);
            }),
            changed);
}

TEST(LongFile, ResultsThatCannotBeLaidAwayAreThatError) {
  class Full : public TemporaryStore {
   public:
    Full() : TemporaryStore("/") {}
    void append(std::span<const std::uint8_t>) override {
      throw std::system_error(ENOSPC, std::generic_category());
    }
  } full;
  EXPECT_THROW(filtered(largePhoto(), &full), std::system_error);
}

}  // namespace
}  // namespace pelorin::photo

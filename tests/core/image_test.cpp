#include "image_processing/core/image.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <string>
#include <utility>
#include <vector>

#ifdef __linux__
#include <sys/mman.h>
#endif

#include "image_processing/core/image_metadata.h"
#include "tests/support/mask_types.h"

namespace pelorin::image_processing {
namespace {

using test_support::Quantized;

template <typename T>
class ImageOfEveryType : public testing::Test {};
using PixelTypes = testing::Types<RGBA8Pixel, float, Quantized, unsigned char>;
TYPED_TEST_SUITE(ImageOfEveryType, PixelTypes);

TYPED_TEST(ImageOfEveryType, KnowsItsSizes) {
  const Image<TypeParam> image(5, 3);
  EXPECT_EQ(image.width, 5u);
  EXPECT_EQ(image.height, 3u);
  EXPECT_EQ(image.bytesPerPixel, sizeof(TypeParam));
  EXPECT_EQ(image.byteSize(), 15 * sizeof(TypeParam));
  EXPECT_EQ(image.row(2) - image.data.get(), 10);
}

TYPED_TEST(ImageOfEveryType, OfNoWidthOrHeightIsEmptyAndItsIteratorsStartAtTheirEnd) {
  for (const auto& [width, height] : {std::pair{0u, 7u}, {7u, 0u}, {0u, 0u}, {0u, 4294967295u}}) {
    const Image<TypeParam> image(width, height);
    EXPECT_NE(image.data, nullptr);
    EXPECT_EQ(image.byteSize(), 0u);
    EXPECT_TRUE(typename Image<TypeParam>::ImageForwardIterator(image).atEnd());
    EXPECT_TRUE(typename Image<TypeParam>::ImageForwardIteratorXY(image).atEnd());
  }
}

TYPED_TEST(ImageOfEveryType, SharesItsPixelsWithItsCopies) {
  Image<TypeParam> first(2, 2);
  const Image<TypeParam> copy = first;
  Image<TypeParam> assigned(1, 1);
  assigned = first;
  EXPECT_EQ(copy.data, first.data);
  EXPECT_EQ(assigned.data, first.data);
  EXPECT_EQ(assigned.width, 2u);
  EXPECT_EQ(first.data.use_count(), 3);
}

TYPED_TEST(ImageOfEveryType, ThrowsBadAllocWhenTheSizeOverflows) {
  EXPECT_THROW(Image<TypeParam>(4294967295u, 4294967295u), std::bad_alloc);
}

TEST(Image, ThrowsBadAllocForASizeThatOnlyOverflows32Bits) {
  // 65536 x 65536 is 0 in 32 bits: a product taken there would give a buffer of nothing.
  if (sizeof(void*) == 4) {
    EXPECT_THROW(Image<RGBA8Pixel>(65536, 65536), std::bad_alloc);
  } else {
    static unsigned char one;
    const Image<unsigned char> image(65536, 65536, {&one, [](unsigned char*) {}});
    EXPECT_EQ(image.pixelCount(), std::size_t{1} << 32);
  }
}

TEST(Image, MayBeOneThinRow) {
  Image<float> row(65500, 1);
  row.set(0.5f);
  EXPECT_EQ(row.row(0)[65499], 0.5f);
}

TEST(Image, SharesAGivenBufferAndAllocatesNothing) {
  std::vector<unsigned char> bytes = {1, 2, 3, 4};
  const Image<unsigned char> image(2, 2, {bytes.data(), [](unsigned char*) {}});
  EXPECT_EQ(image.data.get(), bytes.data());
}

TEST(Image, ShowsAWriteThroughACopy) {
  Image<float> first(3, 1);
  first.set(0.0f);
  Image<float> copy = first;
  copy.row(0)[1] = 0.5f;
  EXPECT_EQ(first.row(0)[1], 0.5f);
}

TEST(Image, SetWritesEveryPixel) {
  const auto image = makeSharedImage<float>(4, 5);
  image->set(0.25f);
  for (std::size_t i = 0; i < 20; ++i) EXPECT_EQ(image->data.get()[i], 0.25f);
}

#if defined(__linux__) && (defined(__x86_64__) || defined(__aarch64__))
/// What the system notes of the mapping that holds an address, "hg" for a wish for huge pages;
/// empty where it notes nothing.
std::string mappingFlagsAt(const void* address) {
  std::ifstream mappings("/proc/self/smaps");
  bool isIt = false;
  for (std::string line; std::getline(mappings, line);) {
    unsigned long long from, to;
    if (std::sscanf(line.c_str(), "%llx-%llx ", &from, &to) == 2) {
      const auto wanted = reinterpret_cast<std::uintptr_t>(address);
      isIt = from <= wanted && wanted < to;
    }
    if (isIt && line.starts_with("VmFlags:")) return line;
  }
  return "";
}

// Emulators ignore the request, and so say nothing of it.
bool tellsWhatItWasAskedFor() {
  constexpr std::size_t size = 4 << 20;
  void* const memory =
      mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (memory == MAP_FAILED) return false;
  madvise(memory, size, MADV_HUGEPAGE);
  const bool tells = mappingFlagsAt(memory).find(" hg") != std::string::npos;
  munmap(memory, size);
  return tells;
}

TEST(Image, AsksForHugePagesWhenItIsLarge) {
  if (!std::ifstream("/sys/kernel/mm/transparent_hugepage/enabled")) {
    GTEST_SKIP() << "the system has no huge pages";
  }
  if (!tellsWhatItWasAskedFor()) {
    GTEST_SKIP() << "the system does not tell what it was asked for";
  }
  const Image<RGBA8Pixel> image(2000, 1000);
  const std::string flags = mappingFlagsAt(image.row(500));
  EXPECT_NE(flags.find(" hg"), std::string::npos) << flags;
}
#endif

TEST(PreferHugePages, TakesAnyPlaceAndSizeAndChangesNoByte) {
  constexpr std::size_t size = (5 << 20) + 12345;
  std::vector<unsigned char> bytes(size, 7);
  for (const std::size_t offset : {0, 1, 4095, 1 << 20, 3 << 20}) {
    for (const std::size_t count : {std::size_t{0}, std::size_t{1}, size - offset}) {
      preferHugePages(bytes.data() + offset, count);
    }
  }
  preferHugePages(nullptr, 0);
  EXPECT_EQ(bytes, std::vector<unsigned char>(size, 7));
}

TEST(ImageForwardIterator, OutlivesItsImage) {
  auto image = std::make_unique<Image<unsigned char>>(2, 1);
  image->row(0)[0] = 7;
  image->row(0)[1] = 8;
  Image<unsigned char>::ImageForwardIterator pixel(*image);
  image.reset();
  EXPECT_EQ(*pixel, 7);
  Image<unsigned char>::ImageForwardIterator moved(Image<unsigned char>(1, 1));
  moved = std::move(pixel);
  EXPECT_EQ(*++moved, 8);
  EXPECT_TRUE((++moved).atEnd());
}

TEST(ImageForwardIteratorXY, VisitsAThreeByTwoImageInStorageOrder) {
  const Image<RGBA8Pixel> image(3, 2);
  std::vector<std::pair<std::uint32_t, std::uint32_t>> visited;
  for (Image<RGBA8Pixel>::ImageForwardIteratorXY pixel(image); !pixel.atEnd(); ++pixel) {
    visited.emplace_back(pixel.x(), pixel.y());
    EXPECT_EQ(&*pixel, image.row(pixel.y()) + pixel.x());
  }
  const std::vector<std::pair<std::uint32_t, std::uint32_t>> expected = {{0, 0}, {1, 0}, {2, 0},
                                                                         {0, 1}, {1, 1}, {2, 1}};
  EXPECT_EQ(visited, expected);
}

TEST(QuantizedFloat, TruncatesAndWrapsAndYieldsTheStoredValue) {
  Quantized q;
  EXPECT_EQ(q = 1.0f, 1.0f);
  EXPECT_EQ(q.stored(), 255);
  EXPECT_EQ(q = 0.5f, 127.0f / 255.0f);
  EXPECT_EQ(q.stored(), 127);
  EXPECT_EQ(q = -0.1f, 0.0f);
  EXPECT_EQ(q = 1.01f, 1.0f / 255.0f);  // 257 wraps
  EXPECT_EQ(q.stored(), 1);
  EXPECT_EQ(q = 1.004f, 0.0f);  // 256 wraps
  EXPECT_EQ(q = std::nanf(""), 0.0f);
}

TEST(QuantizedFloat, ReadsAsAQuotientForEveryByte) {
  for (unsigned byte = 0; byte < 256; ++byte) {
    const unsigned char stored = static_cast<unsigned char>(byte);
    Quantized q;
    std::memcpy(&q, &stored, 1);
    EXPECT_EQ(static_cast<float>(q), static_cast<float>(byte) / 255.0f);
  }
}

TEST(BoundingBox, ContainsThePixelsOnItsEdges) {
  const BoundingBox box{.left = 2, .right = 4, .bottom = 9, .top = 7};
  EXPECT_TRUE(box.contains(2, 7));
  EXPECT_TRUE(box.contains(4, 9));
  EXPECT_FALSE(box.contains(5, 8));
  EXPECT_FALSE(box.contains(3, 6));
}

TEST(BoundingBox, HoldsNoPixelWhenReversed) {
  const BoundingBox box{.left = 4, .right = 2, .bottom = 9, .top = 7};
  for (int x = 0; x < 10; ++x) EXPECT_FALSE(box.contains(x, 8));
}

TEST(ImageMetadata, SharesItsBoxesWithItsCopies) {
  ImageMetadata metadata;
  metadata.faces.push_back(std::make_shared<BoundingBox>(BoundingBox{1, 2, 3, 4}));
  const ImageMetadata copy = metadata;
  EXPECT_EQ(copy.faces[0], metadata.faces[0]);
}

}  // namespace
}  // namespace pelorin::image_processing

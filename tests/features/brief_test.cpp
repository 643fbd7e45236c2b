#include "image_processing/features/brief.h"

#include <gtest/gtest.h>

#include <climits>
#include <sstream>

#include "image_processing/features/brief_bits.h"
#include "image_processing/features/brief_pattern.h"
#include "tests/features/fast_variants.h"
#include "tests/support/fingerprint.h"
#include "tests/support/instruction_sets.h"

namespace pelorin::image_processing {
namespace {

using test_support::detect;
using test_support::greyFlat;
using test_support::GreyImage;
using test_support::greyNoise;
using test_support::greyPhoto;
using Descriptors = std::vector<BriefDescriptor>;

Descriptors briefOf(const std::vector<xy>& corners, const GreyImage& image) {
  Descriptors descriptors;
  brief(corners.data(), static_cast<int>(corners.size()), image, descriptors);
  return descriptors;
}

bool bitOf(const BriefDescriptor& descriptor, int i) {
  return (descriptor.descriptor[i / 32] >> (i % 32) & 1) != 0;
}

TEST(Brief, KeepsCornersFrom16PixelsInsideAndDropsThoseAt15) {
  const GreyImage image = greyNoise(50, 60, 1);
  const std::vector<xy> kept = {{16, 16}, {33, 16}, {34, 43}, {20, 44}};
  EXPECT_EQ(briefOf(kept, image).size(), 4u);  // width - 16 is 34, height - 16 is 44
  for (const xy& dropped : {xy{15, 30}, xy{35, 30}, xy{30, 15}, xy{30, 45}}) {
    EXPECT_TRUE(briefOf({dropped}, image).empty()) << dropped;
  }
}

TEST(Brief, KeepsTheOneInnerPixelOf32By32) {
  const GreyImage image = greyNoise(32, 32, 1);
  EXPECT_EQ(briefOf({{16, 16}}, image).size(), 1u);
  EXPECT_TRUE(briefOf({{17, 16}, {16, 17}, {15, 16}, {16, 15}}, image).empty());
}

TEST(Brief, DropsCornersOutsideThePictureAndAllCornersOfASmallOne) {
  const std::vector<xy> corners = {{INT_MIN, INT_MIN}, {-1, 20},      {20, -1}, {0, 0},
                                   {20, 1000000},      {1000000, 20}, {16, 16}, {INT_MAX, INT_MAX}};
  EXPECT_TRUE(briefOf(corners, greyFlat(10, 10, 7)).empty());
  EXPECT_TRUE(briefOf(corners, greyFlat(0, 0, 7)).empty());
  EXPECT_TRUE(briefOf(corners, greyFlat(1000, 5, 7)).empty());
  EXPECT_EQ(briefOf(corners, greyFlat(100, 100, 7)).size(), 1u);
}

TEST(Brief, ReadsNoCornersWhereTheCountIsNotPositive) {
  Descriptors descriptors;
  brief(nullptr, 0, greyFlat(100, 100, 7), descriptors);
  brief(nullptr, INT_MIN, greyFlat(100, 100, 7), descriptors);
  EXPECT_TRUE(descriptors.empty());
}

TEST(Brief, AppendsInTheOrderOfTheCorners) {
  const GreyImage image = greyNoise(60, 60, 1);
  Descriptors descriptors = briefOf({{20, 20}}, image);
  const std::vector<xy> more = {{40, 30}, {5, 5}, {17, 16}};
  brief(more.data(), 3, image, descriptors);
  ASSERT_EQ(descriptors.size(), 3u);
  EXPECT_EQ(descriptors[0].center, (xy{20, 20}));
  EXPECT_EQ(descriptors[1].center, (xy{40, 30}));
  EXPECT_EQ(descriptors[2].center, (xy{17, 16}));
}

TEST(Brief, SetsABitWhereTheFirstPixelIsDarker) {
  const GreyImage image = greyNoise(50, 40, 2);
  const Descriptors descriptors = briefOf({{20, 18}, {25, 21}}, image);
  ASSERT_EQ(descriptors.size(), 2u);
  for (const BriefDescriptor& descriptor : descriptors) {
    const auto [x, y] = descriptor.center;
    for (int i = 0; i < 256; ++i) {
      const BriefPair& pair = briefPattern[i];
      EXPECT_EQ(bitOf(descriptor, i),
                image.row(y + pair.dy1)[x + pair.dx1] < image.row(y + pair.dy2)[x + pair.dx2]);
    }
  }
}

TEST(Brief, GivesBitZeroForEqualPixels) {
  const Descriptors descriptors = briefOf({{20, 20}}, greyFlat(40, 40, 99));
  ASSERT_EQ(descriptors.size(), 1u);
  EXPECT_EQ(descriptors[0].descriptor, (std::array<std::uint32_t, 8>{}));
}

TEST(Brief, ComparesPixelsAsUnsignedBytes) {
  GreyImage image = greyFlat(40, 40, 100);
  image.row(20 - 3)[20 - 9] = 200;  // the first pixel of row 0 of the pattern
  EXPECT_FALSE(bitOf(briefOf({{20, 20}}, image)[0], 0));
  image.row(20 - 3)[20 + 4] = 250;  // and its second one
  EXPECT_TRUE(bitOf(briefOf({{20, 20}}, image)[0], 0));
}

TEST(BriefBits, EqualTheScalarDefinitionOnEveryInstructionSet) {
  test_support::onEveryInstructionSet([] {
    for (const std::uint32_t width : {31u, 32u, 33u, 64u, 257u}) {
      const GreyImage image = greyNoise(width, 64, width);
      const BriefOffsets offsets = briefOffsets(width);
      for (std::uint32_t y = 15; y < 64 - 15; ++y) {
        for (std::uint32_t x = 15; x < width - 15; x += 7) {
          ASSERT_EQ(briefBits(image.row(y) + x, offsets), briefBitsScalar(image.row(y) + x, width));
        }
      }
    }
  });
}

TEST(ComputeBriefDescriptors, DescribesTheSuppressedFast9Corners) {
  const GreyImage image = greyPhoto(200, 150, 3);
  const Descriptors descriptors = computeBriefDescriptors(image, 15);
  ASSERT_GT(descriptors.size(), 10u);
  EXPECT_EQ(descriptors, briefOf(detect(fast9_detect_nonmax, image, 15), image));
}

TEST(ComputeBriefDescriptors, GivesNoneForAnImageWithoutCorners) {
  EXPECT_TRUE(computeBriefDescriptors(greyFlat(100, 100, 5), 20).empty());
  EXPECT_TRUE(computeBriefDescriptors(greyFlat(0, 0, 5), 20).empty());
  EXPECT_TRUE(computeBriefDescriptors(greyNoise(6, 100, 5), 20).empty());
  EXPECT_TRUE(computeBriefDescriptors(greyNoise(100, 100, 5), 255).empty());
}

TEST(ComputeBriefDescriptors, DoesNotNoticeAConstantAddedToEveryPixel) {
  GreyImage image = greyPhoto(200, 150, 4);
  const std::size_t count = image.pixelCount();
  for (std::size_t i = 0; i < count; ++i) {
    image.data.get()[i] = static_cast<unsigned char>(1 + image.data.get()[i] * 3 / 4);  // 1 ... 192
  }
  const Descriptors before = computeBriefDescriptors(image, 10);
  ASSERT_FALSE(before.empty());
  for (std::size_t i = 0; i < count; ++i) image.data.get()[i] += 62;  // to 254 at most
  EXPECT_EQ(computeBriefDescriptors(image, 10), before);
}

TEST(ComputeBriefDescriptors, HasTheSameDescriptorsOnEveryPlatform) {
  const Descriptors descriptors = computeBriefDescriptors(greyPhoto(320, 240, 1), 20);
  std::vector<std::uint32_t> words;
  for (const BriefDescriptor& descriptor : descriptors) {
    words.push_back(static_cast<std::uint32_t>(descriptor.center.x));
    words.push_back(static_cast<std::uint32_t>(descriptor.center.y));
    words.insert(words.end(), descriptor.descriptor.begin(), descriptor.descriptor.end());
  }
  EXPECT_EQ(std::to_string(descriptors.size()) + " " +
                test_support::fingerprint(words.data(), words.size() * 4),
            "626 d57e0d87b3b1e1f4");
}

template <typename T>
std::string textOf(const T& value) {
  std::ostringstream stream;
  stream << value;
  return stream.str();
}

TEST(BriefText, WritesAPositionInParentheses) {
  EXPECT_EQ(textOf(xy{20, 31}), "(20, 31)");
  EXPECT_EQ(textOf(xy{-1, 0}), "(-1, 0)");
}

// Bits 255 ... 251 are 01101 and bits 4 ... 0 are 00110.
const BriefDescriptor example = {{20, 31}, {0x00000006, 0, 0, 0, 0, 0, 0, 0x68000000}};

TEST(BriefText, WritesFiveBitsOfEitherEndMostSignificantFirst) {
  EXPECT_EQ(textOf(example), "{ center = (20, 31), descriptor = 01101...00110 }");
  EXPECT_EQ(textOf(BriefDescriptor{{0, 0}, {1, ~0u, ~0u, ~0u, ~0u, ~0u, ~0u, 1u << 31}}),
            "{ center = (0, 0), descriptor = 10000...00001 }");
}

TEST(BriefText, JoinsASequenceWithCommas) {
  EXPECT_EQ(textOf(Descriptors{}), "");
  EXPECT_EQ(textOf(Descriptors{example}), textOf(example));
  EXPECT_EQ(textOf(Descriptors{example, example}), textOf(example) + ", " + textOf(example));
}

}  // namespace
}  // namespace pelorin::image_processing

namespace elsewhere {

TEST(BriefText, IsFoundFromAnyNamespace) {
  std::ostringstream stream;
  stream << xy{1, 2};
  EXPECT_EQ(stream.str(), "(1, 2)");
}

}  // namespace elsewhere

#include "image_processing/autoenhance/masks/face_blend_rows.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>

#include "image_processing/autoenhance/masks/face_blend.h"
#include "tests/support/faces.h"
#include "tests/support/mask_types.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::noisePicture;
using test_support::photoLikePicture;
using test_support::Quantized;
using test_support::Random;
using test_support::withFaces;

// Every value that a mask may begin with.
template <typename T>
Image<T> startingMask(std::uint32_t width, std::uint32_t height) {
  Image<T> mask(width, height);
  for (std::size_t i = 0; i < mask.pixelCount(); ++i) {
    mask.data.get()[i] = static_cast<float>(i % 256) / 255.0f;
  }
  return mask;
}

// By rows and face by face.
template <typename T>
void expectTheDefinition(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata) {
  const Image<T> expected = startingMask<T>(photo.width, photo.height);
  for (const auto& face : metadata.faces) {
    Image<T> mask = expected;
    if (face != nullptr) blendFaceIntoMask(*face, photo, mask);
  }
  const Image<T> mask = startingMask<T>(photo.width, photo.height);
  const FaceBlendRows faces(metadata, photo.width, photo.height);
  FaceBlendRows::Scratch even, odd;  // rows need not follow each other
  for (std::uint32_t y = 0; y < photo.height; ++y)
    faces.blendRow(y, photo.row(y), mask.row(y), y % 2 == 0 ? even : odd);
  EXPECT_EQ(std::memcmp(mask.data.get(), expected.data.get(), mask.byteSize()), 0);
}

void expectTheDefinition(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata) {
  expectTheDefinition<float>(photo, metadata);
  expectTheDefinition<Quantized>(photo, metadata);
}

TEST(FaceBlendRows, GiveTheBytesOfOneFaceAfterTheOther) {
  Random random(11);
  for (const auto& photo : {photoLikePicture(61, 47, 3), noisePicture(53, 40, 9)}) {
    for (int turn = 0; turn < 20; ++turn) {
      ImageMetadata metadata;
      const int faces = turn % 7;
      for (int i = 0; i < faces; ++i) {
        const auto left = static_cast<std::int32_t>(random.below(90)) - 20;
        const auto top = static_cast<std::int32_t>(random.below(70)) - 15;
        const auto right = left + static_cast<std::int32_t>(random.below(40)) - 3;
        const auto bottom = top + static_cast<std::int32_t>(random.below(40)) - 3;
        const std::uint32_t times = random.below(3) + 1;
        for (std::uint32_t time = 0; time < times; ++time) {
          metadata.faces.push_back(
              std::make_shared<BoundingBox>(BoundingBox{left, right, bottom, top}));
        }
      }
      expectTheDefinition(photo, metadata);
    }
  }
}

TEST(FaceBlendRows, TakeBoxesBeyondEveryBorder) {
  constexpr std::int32_t least = INT32_MIN, most = INT32_MAX;
  expectTheDefinition(photoLikePicture(40, 30, 5), withFaces({{least, most, most, least},
                                                              {-9, 50, 90, -90},
                                                              {most, most, most, most},
                                                              {least, 5, 5, least},
                                                              {30, 10, 20, 10},
                                                              {least, most, most, least}}));
}

TEST(FaceBlendRows, PassOverNullFacesAndEmptyPhotos) {
  ImageMetadata metadata = withFaces({{5, 20, 20, 5}, {5, 20, 20, 5}});
  metadata.faces.insert(metadata.faces.begin() + 1, nullptr);
  expectTheDefinition(photoLikePicture(40, 30, 5), metadata);
  FaceBlendRows(metadata, 0, 0);
  FaceBlendRows(metadata, 0, 9);
}

}  // namespace
}  // namespace pelorin::image_processing

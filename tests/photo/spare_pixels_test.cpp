#include "photo/spare_pixels.h"

#include <gtest/gtest.h>

namespace pelorin::photo {
namespace {

TEST(SparePixels, ServeTheNextPictureOfAsManyPixels) {
  SparePixels spare;
  auto first = spare.picture(40, 30);
  const auto* const pixels = first->data.get();
  spare.keep(*first);
  first = nullptr;
  const auto next = spare.picture(30, 40);
  EXPECT_EQ(next->width, 30u);
  EXPECT_EQ(next->height, 40u);
  EXPECT_EQ(next->data.get(), pixels);
}

TEST(SparePixels, AreFreedForAPictureOfMoreOrFewer) {
  for (const std::uint32_t width : {39u, 41u}) {
    SparePixels spare;
    auto first = spare.picture(40, 30);
    const std::weak_ptr<image_processing::RGBA8Pixel> pixels = first->data;
    spare.keep(*first);
    first = nullptr;
    EXPECT_FALSE(pixels.expired());
    const auto next = spare.picture(width, 30);
    EXPECT_TRUE(pixels.expired());
    EXPECT_EQ(next->pixelCount(), std::size_t{width} * 30);
  }
}

TEST(SparePixels, AreNotTakenFromAPictureThatIsStillHeld) {
  SparePixels spare;
  const auto first = spare.picture(40, 30);
  spare.keep(*first);
  EXPECT_NE(spare.picture(40, 30)->data, first->data);
}

TEST(SparePixels, ServeOnePictureOnly) {
  SparePixels spare;
  spare.keep({4, 3});
  const auto first = spare.picture(4, 3), second = spare.picture(4, 3);
  EXPECT_NE(first->data, second->data);
}

}  // namespace
}  // namespace pelorin::photo

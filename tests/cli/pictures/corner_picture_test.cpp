#include "cli/pictures/corner_picture.h"

#include <gtest/gtest.h>

#include "tests/support/pictures.h"

namespace pelorin::cli {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using test_support::flatPicture;

constexpr RGBA8Pixel grey{128, 128, 128, 255};

Image<RGBA8Pixel> drawn(const Image<RGBA8Pixel>& photo, std::vector<MarkedPixel> pixels) {
  return drawCorners(photo, std::move(pixels), "Title", "Subtitle", "Label");
}

/// The mean of the coloured pixels near a pixel of the photo, and where they lie.
struct Ring {
  double r = 0, b = 0, x = 0, y = 0;
  int pixels = 0;
};

Ring ringAt(const Image<RGBA8Pixel>& picture, const Image<RGBA8Pixel>& photo, double x, double y) {
  const AnnotatedPhoto::Point centre = AnnotatedPhoto(photo, "", "").at(x + 0.5, y + 0.5);
  Ring ring;
  for (int dy = -8; dy <= 8; ++dy) {
    for (int dx = -8; dx <= 8; ++dx) {
      const RGBA8Pixel& p = picture.row(static_cast<std::uint32_t>(centre.y) +
                                        dy)[static_cast<std::uint32_t>(centre.x) + dx];
      if (std::abs(p.r - p.b) < 60) continue;
      ++ring.pixels;
      ring.r += p.r;
      ring.b += p.b;
      ring.x += dx;
      ring.y += dy;
    }
  }
  for (double* sum : {&ring.r, &ring.b, &ring.x, &ring.y}) *sum /= std::max(ring.pixels, 1);
  return ring;
}

TEST(CornerPicture, RingsEachCornerInTheColourOfItsScore) {
  for (const std::uint32_t side : {100u, 900u, 4000u}) {
    const auto photo = flatPicture(side, side, grey);
    const int low = static_cast<int>(side / 4), high = static_cast<int>(side / 2);
    const auto picture = drawn(photo, {{low, high, 20}, {high, low, 200}});
    const Ring cool = ringAt(picture, photo, low, high), warm = ringAt(picture, photo, high, low);
    for (const Ring& ring : {cool, warm}) {
      EXPECT_GT(ring.pixels, 20) << side;
      EXPECT_NEAR(ring.x, 0, 1) << side;
      EXPECT_NEAR(ring.y, 0, 1) << side;
    }
    EXPECT_GT(cool.b, cool.r) << side;
    EXPECT_GT(warm.r, warm.b) << side;
    EXPECT_EQ(ringAt(picture, photo, low, low).pixels, 0) << side;
  }
}

TEST(CornerPicture, LeavesTheCornerItselfVisible) {
  auto photo = flatPicture(900, 900, grey);
  photo.row(300)[400] = {255, 255, 255, 255};
  const auto picture = drawn(photo, {{400, 300, 20}});
  const AnnotatedPhoto::Point at = AnnotatedPhoto(photo, "", "").at(400, 300);
  EXPECT_EQ(picture.row(static_cast<std::uint32_t>(at.y))[static_cast<std::uint32_t>(at.x)],
            (RGBA8Pixel{255, 255, 255, 255}));
}

TEST(CornerPicture, PutsStrongCornersOnTop) {
  const auto photo = flatPicture(900, 900, grey);
  for (const bool strongFirst : {true, false}) {
    const MarkedPixel strong{400, 300, 200}, weak{400, 300, 20};
    const auto picture = strongFirst ? drawn(photo, {strong, weak}) : drawn(photo, {weak, strong});
    const Ring ring = ringAt(picture, photo, 400, 300);
    EXPECT_GT(ring.r, ring.b);
  }
}

TEST(CornerPicture, MayHaveNoCorners) {
  const auto photo = flatPicture(900, 900, grey);
  EXPECT_EQ(ringAt(drawn(photo, {}), photo, 450, 450).pixels, 0);
}

}  // namespace
}  // namespace pelorin::cli

#include "cli/pictures/face_frames.h"

#include <algorithm>

namespace pelorin::cli {
namespace {

using image_processing::BoundingBox;
using image_processing::Image;
using image_processing::RGBA8Pixel;

// The sides of a box, all bounds inclusive and perhaps outside the picture.
void drawBox(Image<RGBA8Pixel>& picture, std::int64_t left, std::int64_t top, std::int64_t right,
             std::int64_t bottom, const RGBA8Pixel& colour) {
  const auto draw = [&](std::int64_t x0, std::int64_t y0, std::int64_t x1, std::int64_t y1) {
    x0 = std::max<std::int64_t>(x0, 0), y0 = std::max<std::int64_t>(y0, 0);
    x1 = std::min<std::int64_t>(x1, std::int64_t{picture.width} - 1);
    y1 = std::min<std::int64_t>(y1, std::int64_t{picture.height} - 1);
    for (std::int64_t y = y0; y <= y1; ++y) {
      for (std::int64_t x = x0; x <= x1; ++x)
        picture.row(static_cast<std::uint32_t>(y))[x] = colour;
    }
  };
  draw(left, top, right, top);
  draw(left, bottom, right, bottom);
  draw(left, top, left, bottom);
  draw(right, top, right, bottom);
}

}  // namespace

void frameFaces(Image<RGBA8Pixel>& small, const image_processing::ImageMetadata& faces,
                photo::PictureSize photo) {
  const RGBA8Pixel black = {0, 0, 0, 255}, white = {255, 255, 255, 255};
  for (const auto& face : faces.faces) {
    const auto across = [&](std::int64_t x) { return x * small.width / photo.width; };
    const auto down = [&](std::int64_t y) { return y * small.height / photo.height; };
    const std::int64_t left = across(face->left), top = down(face->top);
    const std::int64_t right = across(face->right), bottom = down(face->bottom);
    drawBox(small, left - 1, top - 1, right + 1, bottom + 1, black);
    drawBox(small, left, top, right, bottom, white);
  }
}

}  // namespace pelorin::cli

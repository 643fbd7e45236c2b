#include "image_processing/features/brief.h"

#include "image_processing/features/brief_bits.h"
#include "image_processing/features/brief_pattern.h"
#include "image_processing/features/fast_detector.h"

namespace pelorin::image_processing {
namespace {

// In 64 bits, since a width may be smaller than the margin or larger than any int.
bool isInside(std::int64_t position, std::int64_t size) {
  return briefReach < position && position < size - briefReach;
}

// A side that is no int is no picture FAST could search.
int asInt(std::uint32_t size) {
  return size > std::uint32_t{INT32_MAX} ? 0 : static_cast<int>(size);
}

void appendDescriptors(const xy* corners, std::size_t count, const Image<unsigned char>& image,
                       std::vector<BriefDescriptor>& descriptors) {
  const BriefOffsets offsets = briefOffsets(image.width);
  for (std::size_t i = 0; i < count; ++i) {
    const xy& corner = corners[i];
    if (!isInside(corner.x, image.width) || !isInside(corner.y, image.height)) continue;
    const unsigned char* const center = image.row(static_cast<std::uint32_t>(corner.y)) + corner.x;
    descriptors.push_back({corner, briefBits(center, offsets)});
  }
}

}  // namespace

std::vector<BriefDescriptor> computeBriefDescriptors(const Image<unsigned char>& image,
                                                     int threshold) {
  const GreyPixels pixels = {image.data.get(), asInt(image.width), asInt(image.height),
                             static_cast<std::ptrdiff_t>(image.width)};
  const MallocArray<xy> corners = detectMaxima(pixels, 9, threshold);
  std::vector<BriefDescriptor> descriptors;
  descriptors.reserve(corners.size());
  appendDescriptors(corners.data(), corners.size(), image, descriptors);
  return descriptors;
}

void brief(const xy* corners, int count, const Image<unsigned char>& image,
           std::vector<BriefDescriptor>& descriptors) {
  if (count <= 0) return;
  appendDescriptors(corners, static_cast<std::size_t>(count), image, descriptors);
}

}  // namespace pelorin::image_processing

// Writes photos for the examples into a folder: makes_photos FOLDER. Two shots of one scene, a second and
// a stop of exposure apart, and another scene an hour later; all are to be turned and have a comment.
#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

#include "photo/file_io.h"
#include "photo/photo.h"

using namespace pelorin;
using namespace pelorin::image_processing;

namespace {

// EXIF with the orientation "turn clockwise" and a time, "2024:05:01 12:00:00".
photo::MetadataSegment exif(const std::string& time) {
  photo::MetadataSegment segment = {
      0xE1, {'E',  'x', 'i', 'f', 0,  0, 'I', 'I', 42, 0, 8, 0, 0, 0, 2, 0,  //
             0x12, 1,   3,   0,   1,  0, 0,   0,   6,  0, 0, 0,              //
             0x32, 1,   2,   0,   20, 0, 0,   0,   38, 0, 0, 0, 0, 0, 0, 0}};
  segment.payload.insert(segment.payload.end(), time.c_str(), time.c_str() + 20);
  return segment;
}

void makePhoto(const std::string& path, const std::string& time, std::uint32_t period, int gain) {
  Image<RGBA8Pixel> picture(160, 120);
  for (std::uint32_t y = 0; y < 120; ++y) {
    for (std::uint32_t x = 0; x < 160; ++x) {
      const std::uint32_t light = 255 * (x % period) * (y + 40) / (period * 160);
      const auto dimmed = static_cast<std::uint8_t>(light * gain / 8);
      picture.row(y)[x] = {dimmed, dimmed, static_cast<std::uint8_t>(dimmed / 2), 255};
    }
  }
  photo::Metadata metadata;
  metadata.segments = {exif(time), {0xFE, {'h', 'e', 'l', 'l', 'o'}}};
  metadata.storedSize = {160, 120};
  photo::writeFileAtomically(path, photo::save(picture, "JPEG", metadata));
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  const std::string folder = argv[1];
  makePhoto(folder + "/dark.jpg", "2024:05:01 12:00:00", 53, 5);
  makePhoto(folder + "/light.jpg", "2024:05:01 12:00:01", 53, 8);
  makePhoto(folder + "/other.jpg", "2024:05:01 13:00:00", 7, 8);
  return 0;
}

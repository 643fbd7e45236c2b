// Opens a file, filters it and writes it with its metadata kept: uses_photo IN OUT
#include <algorithm>
#include <cstdio>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "photo/file_io.h"
#include "photo/jpeg/jpeg_codec.h"
#include "photo/photo.h"

using namespace pelorin;
using namespace pelorin::image_processing;

namespace {

// A photo with a comment, and EXIF that says it is to be turned clockwise.
std::vector<std::uint8_t> madePhoto() {
  Image<RGBA8Pixel> picture(64, 48);
  picture.set({90, 120, 60, 255});
  photo::Metadata metadata;
  metadata.segments = {{0xE1, {'E',  'x', 'i', 'f', 0, 0, 'I', 'I', 42, 0, 8, 0, 0, 0, 1, 0,
                               0x12, 1,   3,   0,   1, 0, 0,   0,   6,  0, 0, 0, 0, 0, 0, 0}},
                       {0xFE, {'h', 'e', 'l', 'l', 'o'}}};
  return photo::encodeJpeg(&picture.data.get()->r, 64, 48, 90, metadata.segments);
}

bool holds(const std::vector<std::uint8_t>& file, const std::string& text) {
  return std::search(file.begin(), file.end(), text.begin(), text.end()) != file.end();
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 3) return 2;
  photo::writeFileAtomically(argv[1], madePhoto());

  photo::Photo opened = photo::open(photo::readFile(argv[1]));
  FilteredImage session(opened.image, ImageMetadata{}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(opened.image->width, opened.image->height);
  const bool applied =
      session.applyFilterWithParams("AE0", "slider=0.4;", defaultFilterConfigValue, output);
  photo::writeFileAtomically(argv[2], photo::save(output, "JPEG", opened.metadata));

  const std::vector<std::uint8_t> written = photo::readFile(argv[2]);
  const photo::PhotoFacts facts = photo::readFacts(written);
  std::printf("applied %d, %u x %u, orientation %d, %s, comment %d\n", applied, facts.width,
              facts.height, facts.orientation, std::string(facts.format).c_str(),
              holds(written, "hello"));
  const bool kept = facts.orientation == 1 && holds(written, "hello") && holds(written, "Exif");
  return applied && kept && facts.width == 48 && facts.height == 64 ? 0 : 1;
}

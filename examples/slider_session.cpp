// Eleven positions of the slider, made on all cores: slider_session PHOTO FOLDER. What the filter finds
// out about the photo it finds out once; a position costs the pass over the pixels alone.
#include <cstdio>
#include <exception>
#include <string>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "photo/faces.h"
#include "photo/file_io.h"
#include "photo/filter_photo.h"
#include "photo/photo.h"
#include "photo/thread_workers.h"

using namespace pelorin;
using namespace pelorin::image_processing;

int main(int argc, char** argv) {
  if (argc != 3) {
    std::fprintf(stderr, "usage: slider_session PHOTO FOLDER\n");
    return 2;
  }
  try {
    photo::Photo opened = photo::open(photo::readFile(argv[1]));
    const std::uint32_t width = opened.image->width, height = opened.image->height;
    const ImageMetadata faces =
        photo::metadataWithFaces(photo::allFaces({}, opened.faces), width, height);

    photo::ThreadWorkers workers;  // every core; they share the work on one picture
    FilteredImage session(opened.image, faces, "", defaultFilterConfigValue,
                          DefaultFilterFactory::filterFactory(), &workers);
    Image<RGBA8Pixel> output(width, height);
    for (const std::string slider :
         {"0.0", "0.1", "0.2", "0.3", "0.4", "0.5", "0.6", "0.7", "0.8", "0.9", "1.0"}) {
      const std::string params = "slider=" + slider + ";";
      session.applyFilterWithParams("AE0", params, defaultFilterConfigValue, output);
      photo::writeFileAtomically(
          std::string(argv[2]) + "/slider_" + slider + ".jpg",
          photo::save(output, "JPEG", opened.metadata, {.mark = photo::markOf("AE0", params)}));
    }
  } catch (const std::exception& error) {
    std::fprintf(stderr, "%s: %s\n", argv[1], error.what());
    return 1;
  }
  return 0;
}

#pragma once

#include <cstddef>
#include <map>
#include <utility>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "photo/filter_photo.h"
#include "photo/thread_workers.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {

/// The file that `filterPhoto` must make: decoded as a whole, filtered in a session, and saved.
/// @param format  of the result; null for that of `file`.
inline Bytes byPicture(const Bytes& file, const photo::FilterRequest& request,
                       const photo::Format* format = nullptr) {
  using namespace image_processing;
  photo::SaveOptions save = request.save;
  save.mark = photo::markOf(request.filter, request.params);
  photo::Photo photo = photo::open(file, request.open);
  if (format == nullptr) format = photo::formatNamed(photo.facts.format);
  FilteredImage session(
      photo.image,
      photo::metadataWithFaces(photo::allFaces(request.faces, photo.faces), photo.image->width,
                               photo.image->height, request.open.scale),
      "", defaultFilterConfigValue, DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(photo.image->width, photo.image->height);
  session.applyFilterWithParams(request.filter, request.params, defaultFilterConfigValue, output);
  return photo::save(output, *format, photo.metadata, save);
}

/// Workers that last as long as the process.
inline image_processing::Workers& threads(std::size_t count) {
  static std::map<std::size_t, photo::ThreadWorkers> all;
  return all.try_emplace(count, count).first->second;
}

}  // namespace pelorin::test_support

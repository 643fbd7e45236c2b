#include "photo/collection/photo_library.h"

#include <fmt/chrono.h>
#include <fmt/format.h>

#include <ctime>
#include <utility>

namespace pelorin::photo {
namespace {

std::string textOfFileTime(const FileStamp& stamp) {
  return fmt::format("{:%Y-%m-%dT%H:%M:%S%z}",
                     fmt::localtime(static_cast<std::time_t>(stamp.modified / 1'000'000'000)));
}

}  // namespace

void PhotoLibrary::add(const std::string& path, const PhotoRecord& record,
                       const std::optional<FileStamp>& stamp, bool assumeFileTime) {
  ScannedPhoto photo = {
      path, record.width, record.height, record.orientation, std::nullopt, TimeSource::none, ""};
  Shot shot = {record.cdf, record.orientation, std::nullopt};
  if (stamp) {
    photo.bytes = stamp->bytes;
    photo.modified = stamp->modified;
  }
  if (record.captureTime) {
    photo.timeSource = TimeSource::camera;
    photo.time = record.captureTime->text;
    shot.time = shotTime(*record.captureTime);
  } else if (assumeFileTime && stamp) {
    photo.timeSource = TimeSource::file;
    photo.time = textOfFileTime(*stamp);
    shot.time = fileTime(*stamp);
  }
  photos.push_back(std::move(photo));
  shots.push_back(shot);
}

}  // namespace pelorin::photo

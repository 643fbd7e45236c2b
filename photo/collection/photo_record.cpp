#include "photo/collection/photo_record.h"

#include <sys/stat.h>

#include <ctime>
#include <utility>

#include "photo/photo.h"

namespace pelorin::photo {

int scaleFor(std::uint32_t width, std::uint32_t height) {
  // One of so many pixels moves the distribution by less than a fiftieth of what a photo's
  // distance to itself is.
  constexpr std::uint64_t enoughPixels = 60'000;
  int scale = 8;
  while (scale > 1 && std::uint64_t{width} * height / (scale * scale) < enoughPixels) scale /= 2;
  return scale;
}

PhotoRecord readPhotoRecord(std::span<const std::uint8_t> file, int scale, std::stop_token stop,
                            const DecodeLimits& limits) {
  const PhotoFacts facts = readFacts(file);
  if (scale == automaticScale) scale = scaleFor(facts.width, facts.height);
  PhotoRecord record{facts.width, facts.height, facts.orientation, facts.captureTime, {}};
  const Photo photo =
      open(file, {.scale = scale, .upright = false, .limits = limits, .stop = std::move(stop)});
  computeGreenCDF(*photo.image, record.cdf);
  return record;
}

std::optional<FileStamp> stampOf(const std::string& path) {
  struct stat status;
  if (stat(path.c_str(), &status) != 0 || !S_ISREG(status.st_mode)) return std::nullopt;
  return FileStamp{static_cast<std::uint64_t>(status.st_size),
                   std::int64_t{status.st_mtim.tv_sec} * 1'000'000'000 + status.st_mtim.tv_nsec};
}

ShotTime fileTime(const FileStamp& stamp) {
  const double utc = static_cast<double>(stamp.modified) / 1e9;
  const std::time_t whole = static_cast<std::time_t>(stamp.modified / 1'000'000'000);
  std::tm local{};
  localtime_r(&whole, &local);
  return {utc + static_cast<double>(local.tm_gmtoff), utc};
}

ShotTime shotTime(const CaptureTime& time) {
  if (!time.hasZone) return {time.seconds, std::nullopt};
  return {time.seconds + time.zoneSeconds, time.seconds};
}

}  // namespace pelorin::photo

#include "photo/collection/photo_record.h"

#include <sys/stat.h>

#include <algorithm>
#include <ctime>
#include <utility>

#include "photo/photo.h"

namespace pelorin::photo {

using image_processing::GreenCounter;
using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

constexpr std::uint32_t rowsAtOnce = 64;

}  // namespace

int scaleFor(std::uint32_t width, std::uint32_t height) {
  // One of so many pixels moves the distribution by less than a fiftieth of what a photo's
  // distance to itself is.
  constexpr std::uint64_t enoughPixels = 60'000;
  int scale = 8;
  while (scale > 1 && std::uint64_t{width} * height / (scale * scale) < enoughPixels) scale /= 2;
  return scale;
}

std::uint64_t countedPixels(std::uint32_t width, std::uint32_t height, int scale) {
  const auto divisor =
      static_cast<std::uint32_t>(scale == automaticScale ? scaleFor(width, height) : scale);
  const auto reduced = [&](std::uint32_t side) {
    return (std::uint64_t{side} + divisor - 1) / divisor;
  };
  return reduced(width) * reduced(height);
}

PhotoRecord readPhotoRecord(std::span<const std::uint8_t> file, int scale, std::stop_token stop,
                            const DecodeLimits& limits) {
  const PhotoFacts facts = openRows(file, {.limits = limits, .stop = stop})->facts();
  if (scale == automaticScale) scale = scaleFor(facts.width, facts.height);
  const std::unique_ptr<RowReader> rows =
      openRows(file, {.scale = scale, .limits = limits, .stop = std::move(stop)});
  const auto [width, height] = rows->size();
  const Image<RGBA8Pixel> band(width, std::min(height, rowsAtOnce));
  GreenCounter counter;
  for (std::uint32_t y = 0; y < height;) {
    const std::uint32_t count = std::min(height - y, rowsAtOnce);
    rows->read(band.data.get(), count);
    counter.add(band.data.get(), std::size_t{width} * count);
    y += count;
  }
  return {facts.width,
          facts.height,
          facts.orientation,
          facts.captureTime,
          {counter.cdf(), std::uint64_t{width} * height}};
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

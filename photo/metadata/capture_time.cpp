#include "photo/metadata/capture_time.h"

#include <fmt/format.h>
#include <libexif/exif-data.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <memory>

namespace pelorin::photo {
namespace {

struct Unref {
  void operator()(ExifData* data) const { exif_data_unref(data); }
};
using Exif = std::unique_ptr<ExifData, Unref>;

struct TimeTags {
  ExifIfd directory;
  ExifTag time, fraction, offset;
};

constexpr std::array<TimeTags, 3> timeTags = {{
    {EXIF_IFD_EXIF, EXIF_TAG_DATE_TIME_ORIGINAL, EXIF_TAG_SUB_SEC_TIME_ORIGINAL,
     EXIF_TAG_OFFSET_TIME_ORIGINAL},
    {EXIF_IFD_EXIF, EXIF_TAG_DATE_TIME_DIGITIZED, EXIF_TAG_SUB_SEC_TIME_DIGITIZED,
     EXIF_TAG_OFFSET_TIME_DIGITIZED},
    {EXIF_IFD_0, EXIF_TAG_DATE_TIME, EXIF_TAG_SUB_SEC_TIME, EXIF_TAG_OFFSET_TIME},
}};

std::string textOf(const Exif& exif, ExifIfd directory, ExifTag tag) {
  const ExifEntry* entry = exif_content_get_entry(exif->ifd[directory], tag);
  if (entry == nullptr || entry->format != EXIF_FORMAT_ASCII || entry->data == nullptr) return "";
  const auto* first = reinterpret_cast<const char*>(entry->data);
  std::string text(first, std::find(first, first + entry->size, '\0'));
  while (!text.empty() && text.back() == ' ') text.pop_back();
  return text;
}

// "+02:00" in seconds.
std::optional<int> readOffset(const std::string& text) {
  char sign = 0, end = 0;
  int hours = 0, minutes = 0;
  const int fields = std::sscanf(text.c_str(), "%c%2d:%2d%c", &sign, &hours, &minutes, &end);
  const bool inRange = hours >= 0 && hours <= 14 && minutes >= 0 && minutes < 60;
  if (fields != 3 || (sign != '+' && sign != '-') || !inRange) return std::nullopt;
  return (sign == '-' ? -1 : 1) * (hours * 60 + minutes) * 60;
}

std::optional<CaptureTime> readTime(const std::string& text, const std::string& fraction,
                                    const std::string& offsetText) {
  int year = 0, month = 0, day = 0, hour = 0, minute = 0, second = 0;
  if (std::sscanf(text.c_str(), "%4d:%2d:%2d %2d:%2d:%2d", &year, &month, &day, &hour, &minute,
                  &second) != 6) {
    return std::nullopt;
  }
  const std::chrono::year_month_day date(std::chrono::year(year),
                                         std::chrono::month(static_cast<unsigned>(month)),
                                         std::chrono::day(static_cast<unsigned>(day)));
  const bool clockFits =
      hour >= 0 && hour < 24 && minute >= 0 && minute < 60 && second >= 0 && second <= 60;
  if (month < 1 || day < 1 || !date.ok() || !clockFits) return std::nullopt;

  const auto days = std::chrono::sys_days(date).time_since_epoch();
  CaptureTime time;
  time.seconds =
      static_cast<double>(std::chrono::seconds(days).count()) + hour * 3600 + minute * 60 + second;
  time.text =
      fmt::format("{:04}-{:02}-{:02}T{:02}:{:02}:{:02}", year, month, day, hour, minute, second);
  const auto isDigit = [](char letter) { return letter >= '0' && letter <= '9'; };
  if (!fraction.empty() && std::all_of(fraction.begin(), fraction.end(), isDigit)) {
    time.seconds += std::strtod(("0." + fraction).c_str(), nullptr);
    time.text += "." + fraction;
  }
  const std::optional<int> offset = readOffset(offsetText);
  time.hasZone = offset.has_value();
  time.zoneSeconds = offset.value_or(0);
  if (offset) {
    time.seconds -= *offset;
    time.text += offsetText;
  }
  return time;
}

}  // namespace

std::optional<CaptureTime> exifCaptureTime(std::span<const std::uint8_t> payload) {
  const Exif exif(exif_data_new_from_data(payload.data(), static_cast<unsigned>(payload.size())));
  if (exif == nullptr) return std::nullopt;
  for (const TimeTags& tags : timeTags) {
    std::optional<CaptureTime> time = readTime(textOf(exif, tags.directory, tags.time),
                                               textOf(exif, EXIF_IFD_EXIF, tags.fraction),
                                               textOf(exif, EXIF_IFD_EXIF, tags.offset));
    if (time) return time;
  }
  return std::nullopt;
}

}  // namespace pelorin::photo

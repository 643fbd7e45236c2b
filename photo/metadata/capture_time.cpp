#include "photo/metadata/capture_time.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdlib>
#include <string_view>

#include "image_processing/core/number_text.h"
#include "image_processing/core/parameter_strings.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/segments.h"
#include "photo/metadata/tiff.h"

namespace pelorin::photo {
namespace {

constexpr std::uint16_t exifDirectoryTag = 0x8769;

struct TimeTags {
  bool inFirstDirectory;  // else in the Exif one, where fraction and offset always are
  std::uint16_t time, fraction, offset;
};

// Of the original, the digitised and the file.
constexpr std::array<TimeTags, 3> timeTags = {{
    {false, 0x9003, 0x9291, 0x9011},
    {false, 0x9004, 0x9292, 0x9012},
    {true, 0x0132, 0x9290, 0x9010},
}};

std::string textOf(std::span<const std::uint8_t> bytes, const TiffDirectory& directory,
                   std::uint16_t tag) {
  constexpr std::uint16_t ascii = 2;
  const TiffEntry* entry = directory.find(tag);
  if (entry == nullptr || entry->type != ascii) return "";
  const auto value = bytes.subspan(entry->valuePlace, entry->valueSize);
  std::string text(value.begin(), std::find(value.begin(), value.end(), 0));
  while (!text.empty() && text.back() == ' ') text.pop_back();
  return text;
}

// Goes along a text as scanf does.
class Reader {
 public:
  explicit Reader(std::string_view text) : left_(text) {}

  bool isAtEnd() const { return left_.empty(); }
  void skipSpace() {
    left_.remove_prefix(std::min(left_.find_first_not_of(" \t\n\v\f\r"), left_.size()));
  }
  bool skip(char letter) {
    if (!left_.starts_with(letter)) return false;
    left_.remove_prefix(1);
    return true;
  }
  // After white space, of at most so many letters, the first of which may be a sign.
  std::optional<int> number(std::size_t letters) {
    skipSpace();
    const std::string_view field = left_.substr(0, letters);
    const std::size_t start = field.starts_with('+') || field.starts_with('-') ? 1 : 0;
    std::size_t end = start;
    int value = 0;
    for (; end < field.size() && field[end] >= '0' && field[end] <= '9'; ++end) {
      value = 10 * value + (field[end] - '0');
    }
    if (end == start) return std::nullopt;
    left_.remove_prefix(end);
    return field.starts_with('-') ? -value : value;
  }

 private:
  std::string_view left_;
};

// "+02:00" in seconds.
std::optional<int> readOffset(const std::string& text) {
  Reader reader(text);
  const bool west = reader.skip('-');
  if (!west && !reader.skip('+')) return std::nullopt;
  const std::optional<int> hours = reader.number(2);
  if (!hours || !reader.skip(':')) return std::nullopt;
  const std::optional<int> minutes = reader.number(2);
  if (!minutes || !reader.isAtEnd()) return std::nullopt;
  if (*hours < 0 || *hours > 14 || *minutes < 0 || *minutes >= 60) return std::nullopt;
  return (west ? -1 : 1) * (*hours * 60 + *minutes) * 60;
}

std::optional<CaptureTime> readTime(const std::string& text, const std::string& fraction,
                                    const std::string& offsetText) {
  Reader reader(text);
  std::array<int, 6> fields{};  // "2024:05:01 12:30:45"
  for (std::size_t i = 0; i < fields.size(); ++i) {
    if (i == 3) {
      reader.skipSpace();
    } else if (i > 0 && !reader.skip(':')) {
      return std::nullopt;
    }
    const std::optional<int> number = reader.number(i == 0 ? 4 : 2);
    if (!number) return std::nullopt;
    fields[i] = *number;
  }
  const auto [year, month, day, hour, minute, second] = fields;
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
  const auto two = [](int value) { return image_processing::paddedText(value, 2); };
  time.text = image_processing::paddedText(year, 4) + "-" + two(month) + "-" + two(day) + "T" +
              two(hour) + ":" + two(minute) + ":" + two(second);
  const auto isDigit = [](char letter) { return letter >= '0' && letter <= '9'; };
  if (!fraction.empty() && std::all_of(fraction.begin(), fraction.end(), isDigit)) {
    time.seconds += image_processing::readNumber("0." + fraction);
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
  if (!isExif(payload)) return std::nullopt;
  const std::span<const std::uint8_t> bytes = payload.subspan(exifMark.size());
  const Tiff tiff(bytes);
  const TiffDirectory first = tiff.firstDirectory();
  const TiffDirectory exif = tiff.directoryOf(first.find(exifDirectoryTag));
  for (const TimeTags& tags : timeTags) {
    std::optional<CaptureTime> time =
        readTime(textOf(bytes, tags.inFirstDirectory ? first : exif, tags.time),
                 textOf(bytes, exif, tags.fraction), textOf(bytes, exif, tags.offset));
    if (time) return time;
  }
  return std::nullopt;
}

}  // namespace pelorin::photo

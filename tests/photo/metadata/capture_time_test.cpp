#include "photo/metadata/capture_time.h"

#include <gtest/gtest.h>

#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::ExifFields;
using test_support::exifPayload;

std::optional<CaptureTime> timeOf(const std::string& dateTime, const std::string& subSeconds = "",
                                  const std::string& offset = "") {
  return exifCaptureTime(exifPayload({1, dateTime, subSeconds, offset}, true));
}

TEST(CaptureTime, IsReadInBothByteOrders) {
  for (const bool littleEndian : {false, true}) {
    const auto time =
        exifCaptureTime(exifPayload({1, "2024:05:01 12:30:45", "", ""}, littleEndian));
    ASSERT_TRUE(time);
    EXPECT_EQ(time->text, "2024-05-01T12:30:45");
    EXPECT_EQ(time->seconds, 1714566645.0);
    EXPECT_FALSE(time->hasZone);
  }
}

TEST(CaptureTime, CountsSubSecondsAsAFraction) {
  EXPECT_EQ(timeOf("1970:01:01 00:00:01", "25")->seconds, 1.25);
  EXPECT_EQ(timeOf("1970:01:01 00:00:01", "025")->seconds, 1.025);
  EXPECT_EQ(timeOf("1970:01:01 00:00:01", "25")->text, "1970-01-01T00:00:01.25");
  EXPECT_EQ(timeOf("1970:01:01 00:00:01", "2x")->seconds, 1.0);
}

TEST(CaptureTime, IsInUtcWhenTheOffsetIsStated) {
  const auto time = timeOf("2024:05:01 12:30:45", "", "+02:00");
  EXPECT_TRUE(time->hasZone);
  EXPECT_EQ(time->zoneSeconds, 7200);
  EXPECT_EQ(time->seconds, 1714566645.0 - 7200);
  EXPECT_EQ(time->text, "2024-05-01T12:30:45+02:00");
  EXPECT_EQ(timeOf("2024:05:01 12:30:45", "", "-03:30")->seconds, 1714566645.0 + 12600);
  EXPECT_FALSE(timeOf("2024:05:01 12:30:45", "", "CEST")->hasZone);
}

TEST(CaptureTime, MayHaveSpacesAndSignsInPlaceOfZeros) {
  for (const char* text : {"2024: 5: 1 12:30: 5", " 2024:05:01  12:30:05", "2024:+5:+1 12:30:+5",
                           "2024:05:0112:30:05", "2024:05:01 12:30:05Z"}) {
    const auto time = timeOf(text);
    ASSERT_TRUE(time) << text;
    EXPECT_EQ(time->text, "2024-05-01T12:30:05") << text;
  }
  for (const char* text :
       {"2024 :05:01 12:30:05", "2024:05:01T12:30:05", "2024:-5:01 12:30:05", "2024:05:01 12:30",
        "2024:05:01 12:30:", "20245:05:01 12:30:05", "2024:+:01 12:30:05"}) {
    EXPECT_FALSE(timeOf(text)) << text;
  }
  for (const char* offset : {"+2:00", "+ 2: 0", "+02:0"}) {
    EXPECT_EQ(timeOf("2024:05:01 12:30:45", "", offset)->zoneSeconds, 7200) << offset;
  }
  for (const char* offset : {"02:00", "+02", "+02:", "+15:00", "+02:60", "+-2:00", "Z"}) {
    EXPECT_FALSE(timeOf("2024:05:01 12:30:45", "", offset)->hasZone) << offset;
  }
}

TEST(CaptureTime, IsAbsentWhenTheTextIsNoDate) {
  for (const char* text : {"    :  :     :  :  ", "0000:00:00 00:00:00", "2023:02:29 10:00:00",
                           "2023:13:01 10:00:00", "2023:01:01 24:00:00", "yesterday, at noon"}) {
    EXPECT_FALSE(timeOf(text)) << text;
  }
}

TEST(CaptureTime, IsAbsentWithoutATimeOrWithoutExif) {
  EXPECT_FALSE(exifCaptureTime(exifPayload({6, "", "", ""}, true)));
  EXPECT_FALSE(exifCaptureTime(Bytes{}));
  EXPECT_FALSE(exifCaptureTime(Bytes{'E', 'x', 'i', 'f', 0, 0}));
}

}  // namespace
}  // namespace pelorin::photo

#include "photo/metadata/exif_orientation.h"

#include <gtest/gtest.h>
#include <libexif/exif-data.h>

#include "tests/cli/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::exifPayload;
using test_support::Random;

int orientationByLibexif(const Bytes& payload) {
  ExifData* data = exif_data_new_from_data(payload.data(), static_cast<unsigned>(payload.size()));
  const ExifEntry* entry = exif_content_get_entry(data->ifd[EXIF_IFD_0], EXIF_TAG_ORIENTATION);
  const int orientation =
      entry == nullptr ? 0 : exif_get_short(entry->data, exif_data_get_byte_order(data));
  exif_data_unref(data);
  return orientation;
}

TEST(ExifOrientation, IsReadInBothByteOrders) {
  for (const bool littleEndian : {false, true}) {
    for (int orientation = 1; orientation <= 8; ++orientation) {
      const Bytes payload = exifPayload({orientation, "", "", ""}, littleEndian);
      EXPECT_EQ(exifOrientation(payload), orientation);
      EXPECT_EQ(orientationByLibexif(payload), orientation);
    }
  }
}

TEST(ExifOrientation, BecomesUprightByOneByteAndNothingElse) {
  for (const bool littleEndian : {false, true}) {
    const Bytes before = exifPayload({6, "2024:05:01 12:30:45", "25", "+02:00"}, littleEndian);
    Bytes after = before;
    setExifOrientationUpright(after);
    EXPECT_EQ(exifOrientation(after), 1);
    EXPECT_EQ(orientationByLibexif(after), 1);
    EXPECT_EQ(after, exifPayload({1, "2024:05:01 12:30:45", "25", "+02:00"}, littleEndian));
  }
}

TEST(ExifOrientation, IsUprightForValuesThatMeanNothing) {
  for (const int value : {0, 9, 255, 65535}) {
    Bytes payload = exifPayload({1, "", "", ""}, true);
    const std::size_t place = 6 + 8 + 2 + 8;
    payload[place] = static_cast<std::uint8_t>(value);
    payload[place + 1] = static_cast<std::uint8_t>(value >> 8);
    const Bytes before = payload;
    EXPECT_EQ(exifOrientation(payload), 1);
    setExifOrientationUpright(payload);
    EXPECT_EQ(payload, before);
  }
}

TEST(ExifOrientation, OfSeveralIsTheFirstAndAllBecomeUpright) {
  Bytes payload = {'E', 'x', 'i', 'f', 0, 0, 'M', 'M', 0, 42, 0, 0, 0, 8, 0, 2};
  for (const std::uint8_t value : {3, 6}) {
    const Bytes entry = {0x01, 0x12, 0, 3, 0, 0, 0, 1, 0, value, 0, 0};
    payload.insert(payload.end(), entry.begin(), entry.end());
  }
  EXPECT_EQ(exifOrientation(payload), 3);
  setExifOrientationUpright(payload);
  EXPECT_EQ(payload[6 + 8 + 2 + 9], 1);
  EXPECT_EQ(payload[6 + 8 + 2 + 12 + 9], 1);
}

TEST(ExifOrientation, SurvivesASegmentCutAnywhere) {
  for (const bool littleEndian : {false, true}) {
    const Bytes whole = exifPayload({6, "2024:05:01 12:30:45", "", ""}, littleEndian);
    for (std::size_t size = 0; size < whole.size(); ++size) {
      Bytes cut(whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(size));
      const int orientation = exifOrientation(cut);
      EXPECT_TRUE(orientation == 1 || orientation == 6);
      setExifOrientationUpright(cut);
      EXPECT_EQ(exifOrientation(cut), 1);
    }
  }
}

TEST(ExifOrientation, SurvivesOffsetsAndCountsBeyondTheSegment) {
  const Bytes good = exifPayload({6, "", "", ""}, true);
  for (std::size_t place = 6; place + 4 <= good.size(); ++place) {
    for (const std::uint32_t hostile : {0xFFFFFFFFu, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFF0u,
                                        static_cast<std::uint32_t>(good.size() - 6),
                                        static_cast<std::uint32_t>(good.size() - 7)}) {
      Bytes payload = good;
      for (int i = 0; i < 4; ++i) payload[place + i] = static_cast<std::uint8_t>(hostile >> 8 * i);
      setExifOrientationUpright(payload);
      EXPECT_EQ(exifOrientation(payload), 1);
    }
  }
}

TEST(ExifOrientation, IsUprightForWhatIsNoExif) {
  Bytes noise(200);
  Random random(7);
  for (int round = 0; round < 1000; ++round) {
    for (std::uint8_t& byte : noise) byte = static_cast<std::uint8_t>(random.below(256));
    const Bytes before = noise;
    EXPECT_EQ(exifOrientation(noise), 1);
    setExifOrientationUpright(noise);
    EXPECT_EQ(noise, before);
  }
  EXPECT_EQ(exifOrientation(Bytes{}), 1);
}

}  // namespace
}  // namespace pelorin::photo

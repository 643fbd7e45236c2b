#include "photo/metadata/exif_orientation.h"

#include <gtest/gtest.h>
#include <libexif/exif-data.h>

#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"
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

TEST(ExifOrientation, IsUprightForValuesThatMeanNothing) {
  for (const int value : {0, 9, 255, 65535}) {
    Bytes payload = exifPayload({1, "", "", ""}, true);
    const std::size_t place = 6 + 8 + 2 + 8;
    payload[place] = static_cast<std::uint8_t>(value);
    payload[place + 1] = static_cast<std::uint8_t>(value >> 8);
    EXPECT_EQ(exifOrientation(payload), 1);
  }
}

TEST(ExifOrientation, OfSeveralIsTheFirst) {
  Bytes payload = {'E', 'x', 'i', 'f', 0, 0, 'M', 'M', 0, 42, 0, 0, 0, 8, 0, 2};
  for (const std::uint8_t value : {3, 6}) {
    const Bytes entry = {0x01, 0x12, 0, 3, 0, 0, 0, 1, 0, value, 0, 0};
    payload.insert(payload.end(), entry.begin(), entry.end());
  }
  EXPECT_EQ(exifOrientation(payload), 3);
}

TEST(ExifOrientation, SurvivesASegmentCutAnywhere) {
  for (const bool littleEndian : {false, true}) {
    const Bytes whole = exifPayload({6, "2024:05:01 12:30:45", "", ""}, littleEndian);
    for (std::size_t size = 0; size < whole.size(); ++size) {
      const int orientation = exifOrientation(std::span(whole).first(size));
      EXPECT_TRUE(orientation == 1 || orientation == 6);
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
      const int orientation = exifOrientation(payload);
      EXPECT_TRUE(orientation >= 1 && orientation <= 8);
    }
  }
}

TEST(ExifOrientation, IsUprightForWhatIsNoExif) {
  Bytes noise(200);
  Random random(7);
  for (int round = 0; round < 1000; ++round) {
    for (std::uint8_t& byte : noise) byte = static_cast<std::uint8_t>(random.below(256));
    EXPECT_EQ(exifOrientation(noise), 1);
  }
  EXPECT_EQ(exifOrientation(Bytes{}), 1);
}

}  // namespace
}  // namespace pelorin::photo

#include "photo/metadata/jpeg_tail.h"

#include <gtest/gtest.h>

#include <string>

#include "photo/jpeg/jpeg_end.h"
#include "photo/metadata/mpf.h"
#include "tests/photo/metadata/phone_photos.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using namespace std::string_literals;
using test_support::Bytes;
using test_support::bytesOf;
using test_support::gainMap;
using test_support::joined;
using test_support::jpegWith;
using test_support::photoLikePicture;
using test_support::video;
using Kind = TailPart::Kind;

std::vector<Kind> kindsIn(const Bytes& tail) {
  std::vector<Kind> kinds;
  for (const TailPart& part : readTail(tail)) kinds.push_back(part.kind);
  return kinds;
}

const Bytes preview = jpegWith(photoLikePicture(16, 16, 2), {{0xE1, Bytes(100, 0xD9)}});

TEST(JpegEnd, IsBehindTheEndMarkWhateverTheSegmentsHold) {
  EXPECT_EQ(jpegEnd(preview), preview.size());
  EXPECT_EQ(jpegEnd(joined({preview, bytesOf("\xFF\xD9more"s)})), preview.size());
  EXPECT_EQ(jpegEnd(bytesOf("no picture")), 0u);
  EXPECT_EQ(jpegEnd({}), 0u);
  for (std::size_t size = 2; size < preview.size(); ++size)
    EXPECT_EQ(jpegEnd(std::span(preview).first(size)), size) << "cut";
}

TEST(JpegTail, IsTakenApartWithAndWithoutPadding) {
  const Bytes padding(5, 0);
  EXPECT_EQ(kindsIn(joined({gainMap(), preview, video()})),
            (std::vector{Kind::gainMap, Kind::picture, Kind::video}));
  EXPECT_EQ(kindsIn(joined({padding, gainMap(true), padding, video(), padding})),
            (std::vector{Kind::gainMap, Kind::video}));
  EXPECT_EQ(readTail(joined({padding, video()}))[0].bytes, video());
  EXPECT_TRUE(kindsIn(padding).empty());
}

TEST(JpegTail, KnowsTrailersByTheirEnds) {
  const auto big = [](std::size_t value) {
    return std::string{0, 0, static_cast<char>(value >> 8), static_cast<char>(value)};
  };
  const std::string canon = "CANON OPTIONAL DATA\0"s;
  const Bytes recipe =
      bytesOf(canon + std::string(8, 'h') + "recipe" + canon + big(6) + std::string(40, 'f'));
  const Bytes tags = bytesOf("tags" + big(4) + "cbipcbbl");
  const Bytes record = bytesOf("preview" + "\0\2"s + big(17) + "\xA1\xB2\xC3\xD4");
  const Bytes afcp = bytesOf("AXS!data of it" + "AXS!\0\1\0\0\0\0\0\0"s);
  const Bytes mie = bytesOf(
      "~\x10\4\xFE"
      "0MIE"s +
      "~\0\0\6"s + big(18) + "\x10\4");
  EXPECT_EQ(kindsIn(joined({video(), recipe})), (std::vector{Kind::video, Kind::canonVrd}));
  EXPECT_EQ(kindsIn(joined({preview, tags})), (std::vector{Kind::picture, Kind::photoMechanic}));
  EXPECT_EQ(kindsIn(joined({record, tags})), (std::vector{Kind::fotoStation, Kind::photoMechanic}));
  EXPECT_EQ(kindsIn(afcp), std::vector{Kind::afcp});
  EXPECT_EQ(kindsIn(mie), std::vector{Kind::mie});
  EXPECT_EQ(kindsIn(bytesOf("who knows")), std::vector{Kind::unknown});
}

TEST(JpegTail, ThatLiesAboutItsLengthIsUnknown) {
  for (const std::string& text :
       {"xx\xFF\xFF\xFF\xFF"
        "cbipcbbl"s,
        "\0\2\xFF\xFF\xFF\xFF\xA1\xB2\xC3\xD4"s, "SEFH\0\0\0\0\xFF\xFF\xFF\xFF\x0C\0\0\0SEFT"s,
        "SEFH\xFF\xFF\xFF\x7FSEFT"s}) {
    const std::vector<Kind> kinds = kindsIn(bytesOf(text));
    ASSERT_EQ(kinds.size(), 1u);
    EXPECT_EQ(kinds[0], Kind::unknown);
  }
}

TEST(Mpf, ReadsAsItWasWritten) {
  const std::vector<MpfEntry> entries = {{mpfPrimary, 1234, 0}, {mpfUndefined, 99, 5678}};
  const Bytes index = writeMpf(entries);
  EXPECT_TRUE(isMpf(index));
  const std::vector<MpfEntry> read = readMpf(index);
  ASSERT_EQ(read.size(), 2u);
  EXPECT_EQ(read[1].size, 99u);
  EXPECT_EQ(read[1].offset, 5678u);
  for (std::size_t size = 0; size < index.size(); ++size)
    EXPECT_LE(readMpf(std::span(index).first(size)).size(), 2u);
}

}  // namespace
}  // namespace pelorin::photo

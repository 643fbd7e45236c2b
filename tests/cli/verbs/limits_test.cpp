#include <gmock/gmock.h>
#include <sys/stat.h>

#include <boost/crc.hpp>
#include <cstdint>
#include <string>
#include <vector>

#include "photo/photo.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

// Every verb that reads photos, on one of 100 x 96 pixels.
class LimitsOf : public testing::TestWithParam<const char*> {};

INSTANTIATE_TEST_SUITE_P(Verbs, LimitsOf,
                         testing::Values("enhance in/a.jpg -o out.jpg",
                                         "look spring in/a.jpg -o out.jpg",
                                         "sheet in/a.jpg -o out.png", "info in/a.jpg",
                                         "score in/a.jpg", "keypoints in/a.jpg --json",
                                         "curve in/a.jpg --text", "masks in/a.jpg -o out",
                                         "compare in/a.jpg in/a.jpg", "dupes -r in",
                                         "watch in -o out --once --settle 0"),
                         [](const auto& verb) {
                           const std::string words = verb.param;
                           return words.substr(0, words.find(' '));
                         });

TEST_P(LimitsOf, RefusesWhatAsksForMore) {
  const TemporaryFolder folder;
  folder.makeFolder("in");
  const std::string photo = folder.write("in/a.jpg", jpegOf(photoLikePicture(100, 96, 1)));
  const std::string run = "cd '" + (folder / "") + "' && $QUENBY " + GetParam();

  const Finished pixels = shell(run + " --max-pixels 9599");
  EXPECT_EQ(pixels.exitCode, 1);
  EXPECT_THAT(pixels.errors, HasSubstr("a.jpg: too large: 100 x 96 pixels, at most 9599"));
  const Finished bytes = shell(run + " --max-bytes 100");
  EXPECT_EQ(bytes.exitCode, 1);
  EXPECT_THAT(bytes.errors, HasSubstr("a.jpg: is larger than 100 bytes"));

  const Finished segments = shell(run + " --max-segments 1");
  EXPECT_EQ(segments.exitCode, 1);
  EXPECT_THAT(segments.errors, HasSubstr("a.jpg: too many segments: at most 1 can be read"));

  const Finished enough = shell(run +
                                " --max-pixels 9600 --max-bytes 1G --max-segments 9 "
                                "--max-scans 1 --timeout 3600");
  EXPECT_EQ(enough.exitCode, 0) << enough.errors;
}

TEST_P(LimitsOf, RefusesMoreScans) {
  const TemporaryFolder folder;
  folder.makeFolder("in");
  folder.write("in/a.jpg", makeJpeg({.width = 128, .height = 104, .scans = progressiveScans(10)}));
  const std::string run = "cd '" + (folder / "") + "' && $QUENBY " + GetParam();
  const Finished scans = shell(run + " --max-scans 9");
  EXPECT_EQ(scans.exitCode, 1);
  EXPECT_THAT(scans.errors, HasSubstr("a.jpg: too many scans: at most 9 can be read"));
  const Finished enough = shell(run + " --max-scans 10");
  EXPECT_EQ(enough.exitCode, 0) << enough.errors;
}

TEST(Limits, CountPixelsOfEveryFormat) {
  const TemporaryFolder folder;
  const auto picture = photoLikePicture(40, 30, 1);
  const std::string png = folder.write("a.png", photo::save(picture, *photo::formatNamed("PNG")));
  EXPECT_THAT(quenby({"info", png, "--max-pixels", "1199"}).errors, HasSubstr("at most 1199"));
  EXPECT_EQ(quenby({"info", png, "--max-pixels", "2k"}).exitCode, 0);
}

// The header of a grey PNG file of so many pixels in 70 kB, as a blank page has them, and no picture.
std::vector<std::uint8_t> headerOfBlankPage(std::uint32_t width, std::uint32_t height) {
  auto file = photo::save(photoLikePicture(4, 4, 1), *photo::formatNamed("PNG"));
  const auto store = [&](std::size_t at, std::uint32_t value) {
    for (int i = 0; i < 4; ++i) file[at + i] = static_cast<std::uint8_t>(value >> (24 - 8 * i));
  };
  store(16, width);
  store(20, height);
  file[25] = 0;  // grey
  boost::crc_32_type sum;
  sum.process_bytes(&file[12], 17);
  store(29, sum.checksum());
  file.resize(70'000);
  return file;
}

TEST(Limits, OfPixelsThatAreNamedHoldForSmallFilesAsWell) {
  const TemporaryFolder folder;
  const std::string page = folder.write("page.png", headerOfBlankPage(8000, 8000));
  for (std::vector<std::string> run :
       {std::vector<std::string>{"score", page}, {"dupes", page}, {"enhance", page}}) {
    SCOPED_TRACE(run[0]);
    EXPECT_THAT(quenby(run).errors, HasSubstr("too large: 8000 x 8000 pixels in a file of this"));
    run.insert(run.end(), {"--max-pixels", "64M"});
    EXPECT_THAT(quenby(run).errors, Not(HasSubstr("too large")));
  }
  EXPECT_EQ(quenby({"score", page, "--max-pixels", "64M"}).exitCode, 1);
}

TEST(Limits, AreNumbersAboveNought) {
  for (const std::string number : {"0", "-1", "x", "1.5", "5T", "30000000000G"}) {
    SCOPED_TRACE(number);
    const Finished run = quenby({"info", "a.jpg", "--max-pixels=" + number});
    EXPECT_EQ(run.exitCode, 2);
    EXPECT_THAT(run.errors, StartsWith("quenby info: --max-pixels: "));
  }
  for (const char* option : {"--timeout=-1", "--max-scans=0", "--max-segments=-1"})
    EXPECT_EQ(quenby({"info", "a.jpg", option}).exitCode, 2) << option;
}

// Takes the second that it is about: nobody writes into the pipe.
TEST(Limits, GiveUpAPhotoThatTakesTooLong) {
  const TemporaryFolder folder;
  const std::string pipe = folder / "pipe.jpg";
  ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
  const std::string after = folder.write("b.jpg", smallJpeg());
  const Finished run = quenby({"info", pipe, after, "--timeout", "1"});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.errors, HasSubstr("pipe.jpg: takes longer than 1 s; raise --timeout"));
  EXPECT_THAT(run.output, HasSubstr("b.jpg"));
}

}  // namespace
}  // namespace pelorin::test_support

#include <gmock/gmock.h>

#include "cli/frame/number_text.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/bytes.h"
#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::BoundingBox;
using image_processing::ImageMetadata;
using image_processing::ImageStatistics;
using testing::HasSubstr;

std::vector<double> nineDigitsOf(const std::vector<float>& values) {
  std::vector<double> numbers;
  for (const float value : values) numbers.push_back(cli::nineDigits(value));
  return numbers;
}

TEST(Info, GivesTheEnginesNumbersToNineDigits) {
  const Image<RGBA8Pixel> picture = photoLikePicture(200, 100, 5);
  ImageMetadata metadata;
  metadata.faces.push_back(std::make_shared<BoundingBox>(BoundingBox{50, 150, 80, 20}));
  ImageStatistics statistics;
  image_processing::analyzeImage(picture, metadata, statistics);
  ASSERT_GE(statistics.faceMedianBin, 0);
  image_processing::FilterConfig config = image_processing::defaultFilterConfigValue;
  image_processing::updateFilterConfigForSliderValue(0.8f, &config);

  const Finished run = quenby(
      {"info", "--json", "--raw", "200x100", "-", "--slider", "0.8", "--face", "0.25,0.2,0.75,0.8"},
      rawBytes(picture));
  ASSERT_EQ(run.exitCode, 0) << run.errors;
  const nlohmann::json info = parsedJson(run.output);
  EXPECT_EQ(info["width"], 200);
  EXPECT_EQ(info["height"], 100);
  EXPECT_EQ(info["faceMedianBin"], statistics.faceMedianBin);
  EXPECT_EQ(info["cdf"].get<std::vector<double>>(), nineDigitsOf(statistics.cdf));
  EXPECT_EQ(info["curve"].get<std::vector<double>>(),
            nineDigitsOf(image_processing::buildToneCurve(statistics, config)));
  std::size_t median = 0;
  while (statistics.cdf[median] < 0.5f) ++median;
  EXPECT_EQ(info["medianBin"], median);
}

TEST(Info, HasNoFaceMedianWithoutFaces) {
  const TemporaryFolder folder;
  const Finished run = quenby({"info", "--json", folder.write("a.jpg", smallJpeg())});
  EXPECT_EQ(parsedJson(run.output)["faceMedianBin"], -1);
}

TEST(Info, TellsWhatTheFileSays) {
  const TemporaryFolder folder;
  const Bytes exif = exifPayload({6, "2024:05:01 12:30:45", "25", "+02:00"}, false);
  const std::string in = folder.write("a.jpg", jpegOf(photoLikePicture(48, 32, 1), {{0xE1, exif}}));
  const nlohmann::json info = parsedJson(quenby({"info", "--json", in}).output);
  EXPECT_EQ(info["file"], in);
  EXPECT_EQ(info["storedWidth"], 48);
  EXPECT_EQ(info["storedHeight"], 32);
  EXPECT_EQ(info["width"], 32);
  EXPECT_EQ(info["height"], 48);
  EXPECT_EQ(info["orientation"], 6);
  EXPECT_EQ(info["components"], 3);
  EXPECT_EQ(info["progressive"], false);
  EXPECT_EQ(info["captureTime"], "2024-05-01T12:30:45.25+02:00");
}

TEST(Info, ShowsAPersonTheSame) {
  const TemporaryFolder folder;
  const Bytes exif = exifPayload({6, "2024:05:01 12:30:45", "", ""}, false);
  const std::string in = folder.write("a.jpg", jpegOf(photoLikePicture(48, 32, 1), {{0xE1, exif}}));
  const Finished run = quenby({"info", in, "--face", "0,0,1,1", "--slider", "0"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_THAT(run.output, HasSubstr("32 x 48"));
  EXPECT_THAT(run.output, HasSubstr("orientation  6"));
  EXPECT_THAT(run.output, HasSubstr("2024-05-01T12:30:45"));
  EXPECT_THAT(run.output, HasSubstr("face median"));
  EXPECT_THAT(run.output, HasSubstr("#"));
  // At slider 0 the curve is the identity.
  EXPECT_THAT(run.output, HasSubstr("out    0  10  20  30  40  50  60  70  80  90 100"));
}

TEST(Info, TakesSeveralFilesAndFolders) {
  const TemporaryFolder folder;
  folder.write("in/a.jpg", smallJpeg(1));
  folder.write("in/b.jpg", std::string("x"));
  folder.write("in/c.jpg", smallJpeg(2));
  const Finished run = quenby({"info", "--json", "-r", folder / "in", "-j", "2"});
  EXPECT_EQ(run.exitCode, 1);
  const nlohmann::json info = parsedJson(run.output);
  ASSERT_EQ(info.size(), 3u);
  EXPECT_EQ(info[0]["file"], folder / "in/a.jpg");
  EXPECT_TRUE(info[1].contains("error"));
  EXPECT_EQ(info[2]["file"], folder / "in/c.jpg");
  EXPECT_EQ(quenby({"info", "-r", folder.makeFolder("empty")}).exitCode, 3);
}

TEST(Info, RefusesBadNumbersBeforeAnyWork) {
  for (const char* slider : {"nan", "2", "x"}) {
    EXPECT_EQ(quenby({"info", "none.jpg", "--slider", slider}).exitCode, 2);
  }
  EXPECT_EQ(quenby({"info", "none.jpg"}).exitCode, 1);
}

}  // namespace
}  // namespace pelorin::test_support

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>

#include "cli/frame/faces.h"
#include "cli/pictures/plot.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "photo/photo.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::ImageStatistics;
using testing::HasSubstr;
using testing::UnorderedElementsAre;

struct Expected {
  ImageStatistics statistics;
  std::vector<float> curve;
};

/// Straight from the engine.
Expected curveOf(const Image<RGBA8Pixel>& picture, float slider,
                 const std::vector<std::string>& faces = {}) {
  Expected expected;
  image_processing::analyzeImage(
      picture, cli::metadataWithFaces(cli::readFaces(faces), picture.width, picture.height),
      expected.statistics);
  image_processing::FilterConfig config = image_processing::defaultFilterConfigValue;
  image_processing::updateFilterConfigForSliderValue(slider, &config);
  expected.curve = image_processing::buildToneCurve(expected.statistics, config);
  return expected;
}

std::vector<float> floatsIn(const std::string& lines) {
  std::istringstream stream(lines);
  std::vector<float> values;
  for (std::string line; std::getline(stream, line);) values.push_back(std::stof(line));
  return values;
}

class CurveVerb : public testing::Test {
 protected:
  Finished run(std::vector<std::string> options, const std::string& size = "83x59") {
    std::vector<std::string> arguments = {"curve", input, "--raw", size};
    arguments.insert(arguments.end(), options.begin(), options.end());
    return quenby(arguments);
  }

  const TemporaryFolder folder;
  const Image<RGBA8Pixel> picture = photoLikePicture(83, 59, 5);
  const std::string input = folder.write(
      "in.rgba", Bytes(&picture.data.get()->r, &picture.data.get()->r + picture.byteSize()));
};

TEST_F(CurveVerb, PrintsTheEnginesSamplesExactly) {
  for (const char* slider : {"0", "0.15", "0.3", "0.4", "1"}) {
    const Finished finished = run({"--slider", slider, "--text"});
    EXPECT_EQ(finished.exitCode, 0);
    EXPECT_EQ(finished.errors, "");
    EXPECT_EQ(floatsIn(finished.output), curveOf(picture, std::stof(slider)).curve) << slider;
  }
}

TEST_F(CurveVerb, PrintsOneSampleALineWithNineDigits) {
  const std::string text = run({"--slider", "0", "--text"}).output;
  EXPECT_EQ(std::count(text.begin(), text.end(), '\n'), 51);
  EXPECT_EQ(text.substr(0, 2), "0\n");
  EXPECT_THAT(text, HasSubstr("\n0.0199999996\n"));  // the float 0.02
}

TEST_F(CurveVerb, IsThatOfSlider04UnlessGiven) {
  EXPECT_EQ(floatsIn(run({"--text"}).output), curveOf(picture, 0.4f).curve);
}

TEST_F(CurveVerb, IsLiftedForFaces) {
  const std::vector<std::string> faces = {"0.1,0.1,0.4,0.5"};
  const auto json = parsedJson(run({"--face", faces[0], "--json"}).output);
  const Expected expected = curveOf(picture, 0.4f, faces);
  EXPECT_GE(expected.statistics.faceMedianBin, 0);
  EXPECT_EQ(json.at("faceMedianBin"), expected.statistics.faceMedianBin);
  EXPECT_EQ(json.at("curve").get<std::vector<float>>(), expected.curve);
}

TEST_F(CurveVerb, TellsEverythingAsJson) {
  const auto json = parsedJson(run({"--slider", "0.7", "--json"}).output);
  const Expected expected = curveOf(picture, 0.7f);
  EXPECT_EQ(json.at("file"), input);
  EXPECT_EQ(json.at("width"), 83);
  EXPECT_EQ(json.at("height"), 59);
  EXPECT_EQ(json.at("slider").get<float>(), 0.7f);
  EXPECT_EQ(json.at("faceMedianBin"), -1);
  EXPECT_EQ(json.at("cdf").get<std::vector<float>>(), expected.statistics.cdf);
  EXPECT_EQ(json.at("curve").get<std::vector<float>>(), expected.curve);
}

TEST_F(CurveVerb, IsPlottedAndPrintedAtOnce) {
  const Finished finished = run({"-o", folder / "curve.png", "--text"});
  EXPECT_EQ(finished.exitCode, 0);
  EXPECT_EQ(floatsIn(finished.output).size(), 51u);
  const auto plot = *photo::open(folder.read("curve.png")).image;
  EXPECT_EQ(plot.width, 1440u);
  // Every curve starts in the lower left corner of the axes, in the line's red.
  const cli::PlotArea area = cli::plotArea();
  bool red = false;
  for (int dy = 0; dy < 8; ++dy) {
    for (int dx = 0; dx < 8; ++dx) {
      const RGBA8Pixel& p = plot.row(static_cast<std::uint32_t>(area.bottom) - 2 -
                                     dy)[static_cast<std::uint32_t>(area.left) + 2 + dx];
      red = red || (p.r > 150 && p.g < 110 && p.b < 110);
    }
  }
  EXPECT_TRUE(red);
}

TEST_F(CurveVerb, IsPlottedToStandardOutput) {
  const Finished finished = quenby({"curve", "-", "-o", "-"}, smallJpeg());
  EXPECT_EQ(finished.exitCode, 0) << finished.errors;
  const auto* first = reinterpret_cast<const std::uint8_t*>(finished.output.data());
  EXPECT_EQ(photo::open({first, finished.output.size()}).image->height, 1320u);
}

TEST_F(CurveVerb, OfAThinPictureIsPlotted) {
  for (const char* size : {"65500x1", "1x65500"}) {
    folder.write("in.rgba", Bytes(std::size_t{65500} * 4, 77));
    EXPECT_EQ(run({"-o", folder / "thin.png", "--overwrite"}, size).exitCode, 0);
    EXPECT_TRUE(folder.has("thin.png"));
  }
}

TEST_F(CurveVerb, NeedsSomethingToMakeOfIt) {
  const Finished finished = run({});
  EXPECT_EQ(finished.exitCode, 2);
  EXPECT_THAT(finished.errors, HasSubstr("-o PLOT.png, --text or --json"));
}

TEST_F(CurveVerb, SharesStandardOutputWithNothing) {
  EXPECT_EQ(run({"--text", "--json"}).exitCode, 2);
  EXPECT_EQ(run({"-o", "-", "--text"}).exitCode, 2);
  EXPECT_EQ(run({"-o", "-", "--jsonl"}).exitCode, 2);
}

TEST_F(CurveVerb, RefusesSlidersOutsideItsRange) {
  for (const char* slider : {"-0.1", "1.1", "nan", "inf", "0,4", "", "x"}) {
    const Finished finished = run({"--slider", slider, "--text"});
    EXPECT_EQ(finished.exitCode, 2) << slider;
    EXPECT_EQ(finished.output, "");
  }
}

TEST_F(CurveVerb, RefusesOutputsThatAreNoPlaceForAPlot) {
  EXPECT_EQ(run({"-o", folder.path()}).exitCode, 2);
  EXPECT_EQ(run({"-o", folder / "no/curve.png"}).exitCode, 2);
  const std::string photo = folder.write("photo.png", smallJpeg());
  const Finished onItself = quenby({"curve", photo, "-o", photo, "--overwrite"});
  EXPECT_EQ(onItself.exitCode, 2);
  EXPECT_THAT(onItself.errors, HasSubstr("is itself an input"));
  EXPECT_EQ(folder.read("photo.png"), smallJpeg());
}

TEST_F(CurveVerb, KeepsAnOldPlotUnlessTold) {
  folder.write("curve.png", "old");
  EXPECT_EQ(run({"-o", folder / "curve.png"}).exitCode, 3);
  EXPECT_EQ(folder.read("curve.png"), (Bytes{'o', 'l', 'd'}));
  const Finished full = shell("ulimit -f 1; $QUENBY curve '" + input +
                              "' --raw 83x59 --overwrite -o '" + (folder / "curve.png") + "'");
  EXPECT_EQ(full.exitCode, 1);
  EXPECT_EQ(folder.read("curve.png"), (Bytes{'o', 'l', 'd'}));
  EXPECT_THAT(folder.content(), UnorderedElementsAre("in.rgba", "curve.png"));
  EXPECT_EQ(run({"-o", folder / "curve.png", "--overwrite"}).exitCode, 0);
}

TEST_F(CurveVerb, OfABadFileIsOneLineNamingIt) {
  for (const std::string& bad : {folder / "missing.jpg", folder.write("text.jpg", "no picture")}) {
    const Finished finished = quenby({"curve", bad, "--text"});
    EXPECT_EQ(finished.exitCode, 1);
    EXPECT_EQ(finished.output, "");
    EXPECT_THAT(finished.errors, testing::StartsWith("quenby curve: " + bad + ": "));
    EXPECT_EQ(std::count(finished.errors.begin(), finished.errors.end(), '\n'), 1);
  }
  EXPECT_EQ(quenby({"curve", folder.path(), "--text"}).exitCode, 2);
}

}  // namespace
}  // namespace pelorin::test_support

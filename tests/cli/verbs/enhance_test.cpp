#include <gmock/gmock.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::defaultFilterConfigValue;
using image_processing::DefaultFilterFactory;
using image_processing::FilteredImage;
using image_processing::ImageMetadata;
using testing::HasSubstr;
using testing::IsEmpty;

// What the command should write: decoded, filtered by the engine itself, encoded.
Bytes enhancedDirectly(const Bytes& file, const std::string& filter, const std::string& params,
                       int quality = 90, int scale = 1) {
  const photo::DecodedPicture picture = photo::decodeJpeg(file, scale);
  auto image = std::make_shared<Image<RGBA8Pixel>>(picture.width, picture.height);
  std::memcpy(image->data.get(), picture.pixels.get(), image->byteSize());
  Image<RGBA8Pixel> result(picture.width, picture.height);
  FilteredImage session(image, ImageMetadata{}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  EXPECT_TRUE(session.applyFilterWithParams(filter, params, defaultFilterConfigValue, result));
  return jpegOf(result, {}, quality);
}

TEST(Enhance, WritesWhatTheEngineGives) {
  const TemporaryFolder folder;
  const Bytes file = jpegOf(photoLikePicture(120, 90, 1));
  const std::string in = folder.write("a.jpg", file);
  struct Case {
    std::vector<std::string> options;
    Bytes expected;
  };
  const std::vector<Case> cases = {
      {{}, enhancedDirectly(file, "AE0", "slider=0.4;")},
      {{"--slider", "0.85"}, enhancedDirectly(file, "AE0", "slider=0.85;")},
      {{"--filter", "AE08bit"}, enhancedDirectly(file, "AE08bit", "slider=0.4;")},
      {{"--global-only"}, enhancedDirectly(file, "AE0", "slider=0.4;gtmOnly=true;")},
      {{"--params", "slider=1.5;", "-q"}, enhancedDirectly(file, "AE0", "slider=1.5;")},
      {{"--filter", "PassThrough"}, enhancedDirectly(file, "PassThrough", "")},
      {{"--quality", "50"}, enhancedDirectly(file, "AE0", "slider=0.4;", 50)},
      {{"--scale", "2"}, enhancedDirectly(file, "AE0", "slider=0.4;", 90, 2)},
  };
  for (const Case& c : cases) {
    std::vector<std::string> arguments = {"enhance",     in,         "-o", folder / "out.jpg",
                                          "--overwrite", "--no-mark"};
    arguments.insert(arguments.end(), c.options.begin(), c.options.end());
    const Finished run = quenby(arguments);
    EXPECT_EQ(run.exitCode, 0) << run.errors;
    EXPECT_THAT(run.output, IsEmpty());
    EXPECT_THAT(run.errors, IsEmpty());
    EXPECT_EQ(folder.read("out.jpg"), c.expected) << testing::PrintToString(c.options);
  }
}

TEST(Enhance, LeavesTheInputAlone) {
  const TemporaryFolder folder;
  const Bytes file = smallJpeg();
  quenby({"enhance", folder.write("a.jpg", file), "-o", folder / "b.jpg"});
  EXPECT_EQ(folder.read("a.jpg"), file);
  EXPECT_THAT(folder.content(), testing::ElementsAre("a.jpg", "b.jpg"));
}

TEST(Enhance, ReadsAndWritesStandardStreams) {
  const Bytes file = smallJpeg();
  const Finished run = quenby({"enhance", "-", "-o", "-", "--no-mark"}, file);
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  const Bytes expected = enhancedDirectly(file, "AE0", "slider=0.4;");
  EXPECT_TRUE(run.output == std::string(expected.begin(), expected.end()));
}

TEST(Enhance, TurnsThePictureOnRequest) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", jpegOf(photoLikePicture(64, 40, 2)));
  EXPECT_EQ(quenby({"enhance", in, "-o", folder / "b.jpg", "--rotate", "-90"}).exitCode, 0);
  const Image<RGBA8Pixel> turned = decoded(folder.read("b.jpg"));
  EXPECT_EQ(turned.width, 40u);
  EXPECT_EQ(turned.height, 64u);
}

TEST(Enhance, GivesTheSameFilesHoweverManyAtOnce) {
  const TemporaryFolder folder;
  for (int i = 0; i < 6; ++i) {
    folder.write("in/" + std::to_string(i) + ".jpg", jpegOf(photoLikePicture(90 + i, 60, i + 1)));
  }
  folder.write("in/3b.jpg", std::string("not a photo"));
  folder.makeFolder("one");
  folder.makeFolder("two");
  Finished runs[2];
  for (int jobs = 1; jobs <= 2; ++jobs) {
    runs[jobs - 1] =
        quenby({"enhance", "-r", folder / "in", "-o", folder / (jobs == 1 ? "one" : "two"), "-j",
                std::to_string(jobs), "--name", "{stem}.jpg", "--no-mark"});
  }
  EXPECT_EQ(runs[0].exitCode, 1);
  EXPECT_EQ(runs[1].exitCode, 1);
  EXPECT_EQ(runs[0].errors, runs[1].errors);
  for (int i = 0; i < 6; ++i) {
    const std::string name = std::to_string(i) + ".jpg";
    EXPECT_EQ(folder.read("one/" + name), folder.read("two/" + name));
    EXPECT_EQ(folder.read("one/" + name),
              enhancedDirectly(folder.read("in/" + name), "AE0", "slider=0.4;"));
  }
  EXPECT_FALSE(folder.has("one/3b.jpg"));
}

TEST(Enhance, GivesTheSameFileHoweverManyThreads) {
  const TemporaryFolder folder;
  const Bytes photo = jpegOf(photoLikePicture(300, 200, 4));
  const std::string in = folder.write("in.jpg", photo), out = folder / "out.jpg";
  const Bytes expected = enhancedDirectly(photo, "AE0", "slider=0.4;");
  for (const char* threads : {"0", "1", "2", "5"}) {
    const Finished run =
        quenby({"enhance", in, "-o", out, "--overwrite", "--threads", threads, "--no-mark"});
    ASSERT_EQ(run.exitCode, 0) << run.errors;
    EXPECT_EQ(folder.read("out.jpg"), expected) << threads;
  }
  EXPECT_EQ(quenby({"enhance", in, "-o", out, "--overwrite", "--threads", "-1"}).exitCode, 2);
}

// 8 megapixels are 31 MiB decoded; the command itself takes some 50 of addresses.
TEST(Enhance, DecodesAgainWhatDoesNotFitIntoMemory) {
  if (std::getenv("QUENBY_COMMAND") != nullptr) {
    GTEST_SKIP()
        << "another command may be a sanitizer's, which takes more addresses than there are";
  }
  const TemporaryFolder folder;
  const Image<RGBA8Pixel> some = photoLikePicture(2000, 50, 3), whole(2000, 4000);
  for (std::uint32_t y = 0; y < whole.height; ++y)
    std::copy_n(some.row(y % some.height), whole.width, whole.row(y));
  const std::string in = folder.write("in.jpg", jpegOf(whole)), out = folder / "out.jpg";
  ASSERT_EQ(quenby({"enhance", in, "-o", out}).exitCode, 0);
  const Bytes expected = folder.read("out.jpg");

  const std::string command =
      "ulimit -v 73728; \"$QUENBY\" enhance '" + in + "' -o '" + out + "' --overwrite --memory ";
  const Finished kept = shell(command + "128");
  EXPECT_EQ(kept.exitCode, 1);
  EXPECT_NE(kept.errors.find("memory"), std::string::npos) << kept.errors;
  EXPECT_EQ(folder.read("out.jpg"), expected);
  folder.write("out.jpg", std::string("older"));
  const Finished again = shell(command + "0");
  EXPECT_EQ(again.exitCode, 0) << again.errors;
  EXPECT_EQ(folder.read("out.jpg"), expected);

  // Nor do verbs hold it that look at photos.
  for (const std::string verb :
       {"info", "score", "keypoints", "sheet --memory 0 --sliders 0.4 -o sheet.jpg"}) {
    const std::string call = "\"$QUENBY\" " + verb + " in.jpg; ";
    const Finished unlimited = shell("cd '" + (folder / "") + "'; " + call);
    const Finished limited =
        shell("cd '" + (folder / "") + "'; rm -f sheet.jpg; ulimit -v 73728; " + call);
    EXPECT_EQ(limited.exitCode, 0) << verb << limited.errors;
    EXPECT_EQ(limited.output, unlimited.output) << verb;
  }
}

TEST(Enhance, ReportsAsJson) {
  const TemporaryFolder folder;
  const std::string good = folder.write("a.jpg", smallJpeg());
  const std::string bad = folder.write("b.jpg", std::string("x"));
  const std::string out = folder.makeFolder("out");
  const Finished run = quenby({"enhance", good, bad, "-o", out, "--json"});
  EXPECT_EQ(run.exitCode, 1);
  const nlohmann::json report = parsedJson(run.output);
  ASSERT_EQ(report.size(), 2u);
  EXPECT_EQ(report[0]["input"], good);
  EXPECT_EQ(report[0]["output"], out + "/a_AE0.jpg");
  EXPECT_EQ(report[0]["status"], "done");
  EXPECT_EQ(report[0]["params"], "slider=0.4;");
  EXPECT_EQ(report[0]["width"], 48);
  EXPECT_EQ(report[1]["status"], "failed");
  EXPECT_THAT(report[1]["error"].get<std::string>(), testing::Not(IsEmpty()));
}

TEST(Enhance, ReportsAsOneJsonObjectForOneFileAndALineEachWithJsonl) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  const Finished one = quenby({"enhance", in, "-o", folder / "b.jpg", "--json"});
  EXPECT_EQ(parsedJson(one.output)["status"], "done");
  const std::string out = folder.makeFolder("out");
  folder.write("in/a.jpg", smallJpeg());
  folder.write("in/b.jpg", smallJpeg());
  const Finished lines = quenby({"enhance", "-r", folder / "in", "-o", out, "--jsonl"});
  const std::size_t end = lines.output.find('\n');
  EXPECT_EQ(parsedJson(lines.output.substr(0, end))["input"], folder / "in/a.jpg");
  EXPECT_EQ(parsedJson(lines.output.substr(end))["input"], folder / "in/b.jpg");
}

TEST(Enhance, WarnsOfParametersThatReadOtherwiseThanTheyLook) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  const Finished run = quenby(
      {"enhance", in, "-o", folder / "b.jpg", "--params", "slider=0.4;gtmOnly=1;", "--no-mark"});
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_THAT(run.errors,
              HasSubstr("note: --params: gtmOnly of AE0 wants true or false; '1' counts as false"));
  EXPECT_EQ(folder.read("b.jpg"), enhancedDirectly(folder.read("a.jpg"), "AE0", "slider=0.4;"));
}

TEST(Enhance, FailsForAFaceBesideThePictureAndGoesOnWithTheOthers) {
  const TemporaryFolder folder;
  const std::string small = folder.write("small.jpg", jpegOf(photoLikePicture(60, 45, 1)));
  const std::string large = folder.write("large.jpg", jpegOf(photoLikePicture(120, 90, 1)));
  const std::string out = folder.makeFolder("out");
  const Finished run = quenby({"enhance", small, large, "-o", out, "--face", "70,10,110,50", "-q"});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_EQ(run.errors,
            "quenby enhance: " + small + ": the face 70,10,110,50 lies outside the picture\n");
  EXPECT_FALSE(folder.has("out/small_AE0.jpg"));
  EXPECT_TRUE(folder.has("out/large_AE0.jpg"));
}

}  // namespace
}  // namespace pelorin::test_support

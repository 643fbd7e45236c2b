#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "image_processing/dupe/cdf_distance.h"
#include "image_processing/dupe/dupe_score.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/cli/verbs/dupes/photo_library_files.h"
#include "tests/support/bytes.h"
#include "tests/support/green_cdf.h"

namespace pelorin::test_support {
namespace {

using image_processing::dupeScoreOfCDFs;
using image_processing::exposureInvariantCDFDistance;
using image_processing::GreenCDF;
using image_processing::matchCDFDomain;
using Json = nlohmann::json;
using testing::HasSubstr;

Json compare(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), "compare");
  arguments.push_back("--json");
  const Finished run = quenby(arguments);
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  return parsedJson(run.output);
}

TEST(SceneShots, DifferBetweenScenesAndHardlyWithinOne) {
  for (int scene = 0; scene < 4; ++scene) {
    for (int other = 0; other < 4; ++other) {
      for (const int exposure : {60, 80, 90, 100}) {
        const float distance = exposureInvariantCDFDistance(cdfOf(sceneShot(scene, 100)),
                                                            cdfOf(sceneShot(other, exposure)));
        if (scene == other) {
          EXPECT_LT(distance, 0.2f) << scene << ' ' << exposure;
        } else {
          EXPECT_GT(distance, 0.6f) << scene << ' ' << other << ' ' << exposure;
        }
      }
    }
  }
}

TEST(CompareCommand, TellsTheEnginesNumbersToTheLastBit) {
  const TemporaryFolder folder;
  const Image<RGBA8Pixel> a = sceneShot(1, 100, 64, 48), b = sceneShot(1, 55, 30, 40);
  const std::vector<std::string> files = {folder.write("a", rawBytes(a)),
                                          folder.write("b", rawBytes(b)),
                                          "--raw",
                                          "64x48",
                                          "--raw2",
                                          "30x40"};
  const Json plain = compare(files);
  EXPECT_EQ(plain["score"].get<float>(), dupeScoreOfCDFs(cdfOf(a), cdfOf(b), 0.0f, true));
  EXPECT_EQ(plain["distance"].get<float>(), exposureInvariantCDFDistance(cdfOf(a), cdfOf(b)));
  EXPECT_EQ(plain["gainAB"].get<float>(), matchCDFDomain(cdfOf(a), cdfOf(b)));
  EXPECT_EQ(plain["gainBA"].get<float>(), matchCDFDomain(cdfOf(b), cdfOf(a)));
  EXPECT_EQ(plain["timeSource"], "unknown");

  std::vector<std::string> given = files;
  given.insert(given.end(), {"--dt", "-12.5", "--same-orientation", "no"});
  const Json told = compare(given);
  EXPECT_EQ(told["score"].get<float>(), dupeScoreOfCDFs(cdfOf(a), cdfOf(b), 12.5f, false));
  EXPECT_EQ(told["timeDifference"], 12.5);
  EXPECT_EQ(told["timeSource"], "given");
  EXPECT_EQ(told["sameOrientation"], false);
}

TEST(CompareCommand, PrintsNineSignificantDigits) {
  const TemporaryFolder folder;
  const Image<RGBA8Pixel> a = sceneShot(1, 100, 64, 48), b = sceneShot(2, 80, 64, 48);
  const Finished run = quenby({"compare", folder.write("a", rawBytes(a)),
                               folder.write("b", rawBytes(b)), "--raw", "64x48", "--dt", "3"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  const float score = dupeScoreOfCDFs(cdfOf(a), cdfOf(b), 3.0f, true);
  EXPECT_THAT(run.output, HasSubstr(fmt::format("score        {:.9g}\n", score)));
  EXPECT_THAT(run.output, HasSubstr("time apart   3 s (given)\n"));
}

TEST(CompareCommand, TakesTimesAndOrientationsFromThePhotos) {
  const TemporaryFolder folder;
  const std::string a =
      folder.write("a.jpg", sceneJpeg(1, 100, takenAt("10:00:00", "75", "+01:00")));
  const std::string b =
      folder.write("b.jpg", sceneJpeg(1, 90, takenAt("09:00:02", "25", "+00:00", 8)));
  const std::string untimed = folder.write("c.jpg", sceneJpeg(1, 90, {}));
  const Json pair = compare({a, b});
  EXPECT_EQ(pair["timeDifference"], 1.5);
  EXPECT_EQ(pair["timeSource"], "camera");
  EXPECT_EQ(pair["sameOrientation"], false);
  EXPECT_EQ(compare({a, b, "--same-orientation", "yes"})["sameOrientation"], true);
  const Json unknown = compare({a, untimed});
  EXPECT_EQ(unknown["timesKnown"], false);
  EXPECT_EQ(unknown["sameOrientation"], true);
  EXPECT_THAT(quenby({"compare", a, untimed}).output, HasSubstr("not known, taken as 0"));
}

TEST(CompareCommand, ScoresThePhotoItselfNearTheTop) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", sceneJpeg(3, 100, takenAt("10:00:00")));
  EXPECT_NEAR(compare({a, a})["score"].get<double>(), 3.66, 0.05);
}

TEST(CompareCommand, TakesOnePhotoFromStandardInput) {
  const TemporaryFolder folder;
  const Bytes photo = sceneJpeg(3, 100, {});
  EXPECT_EQ(quenby({"compare", folder.write("a.jpg", photo), "-"}, photo).exitCode, 0);
  EXPECT_EQ(quenby({"compare", "-", "-"}, photo).exitCode, 2);
}

TEST(CompareCommand, NamesTheFileThatCannotBeRead) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", sceneJpeg(3, 100, {}));
  const Finished missing = quenby({"compare", a, folder / "none.jpg"});
  EXPECT_EQ(missing.exitCode, 1);
  EXPECT_THAT(missing.errors, HasSubstr("none.jpg: "));
  const Finished size = quenby({"compare", a, a, "--raw", "10x10"});
  EXPECT_EQ(size.exitCode, 1);
  EXPECT_THAT(size.errors, HasSubstr("a.jpg: "));
}

TEST(CompareCommand, RefusesWhatCannotBeMeant) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", sceneJpeg(3, 100, {}));
  for (const std::vector<std::string>& arguments :
       std::vector<std::vector<std::string>>{{a},
                                             {a, a, a},
                                             {a, a, "--dt", "soon"},
                                             {a, a, "--dt", "nan"},
                                             {a, a, "--same-orientation", "maybe"},
                                             {a, a, "--raw", "10"},
                                             {a, a, "--raw2", "0x3"},
                                             {a, a, "--raw", "4x4", "--scale", "2"}}) {
    std::vector<std::string> command = arguments;
    command.insert(command.begin(), "compare");
    const Finished run = quenby(command);
    EXPECT_EQ(run.exitCode, 2) << arguments.back();
    EXPECT_THAT(run.errors, HasSubstr("quenby compare: ")) << arguments.back();
  }
}

}  // namespace
}  // namespace pelorin::test_support

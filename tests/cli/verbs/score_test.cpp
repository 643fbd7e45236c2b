#include <gmock/gmock.h>

#include <cstdio>

#include "cli/frame/number_text.h"
#include "image_processing/quality/niqe.h"
#include "photo/photo.h"
#include "photo/turned_image.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/bytes.h"
#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::analyzeNiqe;
using image_processing::NiqeAnalysis;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;
using testing::UnorderedElementsAre;

std::string nineDigitText(float value) {
  char text[32];
  std::snprintf(text, sizeof(text), "%.9g", static_cast<double>(value));
  return text;
}

nlohmann::json parsed(const Finished& run) {
  return parsedJson(run.output);
}

long linesIn(const std::string& text) {
  return std::count(text.begin(), text.end(), '\n');
}

class Score : public testing::Test {
 protected:
  const TemporaryFolder folder;
  const Image<RGBA8Pixel> picture = photoLikePicture(300, 210, 5);
  const NiqeAnalysis expected = analyzeNiqe(picture);
  const std::string raw = folder.write("in.rgba", rawBytes(picture));
  const std::string good = folder.write("good.jpg", jpegOf(photoLikePicture(200, 100, 1)));
  const std::string small = folder.write("small.jpg", jpegOf(photoLikePicture(200, 95, 2)));
  const std::string bad = folder.write("bad.jpg", std::string("x"));
};

TEST_F(Score, IsTheEnginesToNineDigits) {
  const Finished run = quenby({"score", "--json", "--features", "--raw", "300x210", raw});
  ASSERT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_THAT(run.errors, IsEmpty());
  const nlohmann::json score = parsed(run);
  EXPECT_EQ(score["file"], raw);
  EXPECT_EQ(score["width"], 300);
  EXPECT_EQ(score["height"], 210);
  EXPECT_EQ(score["score"].get<double>(), cli::nineDigits(expected.score));
  EXPECT_EQ(score["blocks"], 6);
  EXPECT_EQ(score["blockColumns"], 3);
  EXPECT_EQ(score["blockRows"], 2);
  EXPECT_EQ(score["model"], image_processing::niqeModelId);
  std::vector<double> means;
  for (const float mean : expected.meanFeatures) means.push_back(cli::nineDigits(mean));
  ASSERT_EQ(means.size(), 36u);
  EXPECT_EQ(score["features"].get<std::vector<double>>(), means);
}

TEST_F(Score, PrintsTheFeaturesOneALineToNineDigits) {
  std::string lines;
  for (const float mean : expected.meanFeatures) lines += nineDigitText(mean) + "\n";
  const Finished one = quenby({"score", "--features", "--raw", "300x210", raw});
  EXPECT_EQ(one.output, lines);
  const Finished two = quenby({"score", "--features", "--raw", "300x210", raw, raw});
  EXPECT_EQ(two.output, "# " + raw + "\n" + lines + "# " + raw + "\n" + lines);
}

TEST_F(Score, IsATableForAPerson) {
  const Finished run = quenby({"score", "--raw", "300x210", raw});
  EXPECT_EQ(linesIn(run.output), 2);
  char score[32];
  std::snprintf(score, sizeof(score), "%.4f", static_cast<double>(expected.score));
  EXPECT_THAT(run.output, HasSubstr(std::string("  ") + score + "       6  niqe-pristine-1  "));
  EXPECT_THAT(run.output, testing::EndsWith("  " + raw + "\n"));
}

TEST_F(Score, IsARowOfCommaSeparatedValues) {
  const Finished run = quenby({"score", "--csv", "--raw", "300x210", raw});
  EXPECT_EQ(run.output, "file,width,height,score,blocks,model,error\n" + raw + ",300,210," +
                            nineDigitText(expected.score) + ",6,niqe-pristine-1,\n");
  std::string head = "file,width,height,score,blocks,model,error";
  std::string row = raw + ",300,210," + nineDigitText(expected.score) + ",6,niqe-pristine-1,";
  for (int i = 0; i < 36; ++i) {
    head += ",feature" + std::to_string(i);
    row.append(",").append(nineDigitText(expected.meanFeatures[static_cast<std::size_t>(i)]));
  }
  EXPECT_EQ(quenby({"score", "--csv", "--features", "--raw", "300x210", raw}).output,
            head + "\n" + row + "\n");
}

TEST_F(Score, HasARowForWhatFailed) {
  const std::string none = folder / "none.jpg";
  const std::string row = none + ",,,,,,No such file or directory; check the path";
  EXPECT_THAT(quenby({"score", "--csv", none, good}).output, HasSubstr("\n" + row + "\n"));
  EXPECT_THAT(quenby({"score", "--csv", "--features", none, good}).output,
              HasSubstr("\n" + row + std::string(36, ',') + "\n"));
}

TEST_F(Score, QuotesOddFileNamesInCsv) {
  const std::string odd = folder.write("a, \"b\".rgba", rawBytes(picture));
  const Finished run = quenby({"score", "--csv", "--raw", "300x210", odd});
  EXPECT_THAT(run.output, HasSubstr("\n\"" + (folder / "a, \"\"b\"\".rgba") + "\",300,210,"));
}

TEST_F(Score, OfATooSmallPictureIsOneClearLineAndNoNumber) {
  const Finished table = quenby({"score", small, good});
  EXPECT_EQ(table.exitCode, 0);
  EXPECT_EQ(table.errors, "quenby score: " + small +
                              ": is 200 x 95 pixels, too small: a score needs 96 x 96 or more\n");
  EXPECT_THAT(table.output, HasSubstr("too small       0  niqe-pristine-1  " + small + "\n"));
  EXPECT_THAT(table.output, HasSubstr("       2  niqe-pristine-1  " + good + "\n"));

  const nlohmann::json json = parsed(quenby({"score", "--json", "--features", small, good}));
  EXPECT_TRUE(json[0].contains("score"));
  EXPECT_TRUE(json[0]["score"].is_null());
  EXPECT_TRUE(json[0]["features"].is_null());
  EXPECT_EQ(json[0]["blocks"], 0);
  EXPECT_TRUE(json[1]["score"].is_number());

  EXPECT_THAT(quenby({"score", "--csv", small, good}).output,
              HasSubstr(small + ",200,95,,0,niqe-pristine-1,\n"));
  EXPECT_THAT(quenby({"score", "--csv", "--features", small, good}).output,
              HasSubstr(small + ",200,95,,0,niqe-pristine-1" + std::string(37, ',') + "\n"));
  EXPECT_EQ(quenby({"score", "--features", small}).output, "");
}

TEST_F(Score, ThatNoPhotoHasIsNothingDone) {
  EXPECT_EQ(quenby({"score", small}).exitCode, 3);
  EXPECT_EQ(quenby({"score", small, "--fail-above", "1"}).exitCode, 3);
  EXPECT_EQ(quenby({"score", "-r", folder.makeFolder("empty")}).exitCode, 3);
}

TEST_F(Score, AboveTheLimitGivesExitCodeFour) {
  const std::string score = nineDigitText(expected.score);
  const std::string below = nineDigitText(std::nextafter(expected.score, 0.0f));
  const auto withLimit = [&](const std::string& limit) {
    return quenby({"score", "--raw", "300x210", raw, "--fail-above", limit});
  };
  EXPECT_EQ(withLimit(score).exitCode, 0);
  EXPECT_EQ(withLimit("1e9").exitCode, 0);
  const Finished above = withLimit(below);
  EXPECT_EQ(above.exitCode, 4);
  EXPECT_EQ(above.errors, "quenby score: " + raw + ": scores " + score + ", above " + below + "\n");
  EXPECT_EQ(withLimit("-1").exitCode, 4);
}

TEST_F(Score, OfAFailedFileComesBeforeTheLimit) {
  EXPECT_EQ(quenby({"score", good, bad, "--fail-above", "0"}).exitCode, 1);
  EXPECT_EQ(quenby({"score", good, small, "--fail-above", "0"}).exitCode, 4);
}

TEST_F(Score, OfABadFileIsNoObstacleToTheOthers) {
  const std::string missing = folder / "missing.jpg";
  const Finished run = quenby({"score", "--json", bad, good, missing});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_EQ(linesIn(run.errors), 2);
  const nlohmann::json scores = parsed(run);
  ASSERT_EQ(scores.size(), 3u);
  EXPECT_TRUE(scores[0].contains("error"));
  EXPECT_TRUE(scores[1]["score"].is_number());
  EXPECT_TRUE(scores[2].contains("error"));
}

TEST_F(Score, IsThatOfTheUprightFullSizePicture) {
  const Bytes exif = exifPayload({6, "", "", ""}, false);
  const Bytes file = jpegOf(picture, {{0xE1, exif}});
  const Image<RGBA8Pixel> stored = decoded(file);
  const Image<RGBA8Pixel> upright(stored.height, stored.width);
  photo::turnRows(stored.row(0), 0, stored.height, {stored.width, stored.height},
                  photo::uprightTurn(6), upright);
  const Finished run = quenby({"score", "--json", "-"}, file);
  ASSERT_EQ(run.exitCode, 0) << run.errors;
  const nlohmann::json score = parsed(run);
  EXPECT_EQ(score["width"], 210);
  EXPECT_EQ(score["score"].get<double>(), cli::nineDigits(analyzeNiqe(upright).score));
  EXPECT_NE(score["score"].get<double>(), cli::nineDigits(analyzeNiqe(stored).score));
}

TEST_F(Score, ComesInTheOrderOfTheFilesHoweverManyAtOnce) {
  for (int i = 0; i < 6; ++i) {
    const auto side = static_cast<std::uint32_t>(500 - 70 * i);
    folder.write("in/" + std::to_string(i) + ".jpg", jpegOf(photoLikePicture(side, side, 3)));
  }
  const Finished one = quenby({"score", "--jsonl", "-r", folder / "in"});
  const Finished four = quenby({"score", "--jsonl", "-r", folder / "in", "-j", "4"});
  EXPECT_EQ(one.exitCode, 0) << one.errors;
  EXPECT_EQ(linesIn(one.output), 6);
  EXPECT_EQ(one.output, four.output);
}

TEST_F(Score, ShowsItsBlocksAsAHeatMap) {
  // Of two blocks, the noisy one is the less natural.
  auto photo = photoLikePicture(192, 96, 4);
  const auto noise = noisePicture(96, 96, 1);
  for (std::uint32_t y = 0; y < 96; ++y) std::copy_n(noise.row(y), 96, photo.row(y));
  const auto distances = analyzeNiqe(photo).blockDistances;
  ASSERT_GT(distances[0], distances[1] + 1);

  const std::string map = folder / "heat.png";
  const Finished run = quenby({"score", "--raw", "192x96", "-", "--map", map}, rawBytes(photo));
  ASSERT_EQ(run.exitCode, 0) << run.errors;
  const Image<RGBA8Pixel> shown = *photo::open(folder.read("heat.png")).image;
  const auto warmth = [&](std::uint32_t from, std::uint32_t to) {
    double sum = 0;
    for (std::uint32_t y = shown.height / 3; y < shown.height / 2; ++y) {
      for (std::uint32_t x = from; x < to; ++x) sum += shown.row(y)[x].r - shown.row(y)[x].b;
    }
    return sum;
  };
  EXPECT_GT(warmth(shown.width / 8, shown.width * 3 / 8), 0);
  EXPECT_LT(warmth(shown.width * 5 / 8, shown.width * 7 / 8), 0);
}

TEST_F(Score, PutsHeatMapsIntoAFolder) {
  const TemporaryFolder photos;
  photos.write("a.jpg", jpegOf(photoLikePicture(100, 100, 1)));
  photos.write("deep/a.jpg", jpegOf(photoLikePicture(100, 100, 2)));
  photos.write("tiny/b.jpg", jpegOf(photoLikePicture(90, 100, 2)));
  const TemporaryFolder maps;
  EXPECT_EQ(quenby({"score", "-r", photos.path(), "--map", maps.path()}).exitCode, 0);
  EXPECT_THAT(maps.content(), UnorderedElementsAre("a_niqe.png", "deep/", "deep/a_niqe.png"));
  EXPECT_EQ(
      quenby({"score", "-r", photos.path(), "--map", maps.path(), "--name", "{stem}.png"}).exitCode,
      0);
  EXPECT_TRUE(maps.has("deep/a.png"));
}

TEST_F(Score, ReplacesAHeatMapOnlyWhenAsked) {
  const std::string map = folder.write("heat.png", std::string("old"));
  const Finished kept = quenby({"score", good, "--map", map});
  EXPECT_EQ(kept.exitCode, 0);
  EXPECT_THAT(kept.errors, HasSubstr("1 of 1 maps there already; --overwrite replaces them"));
  EXPECT_THAT(kept.output, HasSubstr(good));
  EXPECT_EQ(folder.read("heat.png").size(), 3u);
  EXPECT_EQ(quenby({"score", good, "--map", map, "--overwrite"}).exitCode, 0);
  EXPECT_GT(photo::open(folder.read("heat.png")).image->width, 0u);
}

TEST_F(Score, RefusesWhatItCannotMean) {
  const std::vector<std::vector<std::string>> usages = {
      {"--fail-above", "nan"},
      {"--fail-above", "x"},
      {"--csv", "--json"},
      {"--json", "--jsonl"},
      {"--map", ""},
      {"--map", "-"},
      {"--map", folder / "none/heat.png"},
      {"--map", folder / "heat.png", good},
      {"--name", "{stem}.png"},
      {"--overwrite"},
      {"--raw", "300"},
      {folder.path()},
  };
  for (std::vector<std::string> arguments : usages) {
    arguments.insert(arguments.begin(), {"score", good});
    const Finished run = quenby(arguments);
    EXPECT_EQ(run.exitCode, 2) << arguments[2];
    EXPECT_THAT(run.output, IsEmpty()) << arguments[2];
    EXPECT_EQ(linesIn(run.errors), 1) << run.errors;
  }
  EXPECT_EQ(quenby({"score"}).exitCode, 2);
  EXPECT_FALSE(folder.has("heat.png"));
}

TEST_F(Score, TellsItsExitCodesInTheHelp) {
  const Finished help = quenby({"score", "--help"});
  EXPECT_EQ(help.exitCode, 0);
  EXPECT_THAT(help.output, HasSubstr("--fail-above X"));
  EXPECT_THAT(help.output, HasSubstr("4: every file was scored"));
  EXPECT_THAT(help.output, HasSubstr("change when a picture is scaled"));
}

}  // namespace
}  // namespace pelorin::test_support

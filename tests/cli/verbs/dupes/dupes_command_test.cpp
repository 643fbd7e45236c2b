#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sqlite3.h>

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <thread>

#include "image_processing/dupe/dupe_score.h"
#include "photo/collection/photo_record.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/cli/verbs/dupes/photo_library_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::dupeScoreOfCDFs;
using image_processing::GreenCDF;
using Json = nlohmann::json;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::UnorderedElementsAre;
namespace fs = std::filesystem;

// A holiday: a burst, the same view two hours later, another view within the burst, two cameras in
// two time zones, one scene held both ways, and photos without any time.
class Holiday {
 public:
  Holiday() {
    folder.write("burst/1.jpg", sceneJpeg(1, 100, takenAt("10:00:00")));
    folder.write("burst/2.jpg", sceneJpeg(1, 80, takenAt("10:00:00", "5")));
    folder.write("burst/3.jpg", sceneJpeg(1, 60, takenAt("10:00:02")));
    folder.write("later.jpg", sceneJpeg(1, 100, takenAt("12:00:00")));
    folder.write("other.jpg", sceneJpeg(2, 100, takenAt("10:00:01")));
    folder.write("zones/a.jpg", sceneJpeg(2, 100, takenAt("15:00:00", "25", "+02:00")));
    folder.write("zones/b.jpg", sceneJpeg(2, 90, takenAt("13:00:01", "25", "+00:00")));
    folder.write("held/upright.jpg", sceneJpeg(3, 100, takenAt("17:00:00", "", "", 1)));
    folder.write("held/turned.jpg", sceneJpeg(3, 100, takenAt("17:00:03", "", "", 6)));
    folder.write("held/late.jpg", sceneJpeg(3, 100, takenAt("17:00:20", "", "", 6)));
    folder.write("untimed/a.jpg", sceneJpeg(0, 100, {}));
    folder.write("untimed/b.jpg", sceneJpeg(0, 100, {}));
  }

  // Shots of these scenes differ more than those of real ones.
  Finished dupes(std::vector<std::string> arguments) const {
    if (!std::count(arguments.begin(), arguments.end(), "--threshold")) {
      arguments.insert(arguments.end(), {"--threshold", "0"});
    }
    arguments.insert(arguments.begin(), {"dupes", "-r", folder.path()});
    return quenby(arguments);
  }
  Json json(std::vector<std::string> arguments = {}, int exitCode = 0) const {
    arguments.insert(arguments.end(), {"--json", "--pairs"});
    const Finished run = dupes(arguments);
    EXPECT_EQ(run.exitCode, exitCode) << run.errors;
    return parsedJson(run.output);
  }

  TemporaryFolder folder;
};

std::string nameIn(const Holiday& holiday, const Json& file) {
  return fs::path(file.get<std::string>()).lexically_relative(holiday.folder.path()).string();
}

std::vector<std::vector<std::string>> groupsOf(const Holiday& holiday, const Json& report) {
  std::vector<std::vector<std::string>> groups;
  for (const Json& group : report["groups"]) {
    groups.emplace_back();
    for (const Json& photo : group["photos"]) {
      groups.back().push_back(nameIn(holiday, photo["file"]));
    }
  }
  return groups;
}

Json pairOf(const Holiday& holiday, const Json& report, const std::string& a,
            const std::string& b) {
  for (const Json& group : report["groups"]) {
    for (const Json& pair : group["pairs"]) {
      if (nameIn(holiday, pair["a"]) == a && nameIn(holiday, pair["b"]) == b) return pair;
    }
  }
  return nullptr;
}

Json rankingOf(const Holiday& holiday, const Json& report, const std::string& name) {
  for (const Json& group : report["groups"]) {
    for (const Json& ranked : group["ranking"]) {
      if (nameIn(holiday, ranked["file"]) == name) return group["ranking"];
    }
  }
  return nullptr;
}

Image<RGBA8Pixel> copyOf(const Image<RGBA8Pixel>& picture) {
  Image<RGBA8Pixel> copy(picture.width, picture.height);
  std::copy_n(picture.row(0), std::size_t{picture.width} * picture.height, copy.row(0));
  return copy;
}

// The mean of 5 x 5 pixels where they are there.
Image<RGBA8Pixel> blurred(const Image<RGBA8Pixel>& picture) {
  Image<RGBA8Pixel> result = copyOf(picture);
  for (std::uint32_t y = 2; y + 2 < picture.height; ++y) {
    for (std::uint32_t x = 2; x + 2 < picture.width; ++x) {
      int r = 0, g = 0, b = 0;
      for (std::uint32_t i = 0; i < 25; ++i) {
        const RGBA8Pixel& p = picture.row(y + i / 5 - 2)[x + i % 5 - 2];
        r += p.r;
        g += p.g;
        b += p.b;
      }
      const auto mean = [](int sum) { return static_cast<std::uint8_t>(sum / 25); };
      result.row(y)[x] = {mean(r), mean(g), mean(b), 255};
    }
  }
  return result;
}

Image<RGBA8Pixel> noisy(const Image<RGBA8Pixel>& picture) {
  Image<RGBA8Pixel> result = copyOf(picture);
  Random random(5);
  const auto disturb = [&](std::uint8_t& value) {
    const int sum = value + static_cast<int>(random.below(61)) - 30;
    value = static_cast<std::uint8_t>(std::clamp(sum, 0, 255));
  };
  for (std::uint32_t y = 0; y < result.height; ++y) {
    for (std::uint32_t x = 0; x < result.width; ++x) {
      RGBA8Pixel& p = result.row(y)[x];
      disturb(p.r);
      disturb(p.g);
      disturb(p.b);
    }
  }
  return result;
}

// Bytes that are no photo, under the size and time of the file that was there.
void replaceUnnoticed(const std::string& path) {
  const auto modified = fs::last_write_time(path);
  const std::string rubbish(fs::file_size(path), 'x');
  std::ofstream(path, std::ios::binary) << rubbish;
  fs::last_write_time(path, modified);
}

int rowsIn(const std::string& cache, const std::string& table = "photos") {
  sqlite3* database = nullptr;
  sqlite3_stmt* statement = nullptr;
  int rows = 0;
  if (sqlite3_open_v2(cache.c_str(), &database, SQLITE_OPEN_READONLY, nullptr) == SQLITE_OK &&
      sqlite3_prepare_v2(database, ("SELECT count(*) FROM " + table).c_str(), -1, &statement,
                         nullptr) == SQLITE_OK &&
      sqlite3_step(statement) == SQLITE_ROW) {
    rows = sqlite3_column_int(statement, 0);
  }
  sqlite3_finalize(statement);
  sqlite3_close(database);
  return rows;
}

TEST(DupesCommand, FindsWhatWasTakenAMomentApart) {
  const Holiday holiday;
  const Json report = holiday.json();
  EXPECT_EQ(report["photos"], 12);
  EXPECT_THAT(report["failed"], IsEmpty());
  EXPECT_THAT(groupsOf(holiday, report),
              UnorderedElementsAre(ElementsAre("burst/1.jpg", "burst/2.jpg", "burst/3.jpg"),
                                   ElementsAre("held/late.jpg", "held/turned.jpg"),
                                   ElementsAre("zones/a.jpg", "zones/b.jpg")));
}

TEST(DupesCommand, TellsTimeDistanceAndOrientationOfEachPair) {
  const Holiday holiday;
  const Json report = holiday.json();
  EXPECT_EQ(pairOf(holiday, report, "burst/1.jpg", "burst/2.jpg")["timeDifference"], 0.5);
  EXPECT_EQ(pairOf(holiday, report, "zones/a.jpg", "zones/b.jpg")["timeDifference"], 1.0);
  const Json late = pairOf(holiday, report, "held/late.jpg", "held/turned.jpg");
  EXPECT_EQ(late["timeDifference"], 17.0);
  EXPECT_EQ(late["sameOrientation"], true);
  // Of three photos of which two are no pair, the two that are most alike are a group.
  EXPECT_EQ(pairOf(holiday, report, "held/turned.jpg", "held/upright.jpg"), nullptr);
  fs::remove(holiday.folder / "held/late.jpg");
  const Json turned = pairOf(holiday, holiday.json(), "held/turned.jpg", "held/upright.jpg");
  EXPECT_EQ(turned["timeDifference"], 3.0);
  EXPECT_EQ(turned["sameOrientation"], false);
  EXPECT_EQ(turned["timesKnown"], true);
}

TEST(DupesCommand, ScoresAsTheEngineDoes) {
  const Holiday holiday;
  const Json pair = pairOf(holiday, holiday.json({"--scale", "2"}), "burst/1.jpg", "burst/3.jpg");
  std::vector<GreenCDF> cdfs;
  for (const char* name : {"burst/1.jpg", "burst/3.jpg"}) {
    const photo::DecodedPicture decoded = photo::decodeJpeg(holiday.folder.read(name), 2);
    Image<RGBA8Pixel> picture(decoded.width, decoded.height);
    std::copy_n(decoded.pixels.get(), picture.byteSize(),
                reinterpret_cast<std::uint8_t*>(picture.data.get()));
    computeGreenCDF(picture, cdfs.emplace_back());
  }
  EXPECT_EQ(pair["score"].get<float>(), dupeScoreOfCDFs(cdfs[0], cdfs[1], 2.0f, true));
}

TEST(DupesCommand, TellsApartWhatLooksAlikeAtATimeNotKnown) {
  const Holiday holiday;
  EXPECT_EQ(pairOf(holiday, holiday.json(), "untimed/a.jpg", "untimed/b.jpg"), nullptr);
  EXPECT_THAT(holiday.dupes({}).errors, HasSubstr("2 of 12 photos tell no time and were left out"));
  const Json report = holiday.json({"--unknown-times", "--keep", "best"});
  EXPECT_EQ(report["groups"], holiday.json({"--keep", "best"})["groups"]);
  ASSERT_EQ(report["lookAlikes"].size(), 1u);
  const Json alike = report["lookAlikes"][0];
  EXPECT_EQ(alike["timeUnknown"], true);
  EXPECT_FALSE(alike.contains("ranking"));
  EXPECT_EQ(nameIn(holiday, alike["photos"][1]["file"]), "untimed/b.jpg");
  EXPECT_EQ(alike["pairs"][0]["timesKnown"], false);
  EXPECT_EQ(alike["pairs"][0]["timeDifference"], 0.0);
  EXPECT_THAT(
      holiday.dupes({"--unknown-times", "--pairs"}).output,
      AllOf(HasSubstr("look alike, time unknown"), HasSubstr("time apart not known, taken as 0")));
}

// Nothing but their times tells such photos from each other's doubles.
TEST(DupesCommand, SuggestsNoPhotoForRemovalWhoseTimeIsNotKnown) {
  const TemporaryFolder folder;
  for (int i = 0; i < 40; ++i) {
    folder.write(std::to_string(i) + ".jpg",
                 jpegOf(photoLikePicture(96, 64, static_cast<std::uint64_t>(i))));
  }
  for (const std::vector<std::string>& more :
       {std::vector<std::string>{}, {"--unknown-times"}, {"--threshold", "-100"}}) {
    std::vector<std::string> arguments = {"dupes", "-r", folder.path(), "--keep", "best"};
    arguments.insert(arguments.end(), more.begin(), more.end());
    const Finished run = quenby(arguments);
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_THAT(run.output, Not(HasSubstr("rather not")));
  }
}

TEST(DupesCommand, TakesFileTimesOnlyWhenAsked) {
  const Holiday holiday;
  const auto now = fs::file_time_type::clock::now();
  fs::last_write_time(holiday.folder / "untimed/a.jpg", now);
  fs::last_write_time(holiday.folder / "untimed/b.jpg", now + std::chrono::seconds(4));
  const Json near = holiday.json({"--assume-mtime"});
  const Json pair = pairOf(holiday, near, "untimed/a.jpg", "untimed/b.jpg");
  EXPECT_EQ(pair["timesKnown"], true);
  EXPECT_NEAR(pair["timeDifference"].get<double>(), 4.0, 1e-3);
  for (const Json& group : near["groups"]) {
    for (const Json& photo : group["photos"]) {
      const bool untimed = nameIn(holiday, photo["file"]).starts_with("untimed/");
      EXPECT_EQ(photo["timeSource"], untimed ? "file" : "camera");
    }
  }
  fs::last_write_time(holiday.folder / "untimed/b.jpg", now + std::chrono::hours(1));
  const Json far = holiday.json({"--assume-mtime"});
  EXPECT_EQ(pairOf(holiday, far, "untimed/a.jpg", "untimed/b.jpg"), nullptr);
}

TEST(DupesCommand, TakesTheMeasuredThresholdUnlessOneIsGiven) {
  const Holiday holiday;
  EXPECT_EQ(parsedJson(quenby({"dupes", "-r", holiday.folder.path(), "--json"}).output),
            parsedJson(holiday.dupes({"--threshold", "1.5", "--json"}).output));
}

// Pairs grow with the square of a group: they are told when somebody asks.
TEST(DupesCommand, TellsMembersInsteadOfPairsAndWhichGroupsAreLarge) {
  const TemporaryFolder folder;
  const std::string first = folder.write("00.jpg", sceneJpeg(1, 100, takenAt("10:00:00")));
  const auto run = [&](std::size_t photos, const std::vector<std::string>& more) {
    for (std::size_t i = folder.content().size(); i < photos; ++i) {
      fs::copy_file(first, folder / fmt::format("{:02}.jpg", i));
    }
    std::vector<std::string> arguments = {"dupes", "-r", folder.path()};
    arguments.insert(arguments.end(), more.begin(), more.end());
    return quenby(arguments);
  };
  const Finished small = run(20, {"--json"});
  EXPECT_EQ(parsedJson(small.output)["groups"][0]["large"], false);
  const Finished large = run(40, {"--json"});
  const Json group = parsedJson(large.output)["groups"][0];
  EXPECT_EQ(group["photos"].size(), 40u);
  EXPECT_FALSE(group.contains("pairs"));
  EXPECT_EQ(group["lowestScore"], group["highestScore"]);
  EXPECT_EQ(group["seconds"], 0.0);
  EXPECT_EQ(group["large"], true);
  EXPECT_LT(large.output.size(), small.output.size() * 21 / 10);
  EXPECT_THAT(run(40, {}).output, HasSubstr("Group 1: 40 photos, score 3.64, within 0.00 s; more "
                                            "than 20: a series rather than doubles"));
  EXPECT_EQ(parsedJson(run(40, {"--json", "--pairs"}).output)["groups"][0]["pairs"].size(),
            40u * 39 / 2);
}

TEST(DupesCommand, IsStricterWithALargerThreshold) {
  const Holiday holiday;
  const Json report = holiday.json({"--threshold", "1.7"});
  EXPECT_LT(report["groups"].size(), 3u);
  for (const Json& group : report["groups"]) {
    for (const Json& pair : group["pairs"]) EXPECT_GE(pair["score"], 1.7);
  }
  const Finished none = holiday.dupes({"--threshold", "4"});
  EXPECT_EQ(none.exitCode, 0);
  EXPECT_EQ(none.output, "");
  EXPECT_THAT(none.errors, HasSubstr("no near-duplicates among 12 photos"));
}

TEST(DupesCommand, NamesACorruptFileAndGoesOn) {
  const Holiday holiday;
  Bytes cut = holiday.folder.read("burst/1.jpg");
  cut.resize(cut.size() / 2);
  holiday.folder.write("cut.jpg", cut);
  holiday.folder.write("empty.jpg", "");
  const Json report = holiday.json({}, 1);
  EXPECT_EQ(report["photos"], 12);
  EXPECT_EQ(report["groups"].size(), 3u);
  ASSERT_EQ(report["failed"].size(), 2u);
  EXPECT_EQ(nameIn(holiday, report["failed"][0]["file"]), "cut.jpg");
  EXPECT_EQ(nameIn(holiday, report["failed"][1]["file"]), "empty.jpg");
  const Finished run = holiday.dupes({});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.errors, HasSubstr("cut.jpg: "));
  EXPECT_THAT(run.errors, HasSubstr("empty.jpg: is empty"));
}

TEST(DupesCommand, ReadsNoPixelsASecondTimeWithACache) {
  const Holiday holiday;
  const TemporaryFolder elsewhere;
  const std::string cache = elsewhere / "cache";
  const Json first = holiday.json({"--cache", cache});
  EXPECT_EQ(rowsIn(cache), 12);
  replaceUnnoticed(holiday.folder / "burst/2.jpg");
  EXPECT_EQ(holiday.json({"--cache", cache}), first);
  EXPECT_EQ(holiday.json({}, 1)["failed"].size(), 1u);  // without the cache the file is read
}

TEST(DupesCommand, ReadsNoPixelsForScoresASecondTimeWithACache) {
  const Holiday holiday;
  holiday.folder.write("small/1.jpg", sceneJpeg(1, 100, takenAt("19:00:00"), 80, 60));
  holiday.folder.write("small/2.jpg", sceneJpeg(1, 100, takenAt("19:00:01"), 80, 60));
  const TemporaryFolder elsewhere;
  const std::string cache = elsewhere / "cache";
  holiday.json({"--cache", cache});
  EXPECT_EQ(rowsIn(cache, "scores"), 0);
  const Json first = holiday.json({"--cache", cache, "--keep", "best"});
  EXPECT_EQ(rowsIn(cache, "scores"), 9);
  for (const char* name : {"burst/2.jpg", "small/1.jpg"}) replaceUnnoticed(holiday.folder / name);
  EXPECT_EQ(holiday.json({"--cache", cache, "--keep", "best"}), first);
}

TEST(DupesCommand, NamesAFileThatCannotBeReadAgainForItsScore) {
  const Holiday holiday;
  const TemporaryFolder elsewhere;
  holiday.json({"--cache", elsewhere / "cache"});
  replaceUnnoticed(holiday.folder / "zones/a.jpg");
  const Json report = holiday.json({"--cache", elsewhere / "cache", "--keep", "best"}, 1);
  ASSERT_EQ(report["failed"].size(), 1u);
  EXPECT_THAT(report["failed"][0]["error"], testing::StartsWith("no score of it: "));
  const Json ranking = rankingOf(holiday, report, "zones/a.jpg");
  EXPECT_EQ(nameIn(holiday, ranking[1]["file"]), "zones/a.jpg");
  EXPECT_EQ(ranking[1]["niqe"], nullptr);
  EXPECT_EQ(ranking[1]["reason"], "as many pixels, not scored");
}

TEST(DupesCommand, ReadsAFileAgainThatChanged) {
  const Holiday holiday;
  const TemporaryFolder elsewhere;
  holiday.json({"--cache", elsewhere / "cache"});
  holiday.folder.write("burst/3.jpg", sceneJpeg(1, 60, takenAt("19:00:00")));
  EXPECT_THAT(groupsOf(holiday, holiday.json({"--cache", elsewhere / "cache"})),
              testing::Contains(ElementsAre("burst/1.jpg", "burst/2.jpg")));
}

TEST(DupesCommand, SaysWhatToDoAboutAForeignCache) {
  const Holiday holiday;
  const TemporaryFolder elsewhere;
  const std::string letter = "Dear friend, this is not a cache but it is long enough to be one.";
  elsewhere.write("letter.txt", letter);
  const Finished run = holiday.dupes({"--cache", elsewhere / "letter.txt"});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_EQ(run.output, "");
  EXPECT_THAT(run.errors, HasSubstr("letter.txt: is not a cache of photos; delete the file "
                                    "or name another one"));
  EXPECT_EQ(elsewhere.read("letter.txt"), Bytes(letter.begin(), letter.end()));
}

TEST(DupesCommand, KeepsWhatItHadWhenInterrupted) {
  const TemporaryFolder folder, elsewhere;
  const std::string photo = folder.write("0.jpg", sceneJpeg(1, 100, {}, 2400, 1800));
  for (int i = 1; i < 100; ++i) fs::create_hard_link(photo, folder / (std::to_string(i) + ".jpg"));
  for (const int signal : {SIGINT, SIGKILL}) {
    const std::string cache = elsewhere / ("cache" + std::to_string(signal));
    Process run({quenbyPath(), "dupes", "-r", folder.path(), "--scale", "1", "--cache", cache},
                STDIN_FILENO);
    while (rowsIn(cache) < 3) std::this_thread::sleep_for(std::chrono::milliseconds(5));
    run.send(signal);
    EXPECT_EQ(run.wait().exitCode, 128 + signal);
    const int kept = rowsIn(cache);
    EXPECT_GE(kept, 3);
    EXPECT_LT(kept, 100);
    const Finished next =
        quenby({"dupes", folder / "0.jpg", folder / "1.jpg", "--scale", "1", "--cache", cache});
    EXPECT_EQ(next.exitCode, 0) << next.errors;
  }
}

TEST(DupesCommand, SharesACacheWithAnotherRunAtTheSameTime) {
  const Holiday holiday;
  const TemporaryFolder elsewhere;
  const std::vector<std::string> command = {
      quenbyPath(), "dupes", "-r", holiday.folder.path(), "--json", "--cache", elsewhere / "cache"};
  for (int round = 0; round < 5; ++round) {
    for (const char* name : {"cache", "cache-wal", "cache-shm"}) fs::remove(elsewhere / name);
    Process one(command, STDIN_FILENO), other(command, STDIN_FILENO);
    const Finished first = one.wait(), second = other.wait();
    EXPECT_EQ(first.exitCode, 0) << first.errors;
    EXPECT_EQ(second.exitCode, 0) << second.errors;
    EXPECT_EQ(first.output, second.output);
    EXPECT_EQ(rowsIn(elsewhere / "cache"), 12);
  }
}

TEST(DupesCommand, SaysWhichToKeepAndWhyAndDeletesNothing) {
  const Holiday holiday;
  holiday.folder.write("burst/large.jpg", sceneJpeg(1, 90, takenAt("10:00:01"), 640, 480));
  const auto before = holiday.folder.content();
  const Json report = holiday.json({"--keep", "best"});
  for (const Json& group : report["groups"]) {
    ASSERT_EQ(group["ranking"].size(), group["photos"].size());
    for (std::size_t i = 0; i < group["ranking"].size(); ++i) {
      EXPECT_EQ(group["ranking"][i]["keep"], i == 0);
    }
    if (group["photos"].size() != 4) continue;
    EXPECT_EQ(nameIn(holiday, group["ranking"][0]["file"]), "burst/large.jpg");
    EXPECT_EQ(group["ranking"][0]["reason"], "the most pixels, 0.3 megapixels");
  }
  const std::string text = holiday.dupes({"--keep", "best"}).output;
  EXPECT_THAT(text, HasSubstr("burst/large.jpg: the most pixels"));
  EXPECT_THAT(text, HasSubstr("rather not "));
  EXPECT_THAT(holiday.dupes({}).output, Not(HasSubstr("keep")));
  EXPECT_EQ(holiday.folder.content(), before);
}

TEST(DupesCommand, KeepsNoBlurredOrNoisyCopyOfEqualSize) {
  const TemporaryFolder folder;
  const Image<RGBA8Pixel> picture = photoLikePicture(480, 384, 1);
  const std::string blur = folder.write("blurred.jpg", jpegOf(blurred(picture), {}, 100));
  const std::string noise = folder.write("noisy.jpg", jpegOf(noisy(picture), {}, 100));
  const std::string sharp = folder.write("sharp.jpg", jpegOf(picture, {}, 80));
  ASSERT_LT(fs::file_size(sharp), fs::file_size(noise));
  for (const std::string& copy : {blur, noise}) {
    const Finished run = quenby({"dupes", copy, sharp, "--keep", "best", "--assume-mtime"});
    EXPECT_THAT(run.output, HasSubstr("keep " + sharp + ": the most natural among those of"));
    EXPECT_THAT(run.output, testing::ContainsRegex("rather not " + copy +
                                                   ": as many pixels, less sharp or natural: "
                                                   "NIQE [0-9.]+ against [0-9.]+"));
  }
}

TEST(DupesCommand, RanksByTheScoreOfTheFullSizeUprightPicture) {
  const Holiday holiday;
  holiday.folder.write("burst/large.jpg", sceneJpeg(1, 90, takenAt("10:00:01"), 640, 480));
  holiday.folder.write("small/1.jpg", sceneJpeg(1, 100, takenAt("19:00:00"), 80, 60));
  holiday.folder.write("small/2.jpg", sceneJpeg(1, 100, takenAt("19:00:01"), 80, 60));
  const Json report = holiday.json({"--keep", "best", "--scale", "4", "-j", "2"});
  for (const char* name : {"burst/1.jpg", "held/turned.jpg", "zones/a.jpg"}) {
    for (const Json& ranked : rankingOf(holiday, report, name)) {
      const bool alone = nameIn(holiday, ranked["file"]) == "burst/large.jpg";
      const Json score =
          parsedJson(quenby({"score", ranked["file"].get<std::string>(), "--json"}).output);
      EXPECT_EQ(ranked["niqe"], alone ? Json() : score["score"]) << ranked;
    }
  }
  const Json small = rankingOf(holiday, report, "small/1.jpg");
  ASSERT_EQ(small.size(), 2u);
  EXPECT_EQ(small[1]["niqe"], nullptr);
  EXPECT_THAT(small[1]["reason"].get<std::string>(), HasSubstr("too small to score"));
}

TEST(DupesCommand, PrintsOneGroupALineForJsonLines) {
  const Holiday holiday;
  holiday.folder.write("empty.jpg", "");
  const Finished run = holiday.dupes({"--jsonl"});
  std::istringstream lines(run.output);
  int groups = 0, failed = 0;
  for (std::string line; std::getline(lines, line);) {
    const Json object = parsedJson(line);
    groups += object.contains("photos");
    failed += object.contains("error");
  }
  EXPECT_EQ(groups, 3);
  EXPECT_EQ(failed, 1);
}

TEST(DupesCommand, WritesAPageThatNeedsNothingElse) {
  const Holiday holiday;
  const TemporaryFolder elsewhere;
  const std::string page = elsewhere / "report.html";
  ASSERT_EQ(holiday.dupes({"--html", page, "--keep", "best"}).exitCode, 0);
  const Bytes bytes = elsewhere.read("report.html");
  const std::string html(bytes.begin(), bytes.end());
  const auto count = [&](const std::string& text) {
    int found = 0;
    for (std::size_t at = 0; (at = html.find(text, at)) != std::string::npos; ++at) ++found;
    return found;
  };
  EXPECT_EQ(count("<section>"), 3);
  EXPECT_EQ(count("src=\"data:image/jpeg;base64,/9j/"), 7);
  EXPECT_EQ(count("src="), 7);
  EXPECT_EQ(count("href="), 0);
  EXPECT_EQ(count("figure class=\"keep\""), 3);

  const Finished again = holiday.dupes({"--html", page});
  EXPECT_EQ(again.exitCode, 2);
  EXPECT_THAT(again.errors, HasSubstr("exists; add --overwrite"));
  EXPECT_EQ(elsewhere.read("report.html"), bytes);
  EXPECT_EQ(holiday.dupes({"--html", page, "--overwrite"}).exitCode, 0);
  EXPECT_THAT(holiday.dupes({"--html", "-"}).output, testing::StartsWith("<!DOCTYPE html>"));
  const std::string other = elsewhere / "new/other.html", cache = elsewhere / "cache";
  const Finished plan = holiday.dupes({"--html", other, "--cache", cache, "-n"});
  EXPECT_EQ(plan.exitCode, 0);
  EXPECT_THAT(plan.errors, HasSubstr("other.html: would be written without -n"));
  EXPECT_THAT(elsewhere.content(), testing::ElementsAre("report.html"));
  EXPECT_EQ(holiday.dupes({"--html", other}).exitCode, 0);
  EXPECT_TRUE(elsewhere.has("new/other.html"));
}

// The shell puts the first photo where a name for the page is missing: --html *.jpg.
TEST(DupesCommand, NeverReplacesAPhotoOrItsCacheWithThePage) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg()), b = folder.write("b.jpg", smallJpeg());
  const std::string cache = folder / "c.html";
  std::filesystem::create_symlink("a.jpg", folder / "a.html");
  for (const std::vector<std::string>& page : {std::vector<std::string>{a},
                                               {folder / "a.html"},
                                               {cache, "--cache", cache},
                                               {cache + "-wal", "--cache", cache},
                                               {folder / "p.html", "--cache", folder / "c.jpg"}}) {
    std::vector<std::string> arguments = {"dupes", b, a, "--overwrite", "--html"};
    arguments.insert(arguments.end(), page.begin(), page.end());
    const Finished run = quenby(arguments);
    EXPECT_EQ(run.exitCode, 2) << page[0];
    EXPECT_EQ(folder.read("a.jpg"), smallJpeg());
  }
  EXPECT_THAT(folder.content(), testing::ElementsAre("a.html", "a.jpg", "b.jpg"));
}

TEST(DupesCommand, GivesTheSameAnswerWithSeveralThreads) {
  const Holiday holiday;
  EXPECT_EQ(holiday.dupes({"-j", "4", "--json"}).output, holiday.dupes({"--json"}).output);
}

TEST(DupesCommand, TakesAPathNamedTwiceForOnePhoto) {
  const Holiday holiday;
  const std::string photo = holiday.folder / "untimed/a.jpg";
  const Finished run = quenby({"dupes", photo, holiday.folder / "untimed/../untimed/a.jpg"});
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_THAT(run.errors, HasSubstr("no near-duplicates among 1 photos"));
}

TEST(DupesCommand, TakesAListOfPhotosAlone) {
  const Holiday holiday;
  const std::string list = holiday.folder.write(
      "list", holiday.folder / "zones/a.jpg" + "\n" + holiday.folder / "zones/b.jpg" + "\n");
  const Finished run = quenby({"dupes", "--files-from", list});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_THAT(run.errors, HasSubstr("2 of 2 photos"));
  EXPECT_EQ(
      quenby({"dupes", "--files-from", list, "--plan", list, "--link", "--no-backup"}).exitCode, 2);
}

TEST(DupesCommand, TakesAPhotoFromStandardInput) {
  const Holiday holiday;
  const Finished run = quenby({"dupes", "-", holiday.folder / "zones/a.jpg", "--json"},
                              holiday.folder.read("zones/b.jpg"));
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_EQ(parsedJson(run.output)["groups"].size(), 1u);
}

TEST(DupesCommand, HasNothingToDoInAFolderWithoutPhotos) {
  const TemporaryFolder folder;
  const Finished run = quenby({"dupes", "-r", folder.path(), "--json"});
  EXPECT_EQ(run.exitCode, 3);
  EXPECT_EQ(parsedJson(run.output)["groups"], nlohmann::json::array());
}

TEST(DupesCommand, RefusesWhatCannotBeMeant) {
  const Holiday holiday;
  for (const std::vector<std::string>& arguments :
       std::vector<std::vector<std::string>>{{"--threshold", "nan"},
                                             {"--threshold", "much"},
                                             {"--scale", "3"},
                                             {"--keep", "worst"},
                                             {"--html", "-", "--json"}}) {
    const Finished run = holiday.dupes(arguments);
    EXPECT_EQ(run.exitCode, 2) << arguments[0] << ' ' << arguments[1];
    EXPECT_THAT(run.errors, HasSubstr("quenby dupes: "));
    EXPECT_EQ(run.output, "");
  }
}

TEST(DupesCommand, TellsTheScaleInItsHelp) {
  const Finished help = quenby({"dupes", "--help"});
  EXPECT_EQ(help.exitCode, 0);
  EXPECT_THAT(help.output, HasSubstr("1/8 from 4 megapixels on"));
}

TEST(ScaleFor, LeavesEnoughPixels) {
  EXPECT_EQ(photo::scaleFor(4000, 3000), 8);
  EXPECT_EQ(photo::scaleFor(2400, 1600), 8);
  EXPECT_EQ(photo::scaleFor(2000, 1500), 4);
  EXPECT_EQ(photo::scaleFor(640, 480), 2);
  EXPECT_EQ(photo::scaleFor(320, 240), 1);
  EXPECT_EQ(photo::scaleFor(1, 65500), 1);
  EXPECT_EQ(photo::scaleFor(4294967295u, 4294967295u), 8);
}

}  // namespace
}  // namespace pelorin::test_support

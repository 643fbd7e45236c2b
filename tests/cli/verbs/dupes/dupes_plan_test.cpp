#include <fcntl.h>
#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>
#include <filesystem>

#include "photo/collection/photo_record.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/cli/verbs/dupes/photo_library_files.h"

namespace pelorin::test_support {
namespace {

using Json = nlohmann::json;
using testing::HasSubstr;
namespace fs = std::filesystem;

// Two groups: a photo with a copy of its bytes and a smaller one, and two shots of a burst.
class Doubles {
 public:
  Doubles() {
    const Bytes photo = sceneJpeg(1, 100, takenAt("10:00:00"));
    folder.write("in/a.jpg", photo);
    folder.write("in/b/a.jpg", photo);
    folder.write("in/small.jpg", sceneJpeg(1, 100, takenAt("10:00:00"), 160, 120));
    folder.write("in/burst1.jpg", sceneJpeg(2, 100, takenAt("12:00:00")));
    folder.write("in/burst2.jpg", jpegOf(sceneShot(2, 100), exifOf("12:00:00"), 70));
    folder.write("in/alone.jpg", sceneJpeg(3, 100, takenAt("14:00:00")));
    before = folder.content();
  }

  Finished dupes(std::vector<std::string> arguments) const {
    arguments.insert(arguments.begin(), {"dupes", "-r", folder / "in"});
    return quenby(arguments);
  }
  std::string away() const { return folder / "away"; }
  std::string moved(const std::string& name) const {
    return "away" + fs::canonical(folder.path()).string() + "/" + name;
  }
  ino_t fileOf(const std::string& name) const {
    struct stat status = {};
    EXPECT_EQ(::stat((folder / name).c_str(), &status), 0) << name;
    return status.st_ino;
  }

  TemporaryFolder folder;
  std::set<std::string> before;

 private:
  static std::vector<photo::MetadataSegment> exifOf(const std::string& clock) {
    return {{0xE1, exifPayload(takenAt(clock), /*littleEndian=*/true)}};
  }
};

TEST(DupesPlan, IsOnlySaidUnlessItIsToBeApplied) {
  const Doubles doubles;
  const Finished move = doubles.dupes({"--move-to", doubles.away()});
  EXPECT_EQ(move.exitCode, 0) << move.errors;
  EXPECT_THAT(move.output, HasSubstr("in/small.jpg -> "));
  EXPECT_THAT(move.errors, HasSubstr("3 photos would be moved; add --apply to do it"));
  const Finished link = doubles.dupes({"--link", "--no-backup"});
  EXPECT_EQ(link.exitCode, 0) << link.errors;
  EXPECT_THAT(link.output, HasSubstr("in/b/a.jpg = "));
  EXPECT_THAT(link.errors, HasSubstr("1 photos would be linked; add --apply to do it"));
  EXPECT_EQ(doubles.folder.content(), doubles.before);
}

TEST(DupesPlan, MovesAllButTheBestAndUndoPutsThemBack) {
  const Doubles doubles;
  const ino_t small = doubles.fileOf("in/small.jpg");
  const Finished run = doubles.dupes({"--move-to", doubles.away(), "--apply", "--jsonl"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  for (const char* name : {"in/b/a.jpg", "in/small.jpg"}) {
    EXPECT_FALSE(doubles.folder.has(name)) << name;
    EXPECT_TRUE(doubles.folder.has(doubles.moved(name))) << name;
  }
  EXPECT_TRUE(doubles.folder.has("in/a.jpg"));
  EXPECT_TRUE(doubles.folder.has("in/alone.jpg"));
  EXPECT_NE(doubles.folder.has("in/burst1.jpg"), doubles.folder.has("in/burst2.jpg"));
  EXPECT_THAT(run.output, HasSubstr("\"status\":\"moved\""));
  // The next run has nothing to do.
  EXPECT_EQ(doubles.dupes({"--move-to", doubles.away(), "--apply"}).exitCode, 3);

  // Another photo has come to one of the places and is to go there as well.
  doubles.folder.write("in/small.jpg", sceneJpeg(1, 90, takenAt("10:00:00"), 160, 120));
  const Finished full = doubles.dupes({"--move-to", doubles.away(), "--apply"});
  EXPECT_EQ(full.exitCode, 1);
  EXPECT_THAT(full.errors, HasSubstr("is another file; name another folder"));
  EXPECT_TRUE(doubles.folder.has("in/small.jpg"));

  doubles.folder.write("in/small.jpg", "another");
  const Finished taken = quenby({"undo", doubles.away()});
  EXPECT_EQ(taken.exitCode, 1);
  EXPECT_THAT(taken.errors, HasSubstr("there is a file of that name now"));
  EXPECT_EQ(doubles.folder.read("in/small.jpg"), (Bytes{'a', 'n', 'o', 't', 'h', 'e', 'r'}));
  fs::remove(doubles.folder / "in/small.jpg");
  EXPECT_EQ(quenby({"undo", doubles.away()}).exitCode, 0);
  EXPECT_EQ(doubles.fileOf("in/small.jpg"), small);
  fs::remove(doubles.away());
  EXPECT_EQ(doubles.folder.content(), doubles.before);
}

TEST(DupesPlan, LeavesReferencesAndWhatIsLargerThanThem) {
  const Doubles doubles;
  const std::string reference = doubles.folder / "in/b";
  const Finished same = doubles.dupes({"--keep-under", reference, "--json"});
  for (const Json& group : parsedJson(same.output)["groups"]) {
    for (const Json& ranked : group["ranking"]) {
      const std::string file = fs::path(ranked["file"].get<std::string>()).string();
      if (group["ranking"].size() == 3) {
        EXPECT_EQ(ranked["keep"], file == doubles.folder / "in/b/a.jpg") << file;
      }
    }
  }
  // Through a link to it as well.
  fs::create_directory_symlink("in/b", doubles.folder / "link");
  EXPECT_EQ(doubles.dupes({"--keep-under", doubles.folder / "link", "--json"}).output, same.output);

  fs::rename(doubles.folder / "in/small.jpg", doubles.folder / "in/b/small.jpg");
  fs::remove(doubles.folder / "in/b/a.jpg");
  const Finished larger =
      doubles.dupes({"--keep-under", reference, "--move-to", doubles.away(), "--apply"});
  EXPECT_EQ(larger.exitCode, 0) << larger.errors;
  EXPECT_TRUE(doubles.folder.has("in/b/small.jpg"));
  EXPECT_TRUE(doubles.folder.has("in/a.jpg"));  // it has more pixels
  EXPECT_EQ(doubles.dupes({"--keep-under", doubles.folder / "in/none"}).exitCode, 2);
}

TEST(DupesPlan, LinksWhatHasTheSameBytesAlone) {
  const Doubles doubles;
  const std::string copy = doubles.folder / "in/b/a.jpg";
  const timespec times[] = {{1'000'000'000, 5}, {1'100'000'000, 7}};
  ASSERT_EQ(::utimensat(AT_FDCWD, copy.c_str(), times, 0), 0);
  const ino_t before = doubles.fileOf("in/b/a.jpg");
  const Finished run = doubles.dupes({"--link", "--backup", doubles.away(), "--apply"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_EQ(doubles.fileOf("in/b/a.jpg"), doubles.fileOf("in/a.jpg"));
  EXPECT_NE(doubles.fileOf("in/small.jpg"), doubles.fileOf("in/a.jpg"));
  EXPECT_NE(doubles.fileOf("in/burst1.jpg"), doubles.fileOf("in/burst2.jpg"));
  EXPECT_THAT(run.errors, HasSubstr("2 photos are like one to keep but have other bytes"));
  EXPECT_THAT(run.errors, HasSubstr("1 photos linked"));
  EXPECT_THAT(doubles.dupes({"--link", "--backup", doubles.away(), "--jsonl"}).output,
              HasSubstr("linked already"));
  EXPECT_EQ(quenby({"undo", doubles.away()}).exitCode, 0);
  EXPECT_EQ(doubles.fileOf("in/b/a.jpg"), before);
  struct stat status = {};
  ASSERT_EQ(::stat(copy.c_str(), &status), 0);
  EXPECT_EQ(status.st_mtim.tv_nsec, 7);
}

// By a copy, which has all that the file had.
TEST(DupesPlan, MovesToAnotherDiskAndBack) {
  const Doubles doubles;
  struct stat here = {}, memory = {};
  ::stat(doubles.folder.path().c_str(), &here);
  if (::stat("/dev/shm", &memory) != 0 || memory.st_dev == here.st_dev) {
    GTEST_SKIP() << "/dev/shm is no other disk";
  }
  const fs::path away = fs::path("/dev/shm") / fs::path(doubles.folder.path()).filename();
  const Bytes small = doubles.folder.read("in/small.jpg");
  const auto modified = fs::last_write_time(doubles.folder / "in/small.jpg");
  EXPECT_EQ(doubles.dupes({"--move-to", away, "--apply"}).exitCode, 0);
  EXPECT_FALSE(doubles.folder.has("in/small.jpg"));
  EXPECT_EQ(quenby({"undo", away}).exitCode, 0);
  EXPECT_EQ(doubles.folder.read("in/small.jpg"), small);
  EXPECT_EQ(fs::last_write_time(doubles.folder / "in/small.jpg"), modified);
  EXPECT_EQ(doubles.folder.content(), doubles.before);
  EXPECT_TRUE(fs::is_empty(away));
  fs::remove(away);
}

// A photo and a link to it are one photo: to remove either would lose it or mean nothing.
TEST(DupesPlan, TakesALinkToAPhotoForThePhoto) {
  const Doubles doubles;
  const TemporaryFolder folder;
  const std::string photo = folder.write("real/photo.jpg", sceneJpeg(1, 100, takenAt("10:00:00")));
  fs::create_symlink(photo, folder / "a link.jpg");
  fs::create_directory_symlink("real", folder / "z");
  const Finished run = quenby({"dupes", folder / "a link.jpg", photo, folder / "z/photo.jpg",
                               "--move-to", doubles.away(), "--apply"});
  EXPECT_EQ(run.exitCode, 3) << run.errors;
  EXPECT_TRUE(folder.has("real/photo.jpg"));
}

TEST(DupesPlan, FollowsLinksToFoldersOnTheWayToAPhoto) {
  const Doubles doubles;
  doubles.folder.makeFolder("elsewhere/below");
  doubles.folder.write("elsewhere/small.jpg", doubles.folder.read("in/small.jpg"));
  fs::create_directory_symlink("elsewhere/below", doubles.folder / "link");
  const std::string meant = doubles.folder / "link/../small.jpg";
  doubles.folder.write("small.jpg", "not meant");
  const Finished run =
      quenby({"dupes", doubles.folder / "in/a.jpg", meant, "--move-to", doubles.away(), "--apply"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_FALSE(doubles.folder.has("elsewhere/small.jpg"));
  EXPECT_TRUE(doubles.folder.has("small.jpg"));
  EXPECT_TRUE(doubles.folder.has(doubles.moved("elsewhere/small.jpg")));
}

Json entryOf(const std::string& path) {
  const auto stamp = photo::stampOf(path);
  return {{"file", path}, {"bytes", stamp->bytes}, {"modified", std::to_string(stamp->modified)}};
}

Json planOf(const std::vector<std::string>& keep, const std::vector<std::string>& remove) {
  Json group = {{"keep", Json::array()}, {"remove", Json::array()}};
  for (const std::string& path : keep) group["keep"].push_back(entryOf(path));
  for (const std::string& path : remove) group["remove"].push_back(entryOf(path));
  return {{"schema", 1}, {"plan", "dupes"}, {"groups", {group}}};
}

class PlanFile : public testing::Test {
 protected:
  std::string photo(const char* name) const { return doubles.folder / name; }
  Finished move(const Json& plan) const {
    return quenby({"dupes", "--plan", plans.write("plan.json", plan.dump()), "--move-to",
                   doubles.away(), "--apply"});
  }

  Doubles doubles;
  TemporaryFolder plans;
};

TEST_F(PlanFile, SaysWhatGoes) {
  const Finished run = move(planOf({photo("in/alone.jpg")}, {photo("in/a.jpg")}));
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_TRUE(doubles.folder.has(doubles.moved("in/a.jpg")));
  EXPECT_EQ(doubles.folder.content().count("in/a.jpg"), 0u);
}

TEST_F(PlanFile, TakesNamesThatAreNoUtf8) {
  const std::string name = doubles.folder.write("in/\xE9.jpg", Bytes{1, 2, 3});
  Json plan = planOf({photo("in/a.jpg")}, {photo("in/small.jpg")});
  Json& entry = plan["groups"][0]["remove"][0];
  const auto stamp = photo::stampOf(name);
  entry = {{"file", "?"}, {"bytes", 3}, {"modified", std::to_string(stamp->modified)}};
  const std::string encoded = shell("printf %s '" + name + "' | base64 -w0").output;
  entry["fileBase64"] = encoded;
  const Finished run = move(plan);
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_FALSE(doubles.folder.has("in/\xE9.jpg"));
  EXPECT_TRUE(doubles.folder.has(doubles.moved("in/\xE9.jpg")));
}

TEST_F(PlanFile, MovesNothingThatHasChangedOrStandsForNothing) {
  const auto refused = [&](const Json& plan, const std::string& reason) {
    const Finished run = move(plan);
    EXPECT_EQ(run.exitCode, 1) << run.errors;
    EXPECT_THAT(run.errors, HasSubstr(reason));
    EXPECT_TRUE(doubles.folder.has("in/a.jpg"));
    EXPECT_FALSE(doubles.folder.has("away"));
  };
  Json plan = planOf({photo("in/b/a.jpg")}, {photo("in/a.jpg")});
  Json changed = plan;
  changed["groups"][0]["remove"][0]["modified"] = "1";
  refused(changed, "a.jpg: has changed since it was compared; left as it is");
  changed = plan;
  changed["groups"][0]["remove"][0]["bytes"] = 1;
  refused(changed, "has changed since it was compared");
  changed = plan;
  changed["groups"][0]["keep"][0]["bytes"] = 1;
  refused(changed, "left as it is, because ");
  fs::create_symlink("a.jpg", photo("in/link.jpg"));
  refused(planOf({photo("in/b/a.jpg")}, {photo("in/link.jpg")}), "is a symbolic link");
  refused(planOf({photo("in/link.jpg")}, {photo("in/a.jpg")}), "is itself the photo to keep");
}

TEST_F(PlanFile, IsRefusedWhole) {
  const Json good = planOf({photo("in/b/a.jpg")}, {photo("in/a.jpg")});
  Json noKeep = good, both = good, other = good, relative = good;
  noKeep["groups"][0]["keep"] = Json::array();
  both["groups"][0]["keep"].push_back(good["groups"][0]["remove"][0]);
  other["schema"] = 2;
  relative["groups"][0]["remove"][0]["file"] = "a.jpg";
  for (const Json& plan : {noKeep, both, other, relative, Json(3), Json::object()}) {
    const Finished run = move(plan);
    EXPECT_EQ(run.exitCode, 2) << plan;
    EXPECT_THAT(run.errors, HasSubstr("--plan: "));
  }
  EXPECT_EQ(doubles.folder.content(), doubles.before);
}

TEST(DupesPlan, RefusesWhatCannotBeMeant) {
  const Doubles doubles;
  const std::string plan = doubles.folder.write("plan", "{}");
  for (const std::vector<std::string>& arguments :
       std::vector<std::vector<std::string>>{{"--apply"},
                                             {"--link"},
                                             {"--link", "--backup", "x", "--no-backup"},
                                             {"--no-backup"},
                                             {"--link", "--no-backup", "--move-to", "x"},
                                             {"--move-to", doubles.folder / "in"},
                                             {"--move-to", doubles.folder.path()},
                                             {"--plan", plan, "--move-to", doubles.away()}}) {
    EXPECT_EQ(doubles.dupes(arguments).exitCode, 2) << arguments[0];
  }
  EXPECT_EQ(quenby({"dupes"}).exitCode, 2);
  EXPECT_EQ(quenby({"dupes", "--plan", plan}).exitCode, 2);
  // A folder of photos that were replaced is none for photos that are moved.
  doubles.folder.write("away/.quenby-backup", "");
  const Finished other = doubles.dupes({"--move-to", doubles.away(), "--apply"});
  EXPECT_EQ(other.exitCode, 1);
  EXPECT_THAT(other.errors, HasSubstr("keeps photos that were replaced; name another folder"));
  fs::remove_all(doubles.away());
  fs::remove(plan);
  EXPECT_EQ(doubles.folder.content(), doubles.before);
}

// Killed at every call that moves a name, one after the other.
TEST(DupesPlan, LosesNoPhotoWhenKilled) {
  if (std::getenv("QUENBY_COMMAND") != nullptr) {
    GTEST_SKIP() << "another command, such as one with sanitizers, makes calls of its own";
  }
  const std::vector<std::pair<std::string, std::vector<std::string>>> actions = {
      {"--move-to ", {"renameat2"}}, {"--link --backup ", {"link", "rename"}}};
  for (const auto& [action, calls] : actions) {
    const Doubles doubles;
    for (const char* name : {"small", "burst1", "burst2", "alone"}) {
      fs::remove(doubles.folder / fmt::format("in/{}.jpg", name));
    }
    const Bytes photo = doubles.folder.read("in/a.jpg");
    const std::string command =
        " $QUENBY dupes -q -r " + doubles.folder / "in --apply " + action + doubles.away();
    for (const std::string& call : calls) {
      for (int time = 1;; ++time) {
        const Finished run =
            shell("strace -f -o " + doubles.folder / "trace" + " -e inject=" + call +
                  ":signal=KILL:when=" + std::to_string(time) + command);
        if (!doubles.folder.has("trace")) GTEST_SKIP() << "strace cannot trace here";
        const std::string place = action + call + " " + std::to_string(time);
        EXPECT_EQ(doubles.folder.read("in/a.jpg"), photo) << place;
        const bool there = doubles.folder.has("in/b/a.jpg");
        EXPECT_EQ(doubles.folder.read(there ? "in/b/a.jpg" : doubles.moved("in/b/a.jpg")), photo)
            << place;
        shell(command);
        for (const std::string& file : doubles.folder.content()) {
          EXPECT_FALSE(file.ends_with(".tmp")) << place;
        }
        EXPECT_EQ(quenby({"undo", doubles.away()}).exitCode, 0) << place;
        EXPECT_EQ(doubles.folder.read("in/b/a.jpg"), photo) << place;
        if (run.exitCode == 0) break;
        ASSERT_LT(time, 20) << place;
      }
    }
  }
}

}  // namespace
}  // namespace pelorin::test_support

// The mark that an edited file carries, and what is done about it.
#include <gmock/gmock.h>

#include <cstdlib>
#include <map>

#include "photo/photo.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {
namespace {

namespace fs = std::filesystem;
using testing::HasSubstr;

std::vector<photo::EditMark> marksOf(const Bytes& file) {
  return photo::readFacts(file).edits;
}

TEST(EditedAlready, IsSaidAndSkippedInEveryFormat) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  for (const std::string name : {"b.jpg", "b.png"}) {
    ASSERT_EQ(quenby({"enhance", in, "-o", folder / name}).exitCode, 0);
    ASSERT_EQ(marksOf(folder.read(name)).size(), 1u);
    EXPECT_EQ(marksOf(folder.read(name))[0].params, "slider=0.4");
    const Finished twice = quenby({"enhance", folder / name, "-o", folder / "c.jpg"});
    EXPECT_EQ(twice.exitCode, 3);
    EXPECT_EQ(twice.errors,
              folder / name + ": enhanced already (AE0, slider 0.4); --again does it again\n");
    EXPECT_FALSE(folder.has("c.jpg"));
    const Finished plan = quenby({"enhance", folder / name, "-o", folder / "c.jpg", "-n"});
    EXPECT_EQ(plan.exitCode, 3);
    EXPECT_THAT(plan.output,
                HasSubstr("c.jpg (enhanced already: AE0, slider 0.4; skipped without --again)\n"));
    EXPECT_THAT(quenby({"info", folder / name}).output, HasSubstr("edited       AE0, slider 0.4"));
    const nlohmann::json info = parsedJson(quenby({"info", folder / name, "--json"}).output);
    EXPECT_EQ(info["edits"][0]["filter"], "AE0");
    EXPECT_EQ(info["edits"][0]["params"], "slider=0.4");
    EXPECT_TRUE(info["edits"][0]["when"].is_null());
  }
}

TEST(EditedAlready, CountsForFiltersOfOneNameAlone) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  ASSERT_EQ(quenby({"look", "winter", in, "-o", folder / "b.jpg"}).exitCode, 0);
  EXPECT_EQ(quenby({"look", "winter", folder / "b.jpg", "-o", folder / "c.jpg"}).exitCode, 3);
  ASSERT_EQ(quenby({"enhance", folder / "b.jpg", "-o", folder / "c.jpg"}).exitCode, 0);
  EXPECT_EQ(marksOf(folder.read("c.jpg")).size(), 2u);
  const Finished other = quenby(
      {"enhance", "--filter", "AE08bit", folder / "c.jpg", "-o", folder / "d.jpg", "--json"});
  EXPECT_EQ(other.exitCode, 3);
  EXPECT_EQ(parsedJson(other.output)["status"], "edited");
  EXPECT_EQ(parsedJson(other.output)["earlier"], "AE0, slider 0.4");
}

TEST(EditedAlready, IsDoneAgainOnRequestAndSkippedWithoutFailure) {
  const TemporaryFolder folder;
  const std::string in = folder.write("in/a.jpg", smallJpeg());
  folder.write("in/b.jpg", smallJpeg(2));
  ASSERT_EQ(quenby({"enhance", in, "--in-place", "--no-backup"}).exitCode, 0);
  const Bytes once = folder.read("in/a.jpg");
  const Finished rest = quenby({"enhance", "-r", folder / "in", "--in-place", "--no-backup"});
  EXPECT_EQ(rest.exitCode, 0);
  EXPECT_THAT(rest.errors, HasSubstr("1 of 2 photos done, 0 failed, 1 enhanced already"));
  EXPECT_EQ(folder.read("in/a.jpg"), once);
  EXPECT_EQ(quenby({"enhance", in, "--in-place", "--no-backup", "--again"}).exitCode, 0);
  EXPECT_EQ(marksOf(folder.read("in/a.jpg")).size(), 2u);
}

TEST(EditedAlready, IsNothingThatUndoOrABackupKnowsLess) {
  const TemporaryFolder folder;
  const Bytes old = smallJpeg();
  const std::string in = folder.write("a.jpg", old), kept = folder / "kept";
  ASSERT_EQ(quenby({"enhance", in, "--in-place", "--backup", kept}).exitCode, 0);
  EXPECT_EQ(marksOf(folder.read("a.jpg")).size(), 1u);
  ASSERT_EQ(quenby({"enhance", in, "--in-place", "--backup", kept, "--again"}).exitCode, 0);
  EXPECT_EQ(marksOf(folder.read("a.jpg")).size(), 2u);
  ASSERT_EQ(quenby({"undo", kept}).exitCode, 0);
  EXPECT_EQ(folder.read("a.jpg"), old) << "the first one, which has no mark";
}

TEST(EditMark, IsLeftOutOnRequestAndStatesATimeOnlyWhereItIsGiven) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  ASSERT_EQ(quenby({"enhance", in, "-o", folder / "b.jpg", "--no-mark"}).exitCode, 0);
  EXPECT_TRUE(marksOf(folder.read("b.jpg")).empty());
  for (const auto& [epoch, when] : std::map<std::string, std::string>{
           {"1700000000", "2023-11-14T22:13:20Z"}, {"soon", ""}, {"-1", ""}, {"1e9", ""}}) {
    const std::string command = "SOURCE_DATE_EPOCH=" + epoch + " $QUENBY enhance --overwrite " +
                                in + " -o " + folder / "b.jpg";
    ASSERT_EQ(shell(command).exitCode, 0);
    EXPECT_EQ(marksOf(folder.read("b.jpg")).at(0).when, when);
  }
}

// Killed in the midst of several files at once; what stands there after another run is what one run
// would have made.
class KilledBatch : public testing::Test {
 protected:
  void SetUp() override {
    if (std::getenv("QUENBY_COMMAND") != nullptr) {
      GTEST_SKIP() << "another command, such as one with sanitizers, makes calls of its own";
    }
  }

  void write(const std::string& in, std::size_t photos) const {
    for (std::size_t i = 0; i < photos; ++i)
      folder_.write(in + "/" + std::to_string(i) + ".jpg", smallJpeg(i));
  }
  std::string enhance(const std::string& in, const std::string& more) const {
    return " $QUENBY enhance -q -r " + folder_ / in + " " + more;
  }
  /// Runs a command and kills it at a call of the system.
  Finished killed(const std::string& call, int time, const std::string& command) const {
    return shell("strace -f -o " + folder_ / "trace" + " -e inject=" + call +
                 ":signal=KILL:when=" + std::to_string(time) + command);
  }
  bool wasTraced() const { return folder_.has("trace"); }

  const TemporaryFolder folder_;
};

TEST_F(KilledBatch, GoesOnToTheSameBytesAfterEveryCallThatChangesAnything) {
  write("in", 2);
  const std::string batch = enhance("in", "--filter PassThrough -j 1 -o ");
  ASSERT_EQ(shell(batch + folder_ / "whole/").exitCode, 0);
  int kills = 0;
  for (const std::string call :
       {"mkdir", "flock", "write", "fsync", "rename,renameat2", "unlink", "rmdir"}) {
    for (int time = 1;; ++time) {
      const std::string place = call + " " + std::to_string(time), out = folder_ / "out/";
      fs::remove_all(out);
      const Finished run = killed(call, time, batch + out);
      if (!wasTraced()) GTEST_SKIP() << "strace cannot trace here";
      if (run.exitCode == 0) break;
      ++kills;
      const int code = shell(batch + out).exitCode;
      EXPECT_TRUE(code == 0 || code == 3) << place;  // all or nothing was left to do
      std::size_t files = 0;
      for (const fs::directory_entry& entry : fs::directory_iterator(out)) {
        const std::string name = entry.path().filename();
        EXPECT_EQ(folder_.read("out/" + name), folder_.read("whole/" + name)) << place;
        ++files;
      }
      EXPECT_EQ(files, 2u) << place;
      ASSERT_LT(time, 20);
    }
  }
  EXPECT_GE(kills, 11);
}

// Where contents are on the disk, and where files get their names: old ones and new.
TEST_F(KilledBatch, OfPhotosThatAreReplacedGoesOnToTheSameBytes) {
  write("in", 4);
  ASSERT_EQ(shell(enhance("in", "-j 2 -o " + folder_ / "whole/")).exitCode, 0);
  for (const auto& [call, time] :
       std::map<std::string, int>{{"fsync", 3}, {"rename,renameat2", 2}}) {
    fs::remove_all(folder_ / "place");
    write("place", 4);
    const std::string command = enhance("place", "-j 2 --in-place --no-backup --quality 90");
    const Finished run = killed(call, time, command);
    if (!wasTraced()) GTEST_SKIP() << "strace cannot trace here";
    EXPECT_NE(run.exitCode, 0) << call;
    EXPECT_EQ(shell(command).exitCode, 0) << call;
    for (const std::string name : {"0", "1", "2", "3"}) {
      EXPECT_EQ(folder_.read("place/" + name + ".jpg"), folder_.read("whole/" + name + "_AE0.jpg"))
          << call;
    }
  }
}

}  // namespace
}  // namespace pelorin::test_support

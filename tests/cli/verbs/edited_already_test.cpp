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

// Killed at some of its calls; what stands there after another run is what one run would have made.
TEST(EditedAlready, LetsAKilledBatchGoOnToTheSameBytes) {
  if (std::getenv("QUENBY_COMMAND") != nullptr) {
    GTEST_SKIP() << "another command, such as one with sanitizers, makes calls of its own";
  }
  const TemporaryFolder folder;
  const std::vector<std::string> names = {"a.jpg", "b.jpg", "c.jpg", "d.jpg"};
  const auto batch = [&](const std::string& in) {
    return " $QUENBY enhance -q -j 2 -r " + folder / in;
  };
  const auto photosIn = [&](const std::string& in) {
    for (std::size_t i = 0; i < names.size(); ++i) folder.write(in + "/" + names[i], smallJpeg(i));
  };
  photosIn("in");
  ASSERT_EQ(shell(batch("in") + " -o " + folder / "whole/").exitCode, 0);
  // Where contents are on the disk, and where files get their names: old ones and new.
  for (const std::string call :
       {"fsync:signal=KILL:when=3", "rename,renameat2:signal=KILL:when=2"}) {
    const std::string trace = "strace -f -o " + folder / "trace" + " -e inject=" + call;
    fs::remove_all(folder / "out");
    fs::remove_all(folder / "place");
    photosIn("place");
    const std::string toFolder = batch("in") + " -o " + folder / "out/";
    const std::string inPlace = batch("place") + " --in-place --no-backup --quality 90";
    for (const std::string& command : {toFolder, inPlace}) {
      const Finished killed = shell(trace + command);
      if (!folder.has("trace")) GTEST_SKIP() << "strace cannot trace here";
      EXPECT_NE(killed.exitCode, 0) << call;
      EXPECT_EQ(shell(command).exitCode, 0) << call;
    }
    for (const std::string& name : names) {
      const std::string result = fs::path(name).stem().string() + "_AE0.jpg";
      EXPECT_EQ(folder.read("out/" + result), folder.read("whole/" + result)) << call;
      EXPECT_EQ(folder.read("place/" + name), folder.read("whole/" + result)) << call;
    }
  }
}

}  // namespace
}  // namespace pelorin::test_support

#include <fcntl.h>
#include <gmock/gmock.h>
#include <signal.h>

#include <chrono>
#include <thread>

#include "cli/verbs/watch/settling.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {
namespace {

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;
namespace fs = std::filesystem;

TEST(Settling, TakesAFileForCompleteWhenItStaysTheSame) {
  cli::Settling settling(100);
  EXPECT_FALSE(settling.isComplete("a", {1, 1}, 0));
  EXPECT_FALSE(settling.isComplete("a", {2, 1}, 60));
  EXPECT_FALSE(settling.isComplete("a", {2, 1}, 120));
  EXPECT_FALSE(settling.isComplete("a", {2, 5}, 140));
  EXPECT_TRUE(settling.isWaiting());
  EXPECT_TRUE(settling.isComplete("a", {2, 5}, 240));
  EXPECT_FALSE(settling.isWaiting());
  EXPECT_TRUE(cli::Settling(0).isComplete("a", {1, 1}, 0));
}

TEST(Settling, WaitsForNothingThatIsGone) {
  cli::Settling settling(100);
  EXPECT_FALSE(settling.isComplete("a", {1, 1}, 0));
  EXPECT_FALSE(settling.isComplete("b", {1, 1}, 50));
  settling.forgetAllBut(50);
  EXPECT_FALSE(settling.isComplete("a", {1, 1}, 120));
}

class Incoming {
 public:
  Incoming() { folder.makeFolder("in"); }

  Finished once(std::vector<std::string> more = {}) const {
    more.insert(more.begin(),
                {"watch", folder / "in", "-o", folder / "out", "--once", "--settle", "0"});
    return quenby(more);
  }
  Process start() const {
    return Process({quenbyPath(), "watch", folder / "in", "-o", folder / "out", "--settle", "20"},
                   STDIN_FILENO);
  }
  bool appears(const std::string& name) const {
    for (int i = 0; i < 6000 && !folder.has(name); ++i) {
      std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return folder.has(name);
  }

  TemporaryFolder folder;
};

TEST(Watch, DoesEveryPhotoOnceAndAgainWhenItChanges) {
  const Incoming incoming;
  const TemporaryFolder& folder = incoming.folder;
  folder.write("in/a.jpg", smallJpeg(1));
  folder.write("in/below/b.jpg", smallJpeg(2));
  folder.write("in/.hidden.jpg", smallJpeg(2));
  const Finished first = incoming.once();
  EXPECT_EQ(first.exitCode, 0) << first.errors;
  EXPECT_THAT(first.errors, HasSubstr("2 photos done, 0 failed"));
  EXPECT_EQ(quenby({"enhance", folder / "in/a.jpg", "-o", folder / "wanted.jpg"}).exitCode, 0);
  EXPECT_EQ(folder.read("out/a_AE0.jpg"), folder.read("wanted.jpg"));
  EXPECT_TRUE(folder.has("out/below/b_AE0.jpg"));
  EXPECT_THAT(incoming.once().errors, HasSubstr("0 photos done, 0 failed"));

  folder.write("in/a.jpg", smallJpeg(3));
  folder.write("in/c.jpg", smallJpeg(4));
  const Finished changed = incoming.once({"--jsonl"});
  EXPECT_THAT(changed.errors, HasSubstr("2 photos done"));
  EXPECT_THAT(changed.output, HasSubstr("\"status\":\"done\""));
  EXPECT_NE(folder.read("out/a_AE0.jpg"), folder.read("wanted.jpg"));
  EXPECT_THAT(incoming.once().errors, HasSubstr("0 photos done"));
}

TEST(Watch, OnlySaysWhatItWouldDoWhereThatIsAsked) {
  const Incoming at;
  at.folder.write("in/a.jpg", smallJpeg());
  const Finished all = at.once({"-n"});
  EXPECT_EQ(all.exitCode, 0) << all.errors;
  EXPECT_THAT(all.output, HasSubstr("out/a_AE0.jpg"));
  EXPECT_FALSE(at.folder.has("out"));

  EXPECT_EQ(at.once().exitCode, 0);
  at.folder.write("in/b.jpg", smallJpeg());
  const Finished rest = at.once({"--dry-run"});
  EXPECT_THAT(rest.output, AllOf(HasSubstr("b_AE0.jpg"), Not(HasSubstr("a_AE0.jpg"))));
  EXPECT_FALSE(at.folder.has("out/b_AE0.jpg"));
  EXPECT_EQ(at.once().exitCode, 0);
  EXPECT_EQ(at.once({"-n"}).exitCode, 3);

  at.folder.write("out/.quenby-ledger", std::string("no ledger"));
  const Finished damaged = at.once({"-n"});
  EXPECT_THAT(damaged.errors, HasSubstr("cannot be used"));
  EXPECT_FALSE(at.folder.has("out/.quenby-ledger.damaged-1"));
}

TEST(Watch, TellsWhatIsLost) {
  const Incoming incoming;
  Bytes photo = smallJpeg(1);
  const Bytes jumbf = {0xFF, 0xEB, 0, 12, 'J', 'P', 0, 1, 0, 0, 0, 1, 0, 0};
  photo.insert(photo.begin() + 2, jumbf.begin(), jumbf.end());
  incoming.folder.write("in/a.jpg", photo);
  EXPECT_THAT(incoming.once().errors, HasSubstr("out/a_AE0.jpg: JUMBF boxes lost: "));
}

TEST(Watch, ReplacesNoFileOfOthersAndGoesOnAfterFailures) {
  const Incoming incoming;
  const TemporaryFolder& folder = incoming.folder;
  folder.write("in/a.jpg", smallJpeg(1));
  folder.write("in/broken.jpg", "no photo");
  folder.write("in/z.jpg", smallJpeg(1));
  folder.write("out/a_AE0.jpg", "another's");
  const Finished run = incoming.once();
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.output, HasSubstr("out/a_AE0.jpg (exists: left without --overwrite)"));
  EXPECT_THAT(run.errors, HasSubstr("broken.jpg: "));
  EXPECT_THAT(run.errors, HasSubstr("1 photos done, 1 failed"));
  EXPECT_EQ(folder.read("out/a_AE0.jpg").size(), 9u);
  EXPECT_TRUE(folder.has("out/z_AE0.jpg"));

  // A result that somebody has worked on since is theirs, also when the photo changes.
  folder.write("out/z_AE0.jpg", "edited");
  folder.write("in/z.jpg", smallJpeg(2));
  incoming.once();
  EXPECT_EQ(folder.read("out/z_AE0.jpg").size(), 6u);
  folder.write("in/z.jpg", smallJpeg(3));
  incoming.once({"--overwrite"});
  EXPECT_GT(folder.read("out/z_AE0.jpg").size(), 6u);
}

// Killed when the result had its place and the ledger did not know of it.
TEST(Watch, KnowsItsResultsAfterAKill) {
  if (std::getenv("QUENBY_COMMAND") != nullptr) {
    GTEST_SKIP() << "another command, such as one with sanitizers, makes calls of its own";
  }
  const Incoming incoming;
  const TemporaryFolder& folder = incoming.folder;
  folder.write("in/a.jpg", smallJpeg(1));
  const std::string killed = "strace -f -o " + folder / "trace" +
                             " -e inject=fsync:signal=KILL:when=2 $QUENBY watch " + folder / "in" +
                             " -o " + folder / "out" + " --once --settle 0";
  EXPECT_NE(shell(killed).exitCode, 0);
  if (!folder.has("trace")) GTEST_SKIP() << "strace cannot trace here";
  const Bytes first = folder.read("out/a_AE0.jpg");
  folder.write("in/a.jpg", smallJpeg(2));
  EXPECT_THAT(incoming.once().errors, HasSubstr("1 photos done"));
  EXPECT_NE(folder.read("out/a_AE0.jpg"), first);

  // What another put there meanwhile is theirs.
  folder.write("in/b.jpg", smallJpeg(1));
  EXPECT_NE(shell(killed).exitCode, 0);
  ASSERT_TRUE(folder.has("out/b_AE0.jpg"));
  folder.write("out/b_AE0.jpg", "another's");
  EXPECT_THAT(incoming.once().output, HasSubstr("b_AE0.jpg (exists: left without --overwrite)"));
}

TEST(Watch, GivesAResultToTheFirstOfTwoPhotosOfOneName) {
  const Incoming incoming;
  incoming.folder.write("in/a.jpeg", smallJpeg(1));
  incoming.folder.write("in/a.jpg", smallJpeg(2));
  const Finished run = incoming.once();
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_THAT(run.output, HasSubstr("exists: left"));
  EXPECT_THAT(run.errors, HasSubstr("1 photos done"));
}

TEST(Watch, SeesWhatComesAndEndsCleanly) {
  const Incoming incoming;
  const TemporaryFolder& folder = incoming.folder;
  folder.write("in/first.jpg", smallJpeg(1));
  for (const int signal : {SIGTERM, SIGINT}) {
    Process watch = incoming.start();
    ASSERT_TRUE(incoming.appears("out/first_AE0.jpg"));
    const std::string name = "in/new/" + std::to_string(signal) + ".jpg";
    // Written under another name first, as careful programs do, in a folder that is new as well.
    folder.write("in/new/part.tmp", smallJpeg(signal));
    fs::rename(folder / "in/new/part.tmp", folder / name);
    ASSERT_TRUE(incoming.appears("out/new/" + std::to_string(signal) + "_AE0.jpg"));
    const Finished other = incoming.once();
    EXPECT_EQ(other.exitCode, 2);
    EXPECT_THAT(other.errors, HasSubstr("is in use by another process"));
    watch.send(signal);
    const Finished run = watch.wait();
    EXPECT_EQ(run.exitCode, 0) << run.errors;
    EXPECT_THAT(run.errors, HasSubstr("photos done, 0 failed"));
  }
}

// A file that grows is done when it has come to its end.
TEST(Watch, WaitsForTheEndOfAFile) {
  const Incoming incoming;
  const Bytes photo = smallJpeg(5);
  Process watch = incoming.start();
  Bytes part(photo.begin(), photo.begin() + 200);
  incoming.folder.write("in/a.jpg", part);
  // However slowly the rest comes: what was done of a part is done again.
  std::this_thread::sleep_for(std::chrono::milliseconds(30));
  incoming.folder.write("in/a.jpg", photo);
  ASSERT_TRUE(incoming.appears("out/a_AE0.jpg"));
  watch.send(SIGTERM);
  watch.wait();
  EXPECT_EQ(decoded(incoming.folder.read("out/a_AE0.jpg")).width, 48u);
}

TEST(Watch, GoesOnAfterItWasKilled) {
  const Incoming incoming;
  const TemporaryFolder& folder = incoming.folder;
  folder.write("in/a.jpg", smallJpeg(1));
  ASSERT_EQ(incoming.once().exitCode, 0);
  {
    Process watch = incoming.start();  // killed with its scope, while it has the ledger
    folder.write("in/b.jpg", smallJpeg(2));
    ASSERT_TRUE(incoming.appears("out/b_AE0.jpg"));
  }
  folder.write("in/c.jpg", smallJpeg(3));
  const Finished run = incoming.once();
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_TRUE(folder.has("out/c_AE0.jpg"));
  EXPECT_THAT(run.output, testing::Not(HasSubstr("a.jpg")));
}

TEST(Watch, SetsADamagedLedgerAside) {
  const Incoming incoming;
  incoming.folder.write("in/a.jpg", smallJpeg(1));
  ASSERT_EQ(incoming.once().exitCode, 0);
  incoming.folder.write("out/.quenby-ledger", Bytes(5000, 'x'));
  incoming.folder.write("in/b.jpg", smallJpeg(2));
  const Finished run = incoming.once();
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_THAT(run.errors, HasSubstr("set aside as"));
  EXPECT_TRUE(incoming.folder.has("out/.quenby-ledger.damaged-1"));
  EXPECT_TRUE(incoming.folder.has("out/b_AE0.jpg"));
  EXPECT_THAT(run.errors, HasSubstr("1 photos done"));
}

TEST(Watch, RefusesWhatCannotBeMeant) {
  const Incoming incoming;
  const std::string in = incoming.folder / "in";
  for (const std::vector<std::string>& arguments :
       std::vector<std::vector<std::string>>{{"watch", in},
                                             {"watch", in, "-o", in},
                                             {"watch", in + "/none", "-o", in + "/out"},
                                             {"watch", in, "-o", in + "/out", "--settle", "-1"}}) {
    EXPECT_EQ(quenby(arguments).exitCode, 2) << arguments.back();
  }
  // Results below the photos are none.
  incoming.folder.write("in/a.jpg", smallJpeg(1));
  const std::vector<std::string> inside = {"watch",  in,         "-o", in + "/out",
                                           "--once", "--settle", "0"};
  EXPECT_EQ(quenby(inside).exitCode, 0);
  EXPECT_THAT(quenby(inside).errors, HasSubstr("0 photos done"));
}

}  // namespace
}  // namespace pelorin::test_support

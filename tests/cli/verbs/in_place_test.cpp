#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/stat.h>

#include <algorithm>
#include <cstdlib>

#include "photo/file_io.h"
#include "photo/jpeg/jpeg_codec.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

namespace fs = std::filesystem;
using testing::HasSubstr;

struct Photos {
  Photos() {
    for (const char* name : {"in/a.jpg", "in/sub/b.jpg"}) {
      const std::string path = folder.write(name, old);
      const timespec times[] = {{1'000'000'000, 5}, {1'100'000'000, 7}};
      EXPECT_EQ(::utimensat(AT_FDCWD, path.c_str(), times, 0), 0);
      EXPECT_EQ(::chmod(path.c_str(), 0640), 0);
    }
    EXPECT_EQ(quenby({"enhance", folder / "in/a.jpg", "-o", folder / "expected.jpg"}).exitCode, 0);
    expected = folder.read("expected.jpg");
  }

  Finished enhance(std::vector<std::string> arguments) const {
    arguments.insert(arguments.begin(), {"enhance", "-r", folder / "in", "--in-place"});
    return quenby(arguments);
  }
  struct stat statusOf(const std::string& name) const {
    struct stat status = {};
    EXPECT_EQ(::stat((folder / name).c_str(), &status), 0);
    return status;
  }

  TemporaryFolder folder;
  Bytes old = smallJpeg(), expected;
};

TEST(InPlace, ReplacesPhotosAndUndoRestoresAllOfThem) {
  const Photos photos;
  const struct stat before = photos.statusOf("in/a.jpg");
  ASSERT_EQ(photos.enhance({"--backup", photos.folder / "kept"}).exitCode, 0);
  for (const char* name : {"in/a.jpg", "in/sub/b.jpg"}) {
    EXPECT_EQ(photos.folder.read(name), photos.expected);
    const struct stat after = photos.statusOf(name);
    EXPECT_EQ(after.st_mtim.tv_sec, 1'100'000'000);
    EXPECT_EQ(after.st_mtim.tv_nsec, 7);
    EXPECT_EQ(after.st_mode & 07777, 0640u);
  }
  const Finished plan = quenby({"undo", photos.folder / "kept", "-n"});
  EXPECT_EQ(plan.output, photos.folder / "in/a.jpg" + "\n" + photos.folder / "in/sub/b.jpg" + "\n");
  EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.expected);
  const Finished undone = quenby({"undo", photos.folder / "kept"});
  EXPECT_EQ(undone.exitCode, 0) << undone.errors;
  EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.old);
  EXPECT_EQ(photos.folder.read("in/sub/b.jpg"), photos.old);
  const struct stat restored = photos.statusOf("in/a.jpg");
  EXPECT_EQ(restored.st_ino, before.st_ino);  // the file itself, so all that is to it
  EXPECT_EQ(restored.st_mtim.tv_nsec, 7);
  EXPECT_TRUE(fs::is_empty(photos.folder / "kept"));
  EXPECT_EQ(quenby({"undo", photos.folder / "kept"}).exitCode, 3);
}

// Above 8 MiB a part of a photo and of its result is in memory, unless they come and go by pipes.
TEST(InPlace, ReplacesAndShowsALongPhotoAsAnyOther) {
  const TemporaryFolder folder;
  const Image<RGBA8Pixel> noise = noisePicture(1700, 50, 1), picture(1700, 1700);
  for (std::uint32_t y = 0; y < picture.height; ++y)
    std::copy_n(noise.row(y % noise.height), noise.width, picture.row(y));
  const std::string in = folder / "a.jpg";
  photo::writeFileAtomically(
      in, photo::encodeJpeg(&picture.data.get()->r, 1700, 1700, 100, {}, photo::Chroma::whole));
  const Bytes old = photo::readFile(in);
  ASSERT_GT(old.size(), std::size_t{8} << 20);
  const std::string look = "\"$QUENBY\" look fall --quality auto - -o - < '" + in + "' > '";
  ASSERT_EQ(shell(look + (folder / "expected.jpg") + "'").exitCode, 0);
  const Bytes expected = photo::readFile(folder / "expected.jpg");
  ASSERT_GT(expected.size(), std::size_t{8} << 20);

  const std::string backup = folder / "kept", page = folder / "page.html";
  ASSERT_EQ(quenby({"look", "fall", in, "--in-place", "--backup", backup}).exitCode, 0);
  EXPECT_TRUE(photo::readFile(in) == expected);
  // The record of what it became is that of all of it.
  ASSERT_EQ(quenby({"undo", backup}).exitCode, 0);
  EXPECT_TRUE(photo::readFile(in) == old);

  ASSERT_EQ(quenby({"look", "fall", in, "--in-place", "--no-backup", "--report", page}).exitCode,
            0);
  EXPECT_TRUE(photo::readFile(in) == expected);
  const Bytes shown = photo::readFile(page);
  const std::string text(shown.begin(), shown.end());
  EXPECT_NE(text.find("data:image/jpeg"), std::string::npos);
  EXPECT_EQ(text.find("no picture"), std::string::npos);
}

TEST(InPlace, UndoTakesNoOtherFolderForBackups) {
  const Photos photos;
  for (const std::string& folder : std::vector<std::string>{
           photos.folder / "in", photos.folder / "in/a.jpg", photos.folder / "none"}) {
    const Finished run = quenby({"undo", folder});
    EXPECT_EQ(run.exitCode, 2);
    EXPECT_THAT(run.errors,
                HasSubstr(folder + ": is no folder of backups; name the one given with"));
  }
  EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.old);
}

TEST(InPlace, UndoDestroysNothingThatAnotherProgramMade) {
  const Photos photos;
  const std::string kept = photos.folder / "kept";
  ASSERT_EQ(photos.enhance({"--backup", kept}).exitCode, 0);
  photos.folder.write("in/a.jpg", std::string("painted"));
  const std::string why = photos.folder / "in/a.jpg: was changed by another program since";
  for (const std::vector<std::string>& arguments :
       {std::vector<std::string>{"undo", kept, "-n"}, {"undo", kept}, {"undo", kept}}) {
    const Finished run = quenby(arguments);
    EXPECT_EQ(run.exitCode, 1);
    EXPECT_THAT(run.errors, HasSubstr(why));
  }
  EXPECT_EQ(photos.folder.read("in/a.jpg"), Bytes({'p', 'a', 'i', 'n', 't', 'e', 'd'}));
  EXPECT_EQ(photos.folder.read("in/sub/b.jpg"), photos.old);
  EXPECT_EQ(quenby({"undo", kept, "--force"}).exitCode, 0);
  EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.old);
  EXPECT_TRUE(fs::is_empty(kept));
}

TEST(InPlace, UndoLeavesFilesOfOthersAmongTheBackups) {
  const Photos photos;
  ASSERT_EQ(photos.enhance({"--backup", photos.folder / "kept"}).exitCode, 0);
  const std::string foreign = "kept" + (photos.folder / "in/theirs.jpg");
  photos.folder.write(foreign, smallJpeg(9));
  photos.folder.write("kept/notes.txt", std::string("mine"));
  const Finished undone = quenby({"undo", photos.folder / "kept"});
  EXPECT_EQ(undone.exitCode, 0) << undone.errors;
  EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.old);
  EXPECT_FALSE(photos.folder.has("in/theirs.jpg"));
  EXPECT_TRUE(photos.folder.has(foreign));
  EXPECT_TRUE(photos.folder.has("kept/notes.txt"));
}

TEST(InPlace, UndoTakesWhatWentMissing) {
  const Photos photos;
  ASSERT_EQ(photos.enhance({"--backup", photos.folder / "kept"}).exitCode, 0);
  fs::remove(photos.folder / "in/a.jpg");
  EXPECT_EQ(quenby({"undo", photos.folder / "kept"}).exitCode, 0);
  EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.old);
}

TEST(InPlace, WritesTheFormatOfThePhotoNotOfItsName) {
  const Photos photos;
  const std::string made = photos.folder / "really.png", named = photos.folder / "named.jpg";
  ASSERT_EQ(quenby({"curve", photos.folder / "in/a.jpg", "-o", made}).exitCode, 0);
  fs::rename(made, named);
  ASSERT_EQ(quenby({"enhance", named, "--in-place", "--no-backup"}).exitCode, 0);
  EXPECT_EQ(photos.folder.read("named.jpg")[1], 'P');
}

TEST(Times, AreKeptOrNew) {
  const Photos photos;
  const auto written = [&](const std::string& times) {
    const std::string out = "out-" + times + ".jpg";
    EXPECT_EQ(
        quenby({"enhance", photos.folder / "in/a.jpg", "-o", photos.folder / out, "--times", times})
            .exitCode,
        0);
    return photos.statusOf(out).st_mtim.tv_sec;
  };
  EXPECT_EQ(written("keep"), 1'100'000'000);
  EXPECT_GT(written("now"), 1'100'000'000);
  ASSERT_EQ(photos.enhance({"--no-backup", "--times", "now"}).exitCode, 0);
  EXPECT_GT(photos.statusOf("in/a.jpg").st_mtim.tv_sec, 1'100'000'000);
  EXPECT_EQ(photos.statusOf("in/a.jpg").st_mode & 07777, 0640u);
}

TEST(InPlace, UndoPassesOverWhatAKilledCopyLeft) {
  const Photos photos;
  ASSERT_EQ(photos.enhance({"--backup", photos.folder / "kept"}).exitCode, 0);
  const std::string left = "kept" + (photos.folder / "in/.quenby-1-0.tmp");
  photos.folder.write(left, photos.old);
  EXPECT_EQ(quenby({"undo", photos.folder / "kept"}).exitCode, 0);
  EXPECT_FALSE(photos.folder.has(left));
  EXPECT_FALSE(photos.folder.has("in/.quenby-1-0.tmp"));
}

TEST(InPlace, DoesNoPhotoTwiceWhoseBackupIsThere) {
  const Photos photos;
  const std::string kept = photos.folder / "kept";
  ASSERT_EQ(
      quenby({"enhance", photos.folder / "in/a.jpg", "--in-place", "--backup", kept}).exitCode, 0);
  const Finished again = photos.enhance({"--backup", kept});
  EXPECT_EQ(again.exitCode, 0);
  EXPECT_THAT(again.errors, HasSubstr("1 replaced already, as the backups tell"));
  EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.expected);
  EXPECT_EQ(photos.folder.read("in/sub/b.jpg"), photos.expected);
  EXPECT_EQ(photos.enhance({"--backup", kept}).exitCode, 3);
  EXPECT_THAT(photos.enhance({"--backup", kept, "-n"}).output, HasSubstr("(replaced already"));
}

TEST(InPlace, AsksWhatBecomesOfTheOldPhotos) {
  const Photos photos;
  for (const std::vector<std::string>& arguments :
       {std::vector<std::string>{},
        {"--backup", photos.folder / "kept", "--no-backup"},
        {"--no-backup", "-o", photos.folder / "in"},
        {"--no-backup", "--name", "{stem}.jpg"},
        {"--no-backup", "--scale", "2"},
        {"--backup", photos.folder / "in"}}) {
    const Finished run = photos.enhance(arguments);
    EXPECT_EQ(run.exitCode, 2) << run.errors;
    EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.old);
  }
  EXPECT_EQ(
      quenby({"enhance", photos.folder / "in/a.jpg", "-o", photos.folder / "x.jpg", "--no-backup"})
          .exitCode,
      2);
  EXPECT_EQ(photos.enhance({"--no-backup"}).exitCode, 0);
  EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.expected);
}

// Killed at every call that changes a file, one after the other: about twenty runs.
TEST(InPlace, LeavesOldOrNewPhotosWhenKilledAndGoesOnAfterwards) {
  if (std::getenv("QUENBY_COMMAND") != nullptr) {
    GTEST_SKIP() << "another command, such as one with sanitizers, makes calls of its own";
  }
  const Photos photos;
  fs::remove_all(photos.folder / "in/sub");
  const std::string kept = photos.folder / "kept", trace = photos.folder / "trace";
  const std::string command =
      " $QUENBY enhance -q " + photos.folder / "in/a.jpg" + " --in-place --backup " + kept;
  int kills = 0;
  for (const std::string name : {"mkdir", "fchown", "fchmod", "write", "utimensat", "fsync",
                                 "fdatasync", "link", "rename"}) {
    for (int time = 1;; ++time) {
      const std::string place = name + " " + std::to_string(time);
      const Finished run = shell("strace -f -o " + trace + " -e inject=" + name +
                                 ":signal=KILL:when=" + std::to_string(time) + command);
      if (!photos.folder.has("trace")) GTEST_SKIP() << "strace cannot trace here";
      const Bytes now = photos.folder.read("in/a.jpg");
      EXPECT_TRUE(now == photos.old || now == photos.expected) << place;
      if (run.exitCode != 0) shell(command);
      EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.expected) << place;
      for (const std::string& file : photos.folder.content()) {
        EXPECT_FALSE(file.ends_with(".tmp")) << place;
      }
      EXPECT_EQ(quenby({"undo", kept}).exitCode, 0) << place;
      EXPECT_EQ(photos.folder.read("in/a.jpg"), photos.old) << place;
      if (run.exitCode == 0) break;
      ++kills;
      ASSERT_LT(time, 50);
    }
  }
  EXPECT_GE(kills, 10);
}

}  // namespace
}  // namespace pelorin::test_support

#include <gmock/gmock.h>

#include <algorithm>

#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using testing::HasSubstr;
using testing::IsEmpty;

// The command failed for this one file: one line that names it, the old output as it was, and
// nothing else left behind.
void expectCleanFailure(const TemporaryFolder& folder, const std::string& in,
                        const std::string& reason = "") {
  const std::string out = folder.write("out/old.jpg", std::string("old"));
  const Finished run = quenby({"enhance", in, "-o", out, "--overwrite"});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.output, IsEmpty());
  EXPECT_THAT(run.errors, HasSubstr(in));
  EXPECT_THAT(run.errors, HasSubstr(reason));
  EXPECT_EQ(std::count(run.errors.begin(), run.errors.end(), '\n'), 1) << run.errors;
  EXPECT_EQ(folder.read("out/old.jpg"), (Bytes{'o', 'l', 'd'}));
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder / "out"), {}), 1);
}

TEST(BadFile, ThatIsMissing) {
  const TemporaryFolder folder;
  expectCleanFailure(folder, folder / "none.jpg", "No such file or directory; check the path");
}

TEST(BadFile, ThatIsEmpty) {
  const TemporaryFolder folder;
  expectCleanFailure(folder, folder.write("a.jpg", std::string()), "is empty");
}

TEST(BadFile, ThatIsNotAJpeg) {
  const TemporaryFolder folder;
  expectCleanFailure(folder, folder.write("a.jpg", std::string("hello, this is a text")));
}

TEST(BadFile, ThatIsAFolder) {
  const TemporaryFolder folder;
  const Finished run = quenby({"enhance", folder.makeFolder("a.jpg"), "-o", folder / "b.jpg"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr(folder / "a.jpg"));
  EXPECT_THAT(run.errors, HasSubstr("is a folder; add -r"));
}

TEST(BadFile, ThatIsTruncated) {
  const TemporaryFolder folder;
  const Bytes whole = jpegOf(photoLikePicture(40, 30, 1));
  // The last two bytes mark the end; everything shorter lacks something.
  for (std::size_t size = 1; size < whole.size() - 2; size += 1 + whole.size() / 40) {
    SCOPED_TRACE(size);
    expectCleanFailure(folder, folder.write("a.jpg", Bytes(whole.begin(), whole.begin() + size)));
  }
}

TEST(BadFile, ThatClaimsFarTooManyPixels) {
  const TemporaryFolder folder;
  expectCleanFailure(folder, folder.write("a.jpg", withSize(smallJpeg(), 65500, 65500)),
                     "too large");
}

TEST(BadFile, ThatHas505Scans) {
  const TemporaryFolder folder;
  const Bytes file = makeJpeg({.width = 16,
                               .height = 16,
                               .samples = JCS_GRAYSCALE,
                               .stored = JCS_GRAYSCALE,
                               .horizontalSampling = 1,
                               .verticalSampling = 1,
                               .scans = greyScansBitByBit()});
  expectCleanFailure(folder, folder.write("a.jpg", file), "scans");
}

TEST(BadFile, DoesNotStopTheOthers) {
  const TemporaryFolder folder;
  folder.write("in/1.jpg", smallJpeg());
  folder.write("in/2.jpg", std::string("x"));
  folder.write("in/3.jpg", smallJpeg());
  const Finished run =
      quenby({"enhance", "-r", folder / "in", "-o", folder.makeFolder("out"), "-j", "2"});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.errors, HasSubstr(folder / "in/2.jpg"));
  EXPECT_THAT(run.errors, HasSubstr("2 of 3 photos done, 1 failed"));
  EXPECT_TRUE(folder.has("out/1_AE0.jpg"));
  EXPECT_TRUE(folder.has("out/3_AE0.jpg"));
}

TEST(BadOutput, WithoutItsFolder) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  const Finished run = quenby({"enhance", in, "-o", folder / "none/b.jpg"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr(folder / "none"));
  EXPECT_THAT(run.errors, HasSubstr("make it first"));
}

TEST(BadOutput, BelowAFile) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  const Finished run = quenby({"enhance", in, "-o", in + "/b.jpg"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr(in + ": is not a folder"));
}

TEST(BadOutput, InAFolderThatTakesNoFiles) {
  // Not even the superuser can write there.
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  const Finished run = quenby({"enhance", in, "-o", "/proc/b.jpg"});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.errors, HasSubstr(in + ": /proc/b.jpg cannot be written: "));
}

TEST(BadOutput, OnAFullDisk) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  const Finished special = quenby({"enhance", in, "-o", "/dev/full"});
  EXPECT_EQ(special.exitCode, 1);
  EXPECT_THAT(special.errors, HasSubstr(in + ": /dev/full cannot be written: No space left"));
  const Finished stream = shell("\"$QUENBY\" enhance '" + in + "' -o - > /dev/full");
  EXPECT_EQ(stream.exitCode, 1);
  EXPECT_THAT(stream.errors, HasSubstr("standard output cannot be written: No space left"));
}

TEST(BadOutput, BeyondTheFileSizeLimitLeavesTheOldFile) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", jpegOf(noisePicture(300, 200, 1)));
  const std::string out = folder.write("out/old.jpg", std::string("old"));
  const Finished run =
      shell("ulimit -f 8; \"$QUENBY\" enhance '" + in + "' -o '" + out + "' --overwrite");
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.errors, HasSubstr(in + ": " + out + " cannot be written: File too large"));
  EXPECT_EQ(folder.read("out/old.jpg"), (Bytes{'o', 'l', 'd'}));
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder / "out"), {}), 1);
}

TEST(BadOutput, IntoAClosedPipe) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", jpegOf(noisePicture(600, 400, 1)));
  const Finished run = shell("{ \"$QUENBY\" enhance '" + in + "' -o -; echo code $? >&2; } | true");
  EXPECT_THAT(run.errors, HasSubstr("code 1"));
  EXPECT_THAT(run.errors, HasSubstr("standard output cannot be written"));
}

TEST(BadOutput, OfDataOnAFullDisk) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  const Finished run = shell("\"$QUENBY\" info --json '" + in + "' > /dev/full");
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.errors, HasSubstr("standard output cannot be written"));
}

}  // namespace
}  // namespace pelorin::test_support

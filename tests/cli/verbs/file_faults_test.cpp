#include <gmock/gmock.h>

#include <cstdlib>
#include <string>
#include <utility>
#include <vector>

#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using testing::HasSubstr;
using testing::Not;

class FileFaults : public testing::Test {
 protected:
  void SetUp() override {
    if (std::getenv("QUENBY_COMMAND") != nullptr)
      GTEST_SKIP() << "another command, such as one with sanitizers, makes calls of its own";
    folder.write("in.jpg", photo);
    folder.write("out.jpg", old);
  }

  /// Runs the command in the folder, where the calls that `options` of strace name go wrong.
  Finished traced(const std::string& options, const std::string& arguments) {
    return shell("cd '" + (folder / "") + "' && strace -f -o trace " + options + " $QUENBY " +
                 arguments);
  }

  const TemporaryFolder folder;
  const Bytes photo = smallJpeg(), old = {'o', 'l', 'd'};
};

// One run for each call that a run makes, about sixty.
TEST_F(FileFaults, LeaveTheOldFileOrTheNewOneAndNothingElse) {
  const std::string command = "enhance -q --threads 1 in.jpg -o out.jpg --overwrite";
  ASSERT_EQ(traced("-e trace=none", command).exitCode, 0);
  if (!folder.has("trace")) GTEST_SKIP() << "strace cannot trace here";
  const Bytes expected = folder.read("out.jpg");
  const auto content = folder.content();
  const std::pair<std::string, std::string> faults[] = {{"read", "EIO"},      {"write", "ENOSPC"},
                                                        {"openat", "EMFILE"}, {"fsync", "EIO"},
                                                        {"fdatasync", "EIO"}, {"rename", "EIO"}};
  int failed = 0;
  for (const auto& [call, error] : faults) {
    for (int time = 1;; ++time) {
      ASSERT_LT(time, 200);
      folder.write("out.jpg", old);
      const std::string place = call + " " + std::to_string(time);
      const Finished run = traced("-e trace=" + call + " -e inject=" + call + ":error=" + error +
                                      ":when=" + std::to_string(time),
                                  command);
      EXPECT_EQ(folder.read("out.jpg"), run.exitCode == 0 ? expected : old) << place << run.errors;
      EXPECT_EQ(folder.read("in.jpg"), photo) << place;
      EXPECT_EQ(folder.content(), content) << place;
      if (run.exitCode != 0) ++failed;
      // When none was left to go wrong.
      if (textOf(folder.read("trace")).find("INJECTED") == std::string::npos) break;
    }
  }
  EXPECT_GT(failed, 10);
}

// Whose bytes are read and laid away piece by piece, in the folder of the result.
TEST_F(FileFaults, OfALongPhotoLeaveTheOldFileAndNothingElse) {
  constexpr std::uint32_t width = 2000, height = 1500;
  std::vector<RGBA8Pixel> pixels = randomPixels(std::size_t{width} * height, 1);
  Bytes samples;
  for (const RGBA8Pixel& pixel : pixels) samples.insert(samples.end(), {pixel.r, pixel.g, pixel.b});
  folder.write("long.jpg", makeJpeg({.width = width,
                                     .height = height,
                                     .horizontalSampling = 1,
                                     .verticalSampling = 1,
                                     .quality = 100},
                                    samples));
  const std::string command = "look winter -q long.jpg -o out.jpg --overwrite --quality 100";
  ASSERT_EQ(traced("-e trace=pwrite64,pread64", command).exitCode, 0);
  if (!folder.has("trace")) GTEST_SKIP() << "strace cannot trace here";
  EXPECT_THAT(textOf(folder.read("trace")), HasSubstr("pwrite64("));
  folder.write("out.jpg", old);
  const auto content = folder.content();
  for (const std::string fault :
       {"pread64:error=EIO:when=20", "pread64:error=EIO:when=90", "pread64:retval=0:when=90",
        "pwrite64:error=ENOSPC:when=1", "pwrite64:error=ENOSPC:when=9"}) {
    const std::string call = fault.substr(0, fault.find(':'));
    const Finished run = traced("-e trace=" + call + " -e inject=" + fault, command);
    EXPECT_THAT(textOf(folder.read("trace")), HasSubstr("INJECTED")) << fault;
    EXPECT_EQ(run.exitCode, 1) << fault;
    EXPECT_THAT(run.errors, HasSubstr("long.jpg")) << fault;
    EXPECT_EQ(folder.read("out.jpg"), old) << fault;
    EXPECT_EQ(folder.content(), content) << fault;
  }
}

TEST_F(FileFaults, OfADamagedSecondHalfComeBeforeAnythingIsWritten) {
  Bytes cut = jpegOf(photoLikePicture(400, 300, 3));
  cut.resize(cut.size() / 2);
  folder.write("cut.jpg", cut);
  for (const std::string verb : {"enhance", "look winter"}) {
    for (const std::string memory : {"0", "128"}) {
      const Finished run = traced("-e trace=openat,mkdir,rename,unlink",
                                  verb + " cut.jpg -o out.jpg --overwrite --memory " + memory);
      if (!folder.has("trace")) GTEST_SKIP() << "strace cannot trace here";
      EXPECT_EQ(run.exitCode, 1);
      EXPECT_THAT(run.errors, HasSubstr("cut.jpg"));
      const std::string calls = textOf(folder.read("trace"));
      EXPECT_THAT(calls, HasSubstr("cut.jpg"));
      EXPECT_THAT(calls, Not(HasSubstr("O_CREAT"))) << verb;
      EXPECT_THAT(calls, Not(HasSubstr("out.jpg"))) << verb;
      EXPECT_EQ(folder.read("out.jpg"), old);
    }
  }
}

}  // namespace
}  // namespace pelorin::test_support

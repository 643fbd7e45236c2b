#include <gmock/gmock.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <thread>

#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {
namespace {

bool appears(const TemporaryFolder& folder, const std::string& name) {
  for (int i = 0; i < 6000 && !folder.has(name); ++i) {
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
  return folder.has(name);
}

// The third input is a standard input that never ends, so the command is surely still at work.
TEST(CtrlC, KeepsFinishedFilesAndLeavesNothingHalfWritten) {
  for (const int signal : {SIGINT, SIGTERM}) {
    for (const char* jobs : {"1", "2"}) {
      const TemporaryFolder folder;
      const std::string a = folder.write("a.jpg", smallJpeg(1));
      const std::string b = folder.write("b.jpg", smallJpeg(2));
      const std::string out = folder.makeFolder("out");
      int endless[2];
      ASSERT_EQ(pipe(endless), 0);
      Process process({quenbyPath(), "enhance", a, b, "-", "-o", out, "--json", "-j", jobs},
                      endless[0]);
      ASSERT_TRUE(appears(folder, "out/a_AE0.jpg") && appears(folder, "out/b_AE0.jpg"));
      process.send(signal);
      const Finished run = process.wait();
      close(endless[0]);
      close(endless[1]);
      EXPECT_EQ(run.exitCode, 130);
      EXPECT_THAT(run.errors, testing::HasSubstr("interrupted"));
      EXPECT_EQ(decoded(folder.read("out/a_AE0.jpg")).width, 48u);
      EXPECT_EQ(decoded(folder.read("out/b_AE0.jpg")).width, 48u);
      EXPECT_EQ(std::distance(std::filesystem::directory_iterator(out), {}), 2);
    }
  }
}

}  // namespace
}  // namespace pelorin::test_support

#include <fcntl.h>
#include <gmock/gmock.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <thread>

#include "tests/cli/parsed_json.h"
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

// Stopped, it finds both signals at once when it goes on: the second ends it where it is.
TEST(CtrlC, ForcedEndsTheListOfWhatWasDone) {
  for (const bool something : {true, false}) {
    const TemporaryFolder folder;
    std::vector<std::string> command = {quenbyPath(), "enhance", "--json", "-o", folder / "out/"};
    if (something) command.push_back(folder.write("a.jpg", smallJpeg(1)));
    command.insert(command.end(), {"-", "-j", "1"});
    if (!something) command.push_back(folder.write("never-reached.jpg", smallJpeg(1)));
    int endless[2];
    ASSERT_EQ(pipe(endless), 0);
    Process process(command, endless[0]);
    ASSERT_TRUE(!something || appears(folder, "out/a_AE0.jpg"));
    std::this_thread::sleep_for(std::chrono::milliseconds(100));  // and tells of it
    for (const int signal : {SIGSTOP, SIGINT, SIGTERM, SIGCONT}) process.send(signal);
    const Finished run = process.wait();
    close(endless[0]);
    close(endless[1]);
    EXPECT_EQ(run.exitCode, 130);
    EXPECT_EQ(parsedJson(run.output).size(), something ? 1u : 0u) << run.output;
  }
}

// The exact filter would be at it for minutes and looks up at nothing.
TEST(CtrlC, EndsWorkThatDoesNotStopOfItself) {
  const TemporaryFolder folder;
  int input[2];
  ASSERT_EQ(pipe2(input, O_CLOEXEC), 0);
  Process process(
      {quenbyPath(), "masks", "-", "--raw", "1500x1500", "--exact", "-o", folder / "masks"},
      input[0]);
  close(input[0]);
  const Bytes pixels(std::size_t{1500} * 1500 * 4);
  for (std::size_t at = 0; at < pixels.size();) {
    const ssize_t count = write(input[1], pixels.data() + at, pixels.size() - at);
    ASSERT_GT(count, 0);
    at += static_cast<std::size_t>(count);
  }
  close(input[1]);
  std::this_thread::sleep_for(std::chrono::milliseconds(100));
  process.send(SIGTERM);
  const Finished run = process.wait();
  EXPECT_EQ(run.exitCode, 130);
  EXPECT_THAT(run.errors, testing::HasSubstr("interrupted"));
  EXPECT_THAT(folder.content(), testing::IsEmpty());
}

TEST(CtrlC, EndsWaitingForThePartnerOfAPipe) {
  const TemporaryFolder folder;
  const std::string photo = folder.write("a.jpg", smallJpeg()), pipe = folder / "pipe";
  ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
  const int null = open("/dev/null", O_RDONLY | O_CLOEXEC);
  for (const std::vector<std::string>& command :
       {std::vector<std::string>{quenbyPath(), "enhance", photo, "-o", pipe},
        {quenbyPath(), "enhance", pipe, "-o", folder / "b.jpg"}}) {
    Process process(command, null);
    std::this_thread::sleep_for(std::chrono::milliseconds(200));
    process.send(SIGINT);
    EXPECT_EQ(process.wait().exitCode, 130);
  }
  close(null);
  EXPECT_THAT(folder.content(), testing::ElementsAre("a.jpg", "pipe"));
}

}  // namespace
}  // namespace pelorin::test_support

#include "cli/frame/each_photo.h"

#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <new>

#include "cli/frame/errors.h"
#include "cli/frame/interrupt.h"

namespace pelorin::cli {
namespace {

std::vector<Input> photosCalled(const std::vector<std::string>& names) {
  std::vector<Input> photos;
  for (const std::string& name : names) photos.push_back({name, {}});
  return photos;
}

TEST(EachPhoto, HandsOnResultsAndReasonsInTheOrderOfThePhotos) {
  const std::vector<Input> photos = photosCalled({"a.jpg", "b.jpg", "c.jpg", "-"});
  std::vector<std::string> told;
  Talk talk("test", /*quiet=*/true, photos.size());
  testing::internal::CaptureStderr();
  const PhotoTally tally = eachPhoto<int>(
      photos, 3, talk,
      {.work = [](std::size_t index) -> int {
         if (index == 1) throw FileError("is odd");
         if (index == 3) throw std::bad_alloc();
         return 40 + static_cast<int>(index);
       },
       .done = [&](std::size_t index,
                   int result) { told.push_back(photos[index].path + std::to_string(result)); },
       .failed = [&](std::size_t index,
                     const std::string& reason) { told.push_back(photos[index].path + reason); },
       .failure = "no number: "});
  const std::string said = testing::internal::GetCapturedStderr();
  ASSERT_EQ(told.size(), 4u);
  EXPECT_EQ(told[0], "a.jpg40");
  EXPECT_EQ(told[1], "b.jpgno number: is odd");
  EXPECT_EQ(told[2], "c.jpg42");
  EXPECT_NE(told[3].find("not enough memory"), std::string::npos);
  EXPECT_EQ(said.substr(0, said.find('\n')), "quenby test: b.jpg: no number: is odd");
  EXPECT_NE(said.find("standard input: no number: not enough memory"), std::string::npos);
  EXPECT_EQ(tally.photos, 4u);
  EXPECT_EQ(tally.done, 2u);
  EXPECT_EQ(tally.failed, 2u);
  EXPECT_FALSE(tally.interrupted);
  EXPECT_EQ(tally.exitCode(talk), ExitCode::someFailed);
}

TEST(EachPhoto, SaysThatThereIsNone) {
  Talk talk("test", /*quiet=*/false, 0);
  const PhotoTally tally =
      eachPhoto<int>({}, 2, talk, {.work = [](std::size_t) { return 1; }, .done = {}});
  testing::internal::CaptureStderr();
  EXPECT_EQ(tally.exitCode(talk), ExitCode::nothingToDo);
  EXPECT_NE(testing::internal::GetCapturedStderr().find("no photos found"), std::string::npos);
}

// What is interrupted stays so, hence a process of its own.
TEST(EachPhoto, StartsNoMoreOnceItIsInterrupted) {
  testing::FLAGS_gtest_death_test_style = "threadsafe";
  const auto loop = [] {
    installInterruptHandler();
    std::vector<std::size_t> done;
    std::size_t worked = 0;
    Talk talk("test", /*quiet=*/true, 5);
    const auto work = [&](std::size_t index) {
      ++worked;
      if (index == 1) std::raise(SIGINT);
      return 1;
    };
    const PhotoTally tally = eachPhoto<int>(
        photosCalled({"a", "b", "c", "d", "e"}), 1, talk,
        {.work = work, .done = [&](std::size_t index, int) { done.push_back(index); }});
    const bool right = worked == 2 && done == std::vector<std::size_t>{0, 1} && tally.interrupted &&
                       tally.failed == 0 && tally.exitCode(talk) == ExitCode::interrupted;
    std::exit(right ? 0 : 1);
  };
  EXPECT_EXIT(loop(), testing::ExitedWithCode(0), "");
}

}  // namespace
}  // namespace pelorin::cli

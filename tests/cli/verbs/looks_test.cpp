#include <gmock/gmock.h>

#include <sstream>

#include "image_processing/filters/default_filter_factory.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"

namespace pelorin::test_support {
namespace {

using image_processing::DefaultFilterFactory;

TEST(LooksVerb, ListsEveryLookInALine) {
  const Finished run = quenby({"looks"});
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_EQ(run.errors, "");
  std::istringstream lines(run.output);
  std::size_t count = 0;
  for (const auto& [name, look] : DefaultFilterFactory::filterFactory()->descriptions) {
    std::string line, shownName, shownDisplayName;
    ASSERT_TRUE(std::getline(lines, line));
    std::istringstream(line) >> shownName >> shownDisplayName;
    EXPECT_EQ(shownName, name);
    EXPECT_EQ(shownDisplayName, look->displayName);
    EXPECT_TRUE(line.ends_with("  " + look->description)) << line;
    ++count;
  }
  EXPECT_EQ(count, 10u);
  EXPECT_EQ(std::count(run.output.begin(), run.output.end(), '\n'), 10);
}

TEST(LooksVerb, ListsThemAsJson) {
  const auto list = parsedJson(quenby({"looks", "--json"}).output);
  ASSERT_EQ(list.size(), 10u);
  EXPECT_EQ(
      list[9],
      (nlohmann::json{{"name", "ZebraBW"},
                      {"displayName", "Snow"},
                      {"description", "Black-and-white filter with softlight radial vignette."}}));
  std::istringstream lines(quenby({"looks", "--jsonl"}).output);
  for (const nlohmann::json& look : list) {
    std::string line;
    ASSERT_TRUE(std::getline(lines, line));
    EXPECT_EQ(parsedJson(line), look);
  }
}

TEST(LooksVerb, TakesNoFiles) {
  EXPECT_EQ(quenby({"looks", "a.jpg"}).exitCode, 2);
  EXPECT_EQ(quenby({"looks", "--json", "--jsonl"}).exitCode, 2);
}

}  // namespace
}  // namespace pelorin::test_support

#include <gmock/gmock.h>

#include <fstream>
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
  std::ptrdiff_t count = 0;
  for (const auto& [name, look] : DefaultFilterFactory::filterFactory()->descriptions) {
    std::string line, shownName, shownDisplayName;
    ASSERT_TRUE(std::getline(lines, line));
    std::istringstream(line) >> shownName >> shownDisplayName;
    EXPECT_EQ(shownName, name);
    EXPECT_EQ(shownDisplayName, look->displayName);
    EXPECT_TRUE(line.ends_with("  " + look->description)) << line;
    ++count;
  }
  EXPECT_GE(count, 10);
  EXPECT_EQ(std::count(run.output.begin(), run.output.end(), '\n'), count);
}

TEST(LooksVerb, ListsThemAsJson) {
  const auto list = parsedJson(quenby({"looks", "--json"}).output);
  ASSERT_EQ(list.size(), DefaultFilterFactory::filterFactory()->descriptions.size());
  const nlohmann::json& snow = list.back();
  EXPECT_EQ(snow.at("name"), "ZebraBW");
  EXPECT_EQ(snow.at("displayName"), "Snow");
  EXPECT_EQ(snow.at("description"), "Black-and-white filter with softlight radial vignette.");
  EXPECT_EQ(snow.at("usesFaces"), false);
  EXPECT_EQ(list[0].at("usesFaces"), true);
  std::istringstream lines(quenby({"looks", "--jsonl"}).output);
  for (const nlohmann::json& look : list) {
    std::string line;
    ASSERT_TRUE(std::getline(lines, line));
    EXPECT_EQ(parsedJson(line), look);
  }
}

TEST(LooksVerb, TellsProgramsOfEveryParameter) {
  const auto list = parsedJson(quenby({"looks", "--json"}).output);
  std::size_t at = 0;
  for (const auto& [name, look] : DefaultFilterFactory::filterFactory()->descriptions) {
    const auto& rows = list[at++].at("parameters");
    const auto parameters = look->parameters();
    ASSERT_EQ(rows.size(), parameters.rows.size()) << name;
    for (std::size_t i = 0; i < rows.size(); ++i) {
      EXPECT_EQ(rows[i].at("name"), parameters.rows[i].name);
      EXPECT_EQ(rows[i].at("description"), parameters.rows[i].description);
    }
  }
  const auto& enhancement = list[0].at("parameters");
  EXPECT_EQ(enhancement[0], parsedJson(R"({"name": "slider", "kind": "number", "minimum": 0.0,
    "maximum": 1.0, "default": 0.4, "required": true, "option": "--slider",
    "description": "Strength of the enhancement"})"));
  EXPECT_EQ(enhancement[2].at("onlyWith"), "gtmOnly");
  EXPECT_EQ(enhancement[2].at("true"), "true");
  const auto& snow = list.back().at("parameters");
  EXPECT_EQ(snow[0].at("exclusiveMinimum"), 0.0);
  EXPECT_EQ(snow[0].at("default").dump(), "2.28");
  EXPECT_EQ(snow[2].at("default"), true);
  EXPECT_EQ(snow[2].at("false"), "0");
  EXPECT_EQ(snow[3].at("kind"), "numbers");
  EXPECT_EQ(snow[3].at("minItems"), 2);
  EXPECT_TRUE(snow[3].at("default").is_null());
}

TEST(LooksVerb, PrintsThePageOfTheDocumentation) {
  std::ifstream file(FILTERS_PAGE);
  ASSERT_TRUE(file) << FILTERS_PAGE;
  std::stringstream page;
  page << file.rdbuf();
  EXPECT_EQ(quenby({"looks", "--markdown"}).output, page.str())
      << "write it anew: quenby looks --markdown > docs/filters.md";
}

TEST(LooksVerb, TakesNoFiles) {
  EXPECT_EQ(quenby({"looks", "a.jpg"}).exitCode, 2);
  EXPECT_EQ(quenby({"looks", "--json", "--jsonl"}).exitCode, 2);
  EXPECT_EQ(quenby({"looks", "--json", "--markdown"}).exitCode, 2);
}

}  // namespace
}  // namespace pelorin::test_support

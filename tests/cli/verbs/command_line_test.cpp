#include <gmock/gmock.h>

#include "cli/frame/json_output.h"
#include "tests/cli/quenby_process.h"

namespace pelorin::test_support {
namespace {

using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

TEST(CommandLine, PrintsItsVersion) {
  for (const char* option : {"--version", "-V"}) {
    const Finished run = quenby({option});
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_THAT(run.output, testing::MatchesRegex("quenby [0-9]+\\.[0-9]+\\.[0-9]+\n"));
  }
}

TEST(CommandLine, TellsHowItWasBuilt) {
  const Finished run = quenby({"--version", "--json"});
  EXPECT_EQ(run.exitCode, 0);
  const cli::Json facts = cli::Json::parse(run.output);
  EXPECT_EQ("quenby " + facts["version"].get<std::string>() + "\n", quenby({"-V"}).output);
  EXPECT_THAT(facts["compiler"].get<std::string>(), HasSubstr("."));
  EXPECT_THAT(facts["instructionSets"], testing::Contains(facts["instructionSet"]));
  for (const char* library : {"highway", "lcms2", "libpng", "pugixml", "sqlite3", "zlib"}) {
    EXPECT_THAT(facts["libraries"][library].get<std::string>(),
                testing::ContainsRegex("^[0-9]+[.][0-9]+"))
        << library;
  }
}

TEST(CommandLine, TakesJsonBehindTheVerbAlone) {
  const Finished run = quenby({"--json", "looks"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, StartsWith("quenby: --json goes behind the verb"));
}

TEST(CommandLine, HelpsWithAListOfVerbs) {
  for (const std::vector<std::string>& arguments :
       {std::vector<std::string>{"--help"}, {"-h"}, {"help"}}) {
    const Finished run = quenby(arguments);
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_THAT(run.output, HasSubstr("enhance"));
    EXPECT_THAT(run.output, HasSubstr("Examples:\n  quenby enhance photo.jpg -o better.jpg"));
  }
}

TEST(CommandLine, HelpsWithExamplesForAVerb) {
  for (const std::string verb : {"enhance", "info"}) {
    const Finished run = quenby({verb, "--help"});
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_THAT(run.output, HasSubstr("Examples:\n  quenby " + verb));
    EXPECT_EQ(quenby({"help", verb}).output, run.output);
  }
}

TEST(CommandLine, WithoutArgumentsShowsTheHelpAsAnError) {
  const Finished run = quenby({});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.output, IsEmpty());
  EXPECT_THAT(run.errors, HasSubstr("enhance"));
}

TEST(CommandLine, NamesTheNearestVerb) {
  const Finished run = quenby({"enhnce", "a.jpg"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, StartsWith("quenby: unknown verb 'enhnce'; did you mean 'enhance'?"));
}

TEST(CommandLine, NamesNoVerbThatIsFar) {
  const Finished run = quenby({"frobnicate"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, StartsWith("quenby: unknown verb 'frobnicate' (see quenby --help)"));
}

TEST(CommandLine, NamesTheNearestOption) {
  const Finished run = quenby({"enhance", "a.jpg", "-o", "b.jpg", "--slidr", "0.4"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr("unknown option '--slidr'; did you mean '--slider'?"));
}

TEST(CommandLine, NamesTheNearestFilterBeforeAnyWork) {
  const Finished run = quenby({"enhance", "no.jpg", "-o", "b.jpg", "--filter", "AE1"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr("unknown filter 'AE1'; did you mean 'AE0'?"));
}

// Every one of these is refused in one line before any work: no.jpg does not even exist.
TEST(CommandLine, RefusesWrongOptionsInOneLine) {
  const std::vector<std::vector<std::string>> wrong = {
      {"--slider", "nan"},
      {"--slider", "inf"},
      {"--slider", "1.5"},
      {"--slider", "-0.1"},
      {"--slider", "0.4x"},
      {"--slider", ""},
      {"--face", "0,0,1"},
      {"--face", "0,0,1,nan"},
      {"--face", "0.6,0.1,0.4,0.4"},
      {"--face", "100,50,300,0.9"},
      {"--face", "0.1,0.1,0.4,0.4", "--filter", "PassThrough"},
      {"--rotate", "45"},
      {"--rotate", "x"},
      {"--scale", "3"},
      {"--scale", "16"},
      {"--quality", "0"},
      {"--quality", "101"},
      {"-j", "-1"},
      {"--params", "slidr=0.4;"},
      {"--params", "gtmOnly=true;"},
      {"--params", "slider=x;"},
      {"--params", "slider=0.4;", "--slider", "0.4"},
      {"--params", "slider=0.4;", "--global-only"},
      {"--filter", "PassThrough", "--slider", "0.4"},
      {"--filter", "PassThrough", "--global-only"},
      {"--raw", "5"},
      {"--raw", "0x5"},
      {"--raw", "5x5", "--scale", "2"},
      {"--json", "--jsonl"},
  };
  for (const std::vector<std::string>& options : wrong) {
    std::vector<std::string> arguments = {"enhance", "no.jpg", "-o", "b.jpg"};
    arguments.insert(arguments.end(), options.begin(), options.end());
    const Finished run = quenby(arguments);
    const std::string said = options[0] + " " + options.back() + ": " + run.errors;
    EXPECT_EQ(run.exitCode, 2) << said;
    EXPECT_THAT(run.output, IsEmpty());
    EXPECT_THAT(run.errors, StartsWith("quenby enhance: ")) << said;
    EXPECT_EQ(std::count(run.errors.begin(), run.errors.end(), '\n'), 1) << said;
    EXPECT_THAT(run.errors, testing::Not(HasSubstr("no.jpg"))) << said;
  }
}

TEST(CommandLine, AcceptsANegativeTurn) {
  EXPECT_EQ(quenby({"enhance", "/dev/null", "-o", "b.jpg", "-n", "--rotate", "-90"}).exitCode, 0);
}

}  // namespace
}  // namespace pelorin::test_support

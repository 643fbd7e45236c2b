#include <gmock/gmock.h>

#include <algorithm>

#include "image_processing/filters/default_filter_factory.h"
#include "tests/cli/filtered_directly.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::DefaultFilterFactory;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

using Options = std::vector<std::string>;

/// `quenby look LOOK` of raw pixels through standard input and output.
Finished lookOf(const Image<RGBA8Pixel>& picture, const std::string& look, const Options& options) {
  const std::string size = std::to_string(picture.width) + "x" + std::to_string(picture.height);
  Options arguments = {"look", look, "--raw", size, "-", "-o", "-"};
  arguments.insert(arguments.end(), options.begin(), options.end());
  return quenby(arguments, rawBytes(picture));
}

/// A command line that must be refused before any work: no.jpg does not even exist.
Finished refused(const std::string& look, const Options& options) {
  Options arguments = {"look", look, "no.jpg", "-o", "out.jpg"};
  arguments.insert(arguments.end(), options.begin(), options.end());
  return quenby(arguments);
}

TEST(LookVerb, GivesTheEnginesBytesForEveryLookUnderBothItsNames) {
  const Image<RGBA8Pixel> picture = photoLikePicture(97, 61, 3);
  for (const auto& [name, look] : DefaultFilterFactory::filterFactory()->descriptions) {
    const bool enhancement = name.starts_with("AE0");
    const Bytes expected = filteredDirectly(picture, name, enhancement ? "slider=0.4;" : "");
    for (const std::string& asked : {name, look->displayName}) {
      if (asked == "Auto" && name != "AE0") continue;
      const Finished run = lookOf(picture, asked, {});
      EXPECT_EQ(run.exitCode, 0) << run.errors;
      EXPECT_TRUE(Bytes(run.output.begin(), run.output.end()) == expected) << asked;
    }
  }
}

TEST(LookVerb, HandsItsSettingsToTheEngine) {
  const Image<RGBA8Pixel> picture = photoLikePicture(97, 61, 5);
  struct Case {
    std::string look, filter;
    Options options;
    std::string params;
  };
  const std::vector<Case> cases = {
      {"WINTER", "WinterRGB", {"--no-mask"}, "applyMask=0;"},
      {"snow", "ZebraBW", {"--mask-radius", "0.7"}, "maskRadius=0.7;"},
      {"snow", "ZebraBW", {"--mask-alpha", "0.25", "--mask"}, "maskAlpha=0.25;applyMask=1;"},
      {"Vintage", "VintageRGB", {"--r", "0,0.5,1"}, "r=0,0.5,1,;"},
      {"Vintage", "VintageRGB", {"--r", "0,0.5,1,"}, "r=0,0.5,1,;"},
      {"fall", "FallRGB", {"--g", "1,0", "--b", ".2,1e-1,1"}, "g=1,0,;b=.2,1e-1,1,;"},
      {"starfish",
       "LowDimRGBCurve",
       {"--s1", "0.1", "--s2", "0.9", "--s3", "1", "--s4", "0"},
       "s1=0.1;s2=0.9;s3=1;s4=0;"},
      {"starfish",
       "LowDimRGBCurve",
       {"--mask", "--mask-alpha", "0.5", "--mask-radius", "2"},
       "applyMask=1;maskAlpha=0.5;maskRadius=2;"},
      {"starfish", "LowDimRGBCurve", {"--no-mask", "--b", "0,1"}, "b=0,1,;"},
      {"ae08BIT", "AE08bit", {"--slider", "0.9"}, "slider=0.9;"},
      {"ae0",
       "AE0",
       {"--global-only", "--gtm-extra-memory"},
       "slider=0.4;gtmOnly=true;gtmExtraMemory=true;"},
      {"summer", "SummerRGB", {"--params", "maskAlpha=7;r=0,2,;"}, "maskAlpha=7;r=0,2,;"},
      {"summer", "SummerRGB", {"--params", ""}, ""},
      {"Auto", "AE0", {"--params", "slider=0.4;gtmOnly=true;"}, "slider=0.4;gtmOnly=true;"},
  };
  for (const Case& c : cases) {
    const Finished run = lookOf(picture, c.look, c.options);
    EXPECT_EQ(run.exitCode, 0) << run.errors;
    const Bytes expected = filteredDirectly(picture, c.filter, c.params);
    EXPECT_TRUE(Bytes(run.output.begin(), run.output.end()) == expected)
        << c.look << testing::PrintToString(c.options);
    const std::string plainParams = c.filter.starts_with("AE0") ? "slider=0.4;" : "";
    const bool changesSomething = c.options != Options{"--params", ""};
    EXPECT_EQ(expected != filteredDirectly(picture, c.filter, plainParams), changesSomething)
        << "a setting without effect tests nothing: " << c.look;
  }
}

TEST(LookVerb, WritesJpegFilesOfAFolderUnderTheNameOfTheLook) {
  const TemporaryFolder folder;
  folder.write("in/a.jpg", smallJpeg(1));
  folder.write("in/deep/b.jpg", smallJpeg(2));
  const std::string out = folder.makeFolder("out");
  const Finished run =
      quenby({"look", "winter", "-r", folder / "in", "-o", out, "-j", "2", "--no-mark"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  ASSERT_TRUE(folder.has("out/deep/b_WinterRGB.jpg"));
  Image<RGBA8Pixel> source = decoded(smallJpeg(1));
  const Bytes expected = filteredDirectly(source, "WinterRGB", "");
  std::copy(expected.begin(), expected.end(), &source.data.get()->r);
  EXPECT_EQ(folder.read("out/a_WinterRGB.jpg"), jpegOf(source));

  const Options named = {"look", "winter", "-r",     folder / "in",
                         "-o",   out,      "--name", "{stem}-{look}.jpg"};
  EXPECT_EQ(quenby(named).exitCode, 0);
  EXPECT_TRUE(folder.has("out/a-Winter.jpg"));
  EXPECT_EQ(quenby(named).exitCode, 3);  // all there already
}

TEST(LookVerb, PlansAndReports) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  const Finished plan = quenby({"look", "snow", in, "-o", folder / "b.jpg", "-n"});
  EXPECT_EQ(plan.output, in + " -> " + folder / "b.jpg" + "\n");
  EXPECT_THAT(folder.content(), ElementsAre("a.jpg"));
  const Finished run = quenby(
      {"look", "snow", in, "-o", folder / "b.jpg", "--json", "--mask-radius", "2", "--r", "0,1"});
  const auto report = parsedJson(run.output);
  EXPECT_EQ(report.at("status"), "done");
  EXPECT_EQ(report.at("filter"), "ZebraBW");
  EXPECT_EQ(report.at("params"), "maskRadius=2;r=0,1,;");
}

TEST(LookVerb, SaysWhichOfTwoFiltersADisplayNameIsTakenFor) {
  const Image<RGBA8Pixel> picture = photoLikePicture(16, 12, 1);
  EXPECT_EQ(lookOf(picture, "auto", {}).errors,
            "note: 'auto' is taken for AE0; AE08bit has the same display name\n");
  EXPECT_THAT(lookOf(picture, "auto", {"-q"}).errors, IsEmpty());
  for (const char* name : {"AE0", "ae08bit", "Winter"}) {
    EXPECT_THAT(lookOf(picture, name, {}).errors, IsEmpty());
  }
}

TEST(LookVerb, NamesTheNearestOfAnUnknownLook) {
  const Finished run = refused("wintr", {});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, StartsWith("quenby look: unknown look 'wintr'; did you mean 'Winter'?"));
}

TEST(LookVerb, WarnsOfACurveOfOneSampleAndIgnoresIt) {
  const Image<RGBA8Pixel> picture = photoLikePicture(31, 20, 1);
  const Bytes expected = filteredDirectly(picture, "FallRGB", "");
  const std::string wanted = " wants 2 or more numbers from 0 to 1, a comma after each; ";
  for (const auto& [options, warning] : std::vector<std::pair<Options, std::string>>{
           {{"--r", "0.5"}, "note: r of FallRGB" + wanted + "a shorter list is ignored\n"},
           {{"--b", "1,"}, "note: b of FallRGB" + wanted + "a shorter list is ignored\n"},
           {{"--params", "g=0.5,;"},
            "note: --params: g of FallRGB" + wanted + "a shorter list is ignored\n"},
           {{"--params", "g=0,1;"},
            "note: --params: g of FallRGB" + wanted + "'1' has no comma and is ignored\n" +
                "note: --params: g of FallRGB" + wanted + "a shorter list is ignored\n"}}) {
    const Finished run = lookOf(picture, "fall", options);
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_EQ(run.errors, warning);
    EXPECT_TRUE(Bytes(run.output.begin(), run.output.end()) == expected) << warning;
  }
}

TEST(LookVerb, RefusesSettingsWithoutEffect) {
  const std::vector<std::tuple<std::string, Options, std::string>> cases = {
      {"winter", {"--s1", "0.5"}, "--s1: has no effect on WinterRGB"},
      {"winter", {"--slider", "0.5"}, "--slider: has no effect on WinterRGB"},
      {"winter", {"--face", "0,0,1,1"}, "--face: has no effect on WinterRGB"},
      {"auto", {"--gtm-extra-memory"}, "has no effect on AE0 without --global-only"},
      {"auto", {"--no-mask"}, "--no-mask: has no effect on AE0"},
      {"auto", {"--s4", "1"}, "--s4: has no effect on AE0"},
      {"original", {"--r", "0,1"}, "--r: has no effect on PassThrough"},
      {"starfish", {"--mask-radius", "2"}, "has no effect on LowDimRGBCurve without --mask"},
      {"starfish", {"--mask-alpha", "1"}, "has no effect on LowDimRGBCurve without --mask"},
      {"winter", {"--no-mask", "--mask-radius", "2"}, "--mask-radius"},
      {"winter", {"--no-mask", "--mask"}, "--mask"},
      {"winter", {"--params", "r=0,1,;", "--mask"}, "--params: takes the place of --mask"},
      {"winter", {"--params", "s1=0.4;"}, "WinterRGB has no parameter 's1'"},
      {"winter", {"--params", "maskradius=1;"}, "'maskradius'; it takes maskRadius, "},
      {"winter", {"--params", "mask;"}, "WinterRGB has no parameter 'mask'"},
      {"original", {"--params", "r=0,1,;"}, "PassThrough takes no parameters"},
      {"auto", {"--params", "gtmOnly=true;"}, "AE0 needs slider, a number from 0 to 1"},
  };
  for (const auto& [look, options, message] : cases) {
    const Finished run = refused(look, options);
    EXPECT_EQ(run.exitCode, 2) << look << testing::PrintToString(options);
    EXPECT_THAT(run.errors, StartsWith("quenby look: "));
    EXPECT_THAT(run.errors, HasSubstr(message));
    EXPECT_EQ(std::count(run.errors.begin(), run.errors.end(), '\n'), 1) << run.errors;
  }
}

TEST(LookVerb, RefusesValuesThatAreNone) {
  const std::vector<Options> wrong = {
      {"--mask-radius", "0"},
      {"--mask-radius", "-1"},
      {"--mask-radius", "inf"},
      {"--mask-radius", "x"},
      {"--mask-alpha", "1.1"},
      {"--mask-alpha", "nan"},
      {"--mask-alpha", ""},
      {"--r", ""},
      {"--r", ","},
      {"--g", "0,,1"},
      {"--b", "0,1,,"},
      {"--b", "0,255"},
      {"--r", "-0.1,1"},
      {"--r", "0;1"},
      {"--r", "0, 1"},
      {"--r", "0,1;b=0,1"},
      {"--r"},
      {"--r", "0,1", "--r", "0,1"},
  };
  for (const Options& options : wrong) {
    const Finished run = refused("summer", options);
    EXPECT_EQ(run.exitCode, 2) << testing::PrintToString(options);
    EXPECT_THAT(run.errors, StartsWith("quenby look: "));
    EXPECT_EQ(std::count(run.errors.begin(), run.errors.end(), '\n'), 1) << run.errors;
    EXPECT_THAT(run.errors, testing::Not(HasSubstr("no.jpg"))) << run.errors;
  }
  for (const char* text : {"-0.1", "1.1", "nan", "0.5x"}) {
    EXPECT_EQ(refused("StarFish", {"--s2", text}).exitCode, 2) << text;
    EXPECT_EQ(refused("AE0", {"--slider", text}).exitCode, 2) << text;
  }
}

TEST(LookVerb, NeedsALookAndAPhoto) {
  EXPECT_EQ(quenby({"look"}).exitCode, 2);
  EXPECT_EQ(quenby({"look", "winter"}).exitCode, 2);
  EXPECT_EQ(quenby({"look", "winter", "no.jpg"}).exitCode, 1);
  EXPECT_THAT(quenby({"look", "--help"}).output, HasSubstr("Examples:\n  quenby look "));
}

}  // namespace
}  // namespace pelorin::test_support

#include "image_processing/filters/parameter_check.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/pass_through.h"
#include "tests/support/comma_locale.h"

namespace pelorin::image_processing {
namespace {

using Kind = ParameterFault::Kind;
using testing::HasSubstr;
using testing::IsEmpty;

const FilterDescription& builtIn(const std::string& name) {
  return *DefaultFilterFactory::filterFactory()->find(name);
}

/// The only fault of a text that must have exactly one.
ParameterFault faultOf(const std::string& filter, const std::string& params) {
  const std::vector<ParameterFault> faults = checkParameters(builtIn(filter), params);
  EXPECT_EQ(faults.size(), 1u) << filter << " " << params;
  return faults.empty() ? ParameterFault{} : faults[0];
}

TEST(ParameterCheck, FindsNothingInWhatAFilterReadsAsItLooks) {
  for (const auto& [filter, params] : std::vector<std::pair<std::string, std::string>>{
           {"AE0", "slider=0.4;"},
           {"AE0", "slider=1"},  // the last item needs no ';' here
           {"AE08bit", ";;slider=0;gtmOnly=true;gtmExtraMemory=false;"},
           {"PassThrough", ""},
           {"WinterRGB", ""},
           {"WinterRGB", "r=0,0.5,1,;applyMask=0;"},
           {"LowDimRGBCurve", "s1=0.3;s4=+1e0;maskRadius=2.5;applyMask=2;;"}}) {
    EXPECT_THAT(checkParameters(builtIn(filter), params), IsEmpty()) << filter << " " << params;
  }
}

TEST(ParameterCheck, NamesWhatAFilterTakesWhenAKeyIsUnknown) {
  const ParameterFault fault = faultOf("AE0", "slider=0.4;gtmonly=true;");
  EXPECT_EQ(fault.kind, Kind::unknown);
  EXPECT_EQ(fault.key, "gtmonly");
  EXPECT_EQ(fault.message,
            "AE0 has no parameter 'gtmonly'; it takes slider, gtmOnly and gtmExtraMemory");
  EXPECT_EQ(faultOf("PassThrough", "r=0,1,;").message, "PassThrough takes no parameters");
  EXPECT_EQ(faultOf("PassThrough", "r=0,1,").kind, Kind::unknown);
  EXPECT_EQ(faultOf("WinterRGB", "s1=0.3;").kind, Kind::unknown);
  EXPECT_EQ(faultOf("WinterRGB", " applyMask=0;").kind, Kind::unknown);  // nothing is trimmed
  EXPECT_EQ(faultOf("WinterRGB", "mask;").key, "mask");
}

TEST(ParameterCheck, MissesARequiredKey) {
  for (const char* params : {"", ";;", "gtmOnly=true;"}) {
    const ParameterFault fault = faultOf("AE0", params);
    EXPECT_EQ(fault.kind, Kind::missing) << params;
    EXPECT_EQ(fault.message, "AE0 needs slider, a number from 0 to 1, for example \"slider=0.4;\"");
  }
  const auto faults = checkParameters(builtIn("AE0"), "slider;");
  ASSERT_EQ(faults.size(), 2u);
  EXPECT_EQ(faults[0].kind, Kind::ignored);
  EXPECT_EQ(faults[1].kind, Kind::missing);
}

TEST(ParameterCheck, FindsTheNumbersThatTheFilterThrowsFor) {
  for (const char* params :
       {"slider=", "slider=x;", "slider=0.4x", "slider= 0.4;", "slider=0,4;"}) {
    const ParameterFault fault = faultOf("AE08bit", params);
    EXPECT_EQ(fault.kind, Kind::unreadable) << params;
    EXPECT_EQ(fault.key, "slider");
    EXPECT_THAT(fault.message, HasSubstr("slider of AE08bit wants a number from 0 to 1; '"));
  }
}

TEST(ParameterCheck, FindsWhatReadsOtherwiseThanItLooks) {
  const std::string look = "LowDimRGBCurve";
  const std::vector<std::tuple<std::string, std::string, std::string>> cases = {
      {"AE0", "slider=nan;", "slider of AE0 wants a number from 0 to 1; 'nan' is not finite"},
      {"AE0", "slider=1.5;", "slider of AE0 wants a number from 0 to 1; 1.5 is outside"},
      {"AE0", "slider=1;gtmOnly=1;", "gtmOnly of AE0 wants true or false; '1' counts as false"},
      {look, "applyMask=true;", "applyMask of LowDimRGBCurve wants 0 or 1; 'true' counts as 0"},
      {look, "maskAlpha=0.4abc;",
       "maskAlpha of LowDimRGBCurve wants a number from 0 to 1; '0.4abc' counts as 0.4"},
      {look, "maskAlpha=0.12345678x;",
       "maskAlpha of LowDimRGBCurve wants a number from 0 to 1; '0.12345678x' counts as 0.123457"},
      {look, "maskRadius=0;", "maskRadius of LowDimRGBCurve wants a number above 0; 0 is outside"},
      {look, "maskAlpha;",
       "maskAlpha of LowDimRGBCurve wants a number from 0 to 1; '' counts as 0"},
      {look, "r=0,128,255,;",
       "r of LowDimRGBCurve wants 2 or more numbers from 0 to 1, a comma after each; 128 is "
       "outside"},
      {look, "g=0,x,;",
       "g of LowDimRGBCurve wants 2 or more numbers from 0 to 1, a comma after each; 'x' counts "
       "as 0"},
  };
  for (const auto& [filter, params, message] : cases) {
    const ParameterFault fault = faultOf(filter, params);
    EXPECT_EQ(fault.kind, Kind::misread) << params;
    EXPECT_EQ(fault.message, message);
  }
}

TEST(ParameterCheck, FindsWhatAFilterDoesNotSee) {
  const std::vector<std::pair<std::string, std::string>> cases = {
      {"r=0.5,;", "a shorter list is ignored"},
      {"g=;", "a shorter list is ignored"},
      {"b=0,0.5,1;", "'1' has no comma and is ignored"},
      {"s1=0.3;b=0", "what follows the last ';' is ignored"},
      {"s1=0.3", "what follows the last ';' is ignored"},
  };
  for (const auto& [params, message] : cases) {
    const ParameterFault fault = faultOf("LowDimRGBCurve", params);
    EXPECT_EQ(fault.kind, Kind::ignored) << params;
    EXPECT_THAT(fault.message, HasSubstr(message));
  }
}

TEST(ParameterCheck, WritesNumbersWithAPointInEveryLocale) {
  const test_support::CommaLocale comma;
  EXPECT_EQ(requiredParameters(builtIn("AE0").parameters()), "slider=0.4;");
}

/// A filter of somebody else's, with one key of each kind that no built-in one has.
class OwnFilter : public PassThrough {
 public:
  using PassThrough::PassThrough;
  static FilterParameters parameters() {
    return {.rows = {{.name = "levels",
                      .kind = ParameterKind::numbers,
                      .description = "Levels",
                      .lowest = -1.0f,
                      .required = true},
                     {.name = "most",
                      .kind = ParameterKind::number,
                      .description = "Most",
                      .highest = 3.0f,
                      .standard = 2.5f,
                      .required = true}}};
  }
};

TEST(ParameterCheck, KnowsTheKeysOfAFilterFromElsewhere) {
  const ConcreteDescription<OwnFilter> own("Own", "Own", "Own.");
  EXPECT_EQ(requiredParameters(own.parameters()), "most=2.5;");
  const auto faults = checkParameters(own, "levels=0,-2,x,;");
  ASSERT_EQ(faults.size(), 2u);
  EXPECT_EQ(faults[0].message,
            "levels of Own wants 1 or more numbers of at least -1, a comma after each; -2 is "
            "outside");
  EXPECT_EQ(faults[1].message, "Own needs most, a number of at most 3, for example \"most=2.5;\"");
  EXPECT_EQ(checkParameters(own, "most=1;")[0].message,
            "Own needs levels, 1 or more numbers of at least -1, a comma after each, for example "
            "\"levels=...;\"");
}

}  // namespace
}  // namespace pelorin::image_processing

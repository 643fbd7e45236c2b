#include "image_processing/filters/filter_parameter.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <map>
#include <optional>
#include <set>
#include <string>
#include <tuple>

#include "image_processing/core/parameter_strings.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "image_processing/filters/parameter_check.h"
#include "tests/support/fingerprint.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

const std::map<std::string, FilterDescription*>& filters() {
  return DefaultFilterFactory::filterFactory()->descriptions;
}

std::string itemFor(const FilterParameter& row, ParameterReader reader, float value) {
  return row.name + "=" + valueText(row, reader, value) + ";";
}

std::string filtered(const std::string& name, const std::string& params,
                     const ImageMetadata& faces = {}) {
  auto picture = std::make_shared<Image<RGBA8Pixel>>(test_support::photoLikePicture(90, 60, 2));
  FilteredImage session(picture, faces, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(90, 60);
  EXPECT_TRUE(session.applyFilterWithParams(name, params, defaultFilterConfigValue, output));
  return test_support::fingerprint(output);
}

TEST(FilterParameters, AreTheKeysThatTheFiltersRead) {
  const std::string look = "maskRadius maskAlpha applyMask r g b ";
  std::map<std::string, std::string> keys;
  for (const auto& [name, filter] : filters()) {
    for (const FilterParameter& row : filter->parameters().rows) keys[name] += row.name + " ";
  }
  EXPECT_EQ(keys["AE0"], "slider gtmOnly gtmExtraMemory ");
  EXPECT_EQ(keys["AE08bit"], keys["AE0"]);
  EXPECT_EQ(keys["PassThrough"], "");
  EXPECT_EQ(keys["LowDimRGBCurve"], look + "s1 s2 s3 s4 ");
  for (const char* name :
       {"ZebraBW", "SummerRGB", "SpringRGB", "FallRGB", "VintageRGB", "WinterRGB"}) {
    EXPECT_EQ(keys[name], look);
  }
}

TEST(FilterParameters, HaveTheirRangesAndStandards) {
  const auto valuesOf = [](const std::string& filter, const std::string& key) {
    const FilterParameters parameters = filters().at(filter)->parameters();
    const FilterParameter& row = *parameters.find(key);
    return std::tuple(row.lowest, row.highest, row.standard);
  };
  const auto unit = [](float standard) { return std::tuple(0.0f, 1.0f, std::optional(standard)); };
  for (const char* name : {"AE0", "AE08bit"}) {
    EXPECT_EQ(valuesOf(name, "slider"), unit(0.4f));
    for (const char* key : {"gtmOnly", "gtmExtraMemory"}) {
      EXPECT_EQ(std::get<2>(valuesOf(name, key)), 0.0f) << key;
    }
  }
  for (const char* key : {"s1", "s2", "s3", "s4"}) {
    EXPECT_EQ(valuesOf("LowDimRGBCurve", key), unit(0.5f)) << key;
  }
  EXPECT_EQ(valuesOf("WinterRGB", "maskAlpha"), unit(0.3f));
}

TEST(FilterParameters, SayWhatCountsWithoutThem) {
  for (const auto& [name, filter] : filters()) {
    const FilterParameters parameters = filter->parameters();
    const std::string required = requiredParameters(parameters);
    for (const FilterParameter& row : parameters.rows) {
      if (!row.standard || row.required) continue;
      const std::string same = itemFor(row, parameters.reader, *row.standard);
      EXPECT_EQ(filtered(name, required + same), filtered(name, required)) << name << " " << same;
    }
  }
}

TEST(FilterParameters, ChangeTheResult) {
  for (const auto& [name, filter] : filters()) {
    const FilterParameters parameters = filter->parameters();
    for (const FilterParameter& row : parameters.rows) {
      if (row.name == "gtmExtraMemory") continue;  // changes what memory is taken, nothing else
      std::string params = requiredParameters(parameters);
      if (const FilterParameter* needed = parameters.find(row.onlyWith)) {
        params += itemFor(*needed, parameters.reader, 1.0f);
      }
      const float other = row.kind == ParameterKind::boolean ? 1.0f - *row.standard : 0.9f;
      const std::string changed = row.kind == ParameterKind::numbers
                                      ? row.name + "=1,0,;"
                                      : itemFor(row, parameters.reader, other);
      EXPECT_NE(filtered(name, params + changed), filtered(name, params)) << name << " " << changed;
    }
  }
}

TEST(FilterParameters, OfWhichOneIsRequiredThrowWithoutIt) {
  for (const auto& [name, filter] : filters()) {
    for (const FilterParameter& row : filter->parameters().rows) {
      if (!row.required) continue;
      EXPECT_THROW(filtered(name, ""), std::out_of_range) << name;
      EXPECT_NO_THROW(filtered(name, itemFor(row, filter->parameters().reader, *row.standard)));
    }
  }
}

TEST(FilterParameters, TellWhetherFacesMatter) {
  ImageMetadata faces;
  faces.faces.push_back(std::make_shared<BoundingBox>(BoundingBox{20, 60, 50, 10}));
  for (const auto& [name, filter] : filters()) {
    const std::string params = requiredParameters(filter->parameters());
    EXPECT_EQ(filtered(name, params, faces) != filtered(name, params),
              filter->parameters().readsFaces)
        << name;
  }
}

TEST(FilterParameters, OfOneNameAreOfOneKindInEveryFilter) {
  std::map<std::string, ParameterKind> kinds;
  for (const auto& [name, filter] : filters()) {
    std::set<std::string> keys;
    const FilterParameters parameters = filter->parameters();
    for (const FilterParameter& row : parameters.rows) {
      EXPECT_TRUE(keys.insert(row.name).second) << name << " has " << row.name << " twice";
      EXPECT_EQ(kinds.emplace(row.name, row.kind).first->second, row.kind) << row.name;
      EXPECT_FALSE(row.description.empty() || row.description.ends_with('.')) << row.name;
      if (!row.onlyWith.empty()) {
        ASSERT_NE(parameters.find(row.onlyWith), nullptr) << row.name;
        EXPECT_EQ(parameters.find(row.onlyWith)->kind, ParameterKind::boolean);
      }
      if (!row.standard || row.kind == ParameterKind::boolean) continue;
      EXPECT_EQ(static_cast<float>(readNumber(valueText(row, parameters.reader, *row.standard))),
                *row.standard)
          << row.name << " is told apart by more than six digits";
      EXPECT_TRUE(*row.standard >= row.lowest && *row.standard <= row.highest) << row.name;
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing

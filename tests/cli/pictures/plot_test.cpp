#include "cli/pictures/plot.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>

#include "cli/pictures/tone_curve_plot.h"

namespace pelorin::cli {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using testing::ElementsAre;

constexpr Colour red{1, 0, 0};

Plot plotOf(std::vector<PlotLine> lines, std::vector<PlotMark> marks = {}) {
  return {"Title", "subtitle", {"x", 0, 10}, {"y", 0, 10}, std::move(lines), std::move(marks)};
}

bool isRed(const RGBA8Pixel& p) {
  return p.r > 150 && p.g < 110 && p.b < 110;
}

/// Whether there is red within `reach` pixels of the point (x, y) of the axes 0 ... 10.
bool redNear(const Image<RGBA8Pixel>& picture, double x, double y, int reach = 3) {
  const PlotArea area = plotArea();
  const int column = static_cast<int>(area.left + x / 10 * (area.right - area.left));
  const int row = static_cast<int>(area.bottom + y / 10 * (area.top - area.bottom));
  for (int dy = -reach; dy <= reach; ++dy) {
    for (int dx = -reach; dx <= reach; ++dx) {
      if (isRed(picture.row(row + dy)[column + dx])) return true;
    }
  }
  return false;
}

int redPixels(const Image<RGBA8Pixel>& picture) {
  int count = 0;
  for (std::size_t i = 0; i < picture.pixelCount(); ++i) count += isRed(picture.data.get()[i]);
  return count;
}

int redOutsideTheAxes(const Image<RGBA8Pixel>& picture) {
  const PlotArea area = plotArea();
  int count = 0;
  for (std::uint32_t y = 0; y < picture.height; ++y) {
    for (std::uint32_t x = 0; x < picture.width; ++x) {
      const bool inside =
          x >= area.left - 1 && x <= area.right + 1 && y >= area.top - 1 && y <= area.bottom + 1;
      count += !inside && isRed(picture.row(y)[x]);
    }
  }
  return count;
}

TEST(RoundTicks, AreOneTwoOrFiveTimesAPowerOfTenApart) {
  EXPECT_THAT(roundTicks(0, 100, 10), ElementsAre(0, 10, 20, 30, 40, 50, 60, 70, 80, 90, 100));
  EXPECT_THAT(roundTicks(0, 1, 5), ElementsAre(0, 0.2, 0.4, 0.6000000000000001, 0.8, 1));
  EXPECT_THAT(roundTicks(0, 7, 4), ElementsAre(0, 2, 4, 6));
  EXPECT_THAT(roundTicks(0, 0.03, 4), testing::SizeIs(4));
  EXPECT_THAT(roundTicks(-3, 12, 3), ElementsAre(0, 5, 10));
}

TEST(RoundTicks, AreNeverMoreThanAskedForPlusOne) {
  for (const double high : {1e-30, 0.37, 1.0, 99.99, 12345.0, 1e30}) {
    for (int most = 1; most <= 12; ++most) {
      const auto ticks = roundTicks(0, high, most);
      EXPECT_LE(ticks.size(), most + 1u);
      EXPECT_GE(ticks.size(), 1u);
      EXPECT_LE(ticks.back(), high * 1.000001);
    }
  }
}

TEST(DrawPlot, LeavesInkAlongALineAndNowhereElse) {
  const auto picture = drawPlot(plotOf({{"", {{0, 0}, {5, 8}, {10, 2}}, red, 3}}));
  for (double x = 0.25; x < 10; x += 0.25) {
    const double y = x < 5 ? x * 8 / 5 : 8 - (x - 5) * 6 / 5;
    EXPECT_TRUE(redNear(picture, x, y)) << x;
    EXPECT_FALSE(redNear(picture, x, y + 1 > 9.9 ? y - 1 : y + 1)) << x;
  }
  EXPECT_EQ(redOutsideTheAxes(picture), 0);
}

TEST(DrawPlot, InterruptsADashedLine) {
  const int whole = redPixels(drawPlot(plotOf({{"", {{0, 5}, {10, 5}}, red, 3}})));
  const int dashed = redPixels(drawPlot(plotOf({{"", {{0, 5}, {10, 5}}, red, 3, true}})));
  EXPECT_GT(dashed, whole / 3);
  EXPECT_LT(dashed, whole * 4 / 5);
}

TEST(DrawPlot, ListsALabelledLineInTheLegend) {
  EXPECT_GT(redOutsideTheAxes(drawPlot(plotOf({{"curve", {{0, 0}, {10, 10}}, red, 3}}))), 100);
}

TEST(DrawPlot, FillsTheAreaUnderAFilledLine) {
  const auto picture = drawPlot(plotOf({{"", {{0, 2}, {10, 2}}, {0, 0, 0}, 1, false, true}}));
  const PlotArea area = plotArea();
  const auto at = [&](double y) {
    return picture.row(static_cast<std::uint32_t>(
        area.bottom -
        y / 10 * (area.bottom - area.top)))[static_cast<std::uint32_t>(area.left + 53)];
  };
  EXPECT_LT(at(1.5).g, 190);
  EXPECT_GT(at(2.5).g, 220);
}

TEST(DrawPlot, DrawsAMarkFromTopToBottomOnlyWithinTheAxes) {
  const auto picture = drawPlot(plotOf({}, {{"median", 4, red}}));
  EXPECT_TRUE(redNear(picture, 4, 9.5));
  EXPECT_TRUE(redNear(picture, 4, 5));
  EXPECT_EQ(redPixels(drawPlot(plotOf({}, {{"outside", 11, red}, {"no number", NAN, red}}))), 0);
}

TEST(DrawPlot, CutsOffWhatLiesOutsideTheAxes) {
  const auto picture =
      drawPlot(plotOf({{"", {{-5, -5}, {15, 15}, {1e300, -1e300}, {5, 1e300}}, red, 3}}));
  EXPECT_TRUE(redNear(picture, 3, 3));
  EXPECT_EQ(redOutsideTheAxes(picture), 0);
}

TEST(DrawPlot, InterruptsALineAtPointsThatAreNotFinite) {
  for (const bool filled : {false, true}) {
    const auto picture =
        drawPlot(plotOf({{"",
                          {{NAN, 1}, {0, 5}, {4, 5}, {5, HUGE_VAL}, {6, 5}, {10, 5}, {NAN, NAN}},
                          red,
                          3,
                          false,
                          filled}}));
    EXPECT_EQ(picture.width, 1440u);
    if (filled) continue;
    EXPECT_TRUE(redNear(picture, 2, 5));
    EXPECT_FALSE(redNear(picture, 5, 5));
    EXPECT_TRUE(redNear(picture, 8, 5));
  }
}

TEST(DrawPlot, DrawsAnEmptyPlotAndTitlesOfAnyBytes) {
  Plot plot = plotOf({});
  const auto title = [](const Image<RGBA8Pixel>& picture) {
    int ink = 0;
    for (std::uint32_t y = 0; y < 100; ++y) {
      for (std::uint32_t x = 0; x < picture.width; ++x) ink += picture.row(y)[x].g < 100;
    }
    return ink;
  };
  EXPECT_GT(title(drawPlot(plot)), 50);
  plot.title = std::string(5000, '\xFF');
  plot.subtitle = "";
  EXPECT_GT(title(drawPlot(plot)), 50);
}

TEST(ToneCurvePlot, PutsEverySampleAtItsLightness) {
  const Plot plot = toneCurvePlot("t", "s", {0, 0.75f, 1}, {0, 0.5f, 1}, 1);
  const PlotLine& curve = plot.lines.back();
  ASSERT_EQ(curve.points.size(), 3u);
  EXPECT_EQ(curve.points[1].x, 50);
  EXPECT_EQ(curve.points[1].y, 75);
  ASSERT_EQ(plot.marks.size(), 1u);
  EXPECT_EQ(plot.marks[0].x, 50);
}

TEST(ToneCurvePlot, MarksNoMedianWithoutAFace) {
  EXPECT_TRUE(toneCurvePlot("t", "s", {0, 1}, {0, 1}, -1).marks.empty());
}

}  // namespace
}  // namespace pelorin::cli

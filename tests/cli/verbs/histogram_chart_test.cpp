#include "cli/verbs/histogram_chart.h"

#include <gtest/gtest.h>

namespace pelorin::cli {
namespace {

TEST(HistogramChart, DrawsOneColumnABin) {
  EXPECT_EQ(histogramChart({0.5f, 0.25f, 0.0f, 0.001f}, 4, "> "),
            "> #\n"
            "> #\n"
            "> ##\n"
            "> ## .\n"
            "> ----\n");
}

TEST(HistogramChart, OfNothingIsAnAxis) {
  EXPECT_EQ(histogramChart({}, 1, ""), "\n\n");
  EXPECT_EQ(histogramChart({0.0f, 0.0f}, 1, ""), "\n--\n");
}

}  // namespace
}  // namespace pelorin::cli

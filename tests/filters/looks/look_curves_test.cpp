#include "image_processing/filters/looks/look_curves.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <vector>

#include "image_processing/filters/looks/low_dim_curves.h"

namespace pelorin::image_processing {
namespace {

// Ends, sum, and the sum with weights 1, 2, 3 ..., which notices exchanged samples.
struct Expected {
  double first, last, sum, weightedSum;
};

template <typename Curves>
void expectCurves(const char* name, const Curves& curves, const std::array<Expected, 3>& expected,
                  double tolerance) {
  for (std::size_t c = 0; c < 3; ++c) {
    double sum = 0.0, weightedSum = 0.0;
    for (std::size_t i = 0; i < curves[c].size(); ++i) {
      sum += curves[c][i];
      weightedSum += static_cast<double>(i + 1) * curves[c][i];
    }
    EXPECT_EQ(curves[c].front(), static_cast<float>(expected[c].first)) << name << c;
    EXPECT_EQ(curves[c].back(), static_cast<float>(expected[c].last)) << name << c;
    EXPECT_NEAR(sum, expected[c].sum, tolerance) << name << c;
    EXPECT_NEAR(weightedSum, expected[c].weightedSum, tolerance * 10) << name << c;
  }
}

TEST(LookCurves, HaveTheirEndsAndSums) {
  expectCurves("black and white ", zebraBWCurves,
               {{{0, 255, 6733, 236510}, {0, 255, 6544, 231598}, {0, 255, 6450, 229140}}}, 0.0);
  expectCurves("winter ", winterCurves,
               {{{22, 255, 7405, 253938}, {27, 255, 7872, 263817}, {32, 250, 8350, 273769}}}, 0.0);
  expectCurves("spring ", springCurves,
               {{{18, 255, 7334, 256982}, {9, 255, 7072, 247144}, {9, 255, 7125, 249590}}}, 0.0);
  expectCurves("fall ", fallCurves,
               {{{2, 255, 7392, 261794}, {2, 255, 7574, 264799}, {2, 255, 7011, 250906}}}, 0.0);
  expectCurves("summer ", summerCurves,
               {{{2, 255, 7542, 264219}, {2, 255, 7337, 258758}, {2, 255, 6917, 250625}}}, 0.0);
  expectCurves("vintage ", vintageCurves,
               {{{33, 222, 6952, 232116}, {33, 224, 6940, 233414}, {33, 220, 6659, 224324}}}, 0.0);
}

TEST(LookCurves, AreWholeNumbersInByteRangeThatNeverFall) {
  for (const LookCurves* curves :
       {&zebraBWCurves, &winterCurves, &springCurves, &fallCurves, &summerCurves, &vintageCurves}) {
    for (const std::array<float, 52>& curve : *curves) {
      for (std::size_t i = 0; i < curve.size(); ++i) {
        EXPECT_EQ(curve[i], std::floor(curve[i]));
        EXPECT_TRUE(0.0f <= curve[i] && curve[i] <= 255.0f) << curve[i];
        EXPECT_GE(curve[i], curve[i == 0 ? 0 : i - 1]);
      }
    }
  }
}

TEST(LowDimCurves, HaveTheirEndsAndSums) {
  expectCurves("mean ", lowDimMean,
               {{{0.05822621, 0.955746, 5.85064271, 46.04760391},
                 {0.06365407, 0.9536424, 5.82968437, 45.74457857},
                 {0.07450981, 0.9387872, 5.76792631, 45.07928851}}},
               2e-7);
  expectCurves("component 1 ", lowDimComponent1,
               {{{-0.01544468, 0.0778215, 1.33323249, 8.49595344},
                 {-0.04211748, 0.06699434, 1.35142946, 8.78780478},
                 {-0.005429115, 0.1653774, 2.13126682, 14.25020137}}},
               1e-7);
  expectCurves("component 2 ", lowDimComponent2,
               {{{-0.2812259, 0.1883762, -0.83236692, -0.01372447},
                 {-0.3015251, 0.2072194, -0.51554249, 2.06665486},
                 {-0.3056888, 0.3212332, 0.10732090, 7.57715150}}},
               1e-7);
  expectCurves("component 3 ", lowDimComponent3,
               {{{0.2983347, -0.02923888, -0.71239807, -6.90521413},
                 {0.2798764, 0.05239885, 0.24814211, 0.54434257},
                 {0.2809935, 0.2529593, 1.91501239, 12.97144752}}},
               1e-7);
  expectCurves("component 4 ", lowDimComponent4,
               {{{-0.1916895, -0.17434, -1.67563179, -13.84924000},
                 {-0.2179659, -0.07410355, -0.66669584, -5.54870409},
                 {-0.1860126, 0.07208525, 0.60877360, 4.41867633}}},
               1e-7);
}

}  // namespace
}  // namespace pelorin::image_processing

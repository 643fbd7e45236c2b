#include "cli/verbs/histogram_chart.h"

#include <algorithm>

namespace pelorin::cli {

std::string histogramChart(const std::vector<float>& histogram, int rows,
                           const std::string& indent) {
  const float tallest = histogram.empty() ? 0.0f : *std::ranges::max_element(histogram);
  std::string chart;
  for (int row = rows; row > 0; --row) {
    // A cell is filled when the bar reaches its middle.
    const float height = (static_cast<float>(row) - 0.5f) / static_cast<float>(rows) * tallest;
    std::string line;
    for (const float bin : histogram) {
      line += bin > 0.0f && bin >= height ? '#' : row == 1 && bin > 0.0f ? '.' : ' ';
    }
    chart += indent + line.substr(0, line.find_last_not_of(' ') + 1) + "\n";
  }
  return chart + indent + std::string(histogram.size(), '-') + "\n";
}

}  // namespace pelorin::cli

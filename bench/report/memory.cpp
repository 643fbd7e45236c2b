#include "bench/report/memory.h"

#include <fmt/format.h>

#include <vector>

#include "bench/report/child.h"
#include "bench/report/photos.h"

namespace pelorin::bench {
namespace {

struct Row {
  std::string name;
  std::vector<std::string> arguments;  // the verb first; inputs follow
  int photos = 1;
  bool writes = true;
};

const std::vector<Row>& rows() {
  static const std::vector<Row> all = {
      {"`quenby enhance`", {"enhance", "--threads", "1"}},
      {"the same with `--memory 0`", {"enhance", "--threads", "1", "--memory", "0"}},
      {"the same with `--rotate 90`", {"enhance", "--threads", "1", "--rotate", "90"}},
      {"two photos with `-j 1`", {"enhance", "-j", "1"}, 2},
      {"two photos with `-j 2`", {"enhance", "-j", "2"}, 2},
      {"two photos with `-j 2 --memory 0`", {"enhance", "-j", "2", "--memory", "0"}, 2},
      {"`quenby look winter`", {"look", "winter", "--threads", "1"}},
      {"`quenby score`", {"score"}, 1, false},
      {"`quenby info`", {"info"}, 1, false},
      {"`quenby keypoints`", {"keypoints"}, 1, false},
      {"`quenby sheet --sliders 0.4 --memory 0`", {"sheet", "--sliders", "0.4", "--memory", "0"}},
  };
  return all;
}

// The smaller of two runs in time, whose peaks are alike.
Spent spentOn(const std::string& command, const Row& row, const PhotoFiles& files) {
  std::vector<std::string> arguments = {command};
  arguments.insert(arguments.end(), row.arguments.begin(), row.arguments.end());
  for (int i = 0; i < row.photos; ++i)
    arguments.push_back(files.folder() + "/" + std::to_string(i) + ".jpg");
  if (row.writes) {
    const bool sheet = row.arguments[0] == "sheet";
    arguments.insert(arguments.end(),
                     {"-o", files.results() + (sheet ? "/sheet.png" : ""), "--overwrite"});
  }
  const Spent first = runCommand(arguments), second = runCommand(arguments);
  return first.seconds < second.seconds ? first : second;
}

}  // namespace

std::string memoryTable(const std::string& command) {
  constexpr PhotoSize sizes[] = {{4000, 3000}, {16330, 12247}};
  std::vector<std::string> lines;
  for (const Row& row : rows()) lines.push_back("| " + row.name + " |");
  std::string head = "| |", rule = "|---|";
  for (const PhotoSize& size : sizes) {
    head += fmt::format(" {:.0f} megapixels: MiB | ns/px |", size.megapixels());
    rule += "---:|---:|";
    const PhotoFiles files(size, 2);
    for (std::size_t i = 0; i < lines.size(); ++i) {
      const Row& row = rows()[i];
      const Spent spent = spentOn(command, row, files);
      lines[i] +=
          fmt::format(" {:.0f} | {:.1f} |", static_cast<double>(spent.peakBytes) / (1 << 20),
                      spent.seconds * 1e3 / size.megapixels() / row.photos);
    }
  }
  std::string table = head + "\n" + rule;
  for (const std::string& line : lines) table += "\n" + line;
  return table + "\n";
}

}  // namespace pelorin::bench

#include "bench/report/whole_file.h"

#include <fmt/format.h>

#include <algorithm>
#include <sstream>
#include <string_view>
#include <vector>

#include "bench/report/child.h"
#include "bench/report/codec_floor.h"
#include "bench/report/photos.h"
#include "bench/support/instruction_sets.h"
#include "photo/file_io.h"

namespace pelorin::bench {
namespace {

constexpr PhotoSize size = {4000, 3000};
constexpr int rounds = 5, photosInARun = 4;

double perPixel(double seconds) {
  return seconds * 1e3 / size.megapixels();
}

double fastest(const std::vector<double>& seconds) {
  return *std::min_element(seconds.begin(), seconds.end());
}

}  // namespace

std::string wholeFileTable(const std::string& command, const std::string& avx2Command) {
  const PhotoFiles files(size, photosInARun);
  const std::vector<std::uint8_t> bytes = photo::readFile(files.first());
  CodecFloor floor(bytes, size.width, size.height);
  floor.run();

  struct Row {
    std::string name;
    std::vector<std::string> arguments;
    int photos = 1;
  };
  std::vector<Row> rows = {
      {"`quenby --version`: start and end of a process", {command, "--version"}}};
  const auto addRows = [&](const std::string& options) {
    for (const int photos : {1, photosInARun}) {
      std::vector<std::string> arguments = {command, "enhance", "-r"};
      arguments.push_back(photos == 1 ? files.first() : files.folder());
      arguments.insert(arguments.end(), {"-o", files.results(), "--overwrite", "--quiet"});
      arguments.insert(arguments.end(), {"--threads", "1"});
      std::istringstream words(options);
      for (std::string word; words >> word;) arguments.push_back(word);
      const std::string each = photos == 1 ? "" : fmt::format(", each of {} photos", photos);
      rows.push_back({fmt::format("`{}`{}", options, each), arguments, photos});
    }
  };
  for (const char* options :
       {"--filter PassThrough", "--filter AE0", "--filter AE0 --memory 0", "--filter AE08bit",
        "--filter AE08bit --memory 0", "--filter WinterRGB"})
    addRows(options);
  const std::vector<InstructionSet> sets = instructionSets();

  // Round by round, so that the machine's moods meet all of them. The fastest counts: a run also
  // pays for memory that a virtual machine has to ask its host for.
  std::vector<double> floorTimes;
  std::vector<std::vector<double>> times(rows.size() * sets.size());
  for (int round = 0; round < rounds; ++round) {
    floorTimes.push_back(secondsOf([&] { floor.run(); }));
    for (std::size_t r = 0; r < rows.size(); ++r) {
      for (std::size_t s = 0; s < sets.size(); ++s) {
        std::vector<std::string> arguments = rows[r].arguments;
        if (sets[s].name == std::string_view("AVX2")) arguments[0] = avx2Command;
        times[r * sets.size() + s].push_back(runCommand(arguments).seconds / rows[r].photos);
      }
    }
  }

  const double floorTime = perPixel(fastest(floorTimes));
  std::string table = "| Nanoseconds a pixel |", rule = "|---|";
  for (const InstructionSet& set : sets) {
    table += fmt::format(" {} | of the floor |", set.name);
    rule += "---:|---:|";
  }
  table += "\n" + rule + "\n| floor: decode, copy, encode |";
  for (std::size_t s = 0; s < sets.size(); ++s) table += fmt::format(" {:.2f} | 1.00 |", floorTime);
  for (std::size_t r = 0; r < rows.size(); ++r) {
    table += "\n| " + rows[r].name + " |";
    for (std::size_t s = 0; s < sets.size(); ++s) {
      const double time = perPixel(fastest(times[r * sets.size() + s]));
      table += fmt::format(" {:.2f} | {:.2f} |", time, time / floorTime);
    }
  }
  return table + "\n";
}

}  // namespace pelorin::bench

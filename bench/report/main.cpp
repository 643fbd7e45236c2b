// performance_report FOLDER [PART...]: measures, and writes what it finds into FOLDER's
// performance.md, each part between its two marks, and the plots beside it. Parts: machine,
// stages, files, threads, memory, scale; all of them unless some are named.
#include <fmt/chrono.h>
#include <fmt/format.h>

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <fstream>
#include <functional>
#include <map>
#include <stdexcept>

#include "bench/report/memory.h"
#include "bench/report/scale.h"
#include "bench/report/stages.h"
#include "bench/report/threads.h"
#include "bench/report/whole_file.h"
#include "bench/support/instruction_sets.h"
#include "photo/file_io.h"
#include "photo/photo.h"

namespace pelorin::bench {
namespace {

std::string textOf(const std::string& path) {
  const std::vector<std::uint8_t> bytes = photo::readFile(path);
  return {bytes.begin(), bytes.end()};
}

void write(const std::string& path, const auto& bytes) {
  photo::writeFileAtomically(path,
                             {reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size()});
}

/// Replaces what stands between the marks of a part.
void replacePart(std::string& document, const std::string& part, const std::string& text) {
  const std::string begin = "<!-- " + part + " -->\n", end = "<!-- end of " + part + " -->";
  const std::size_t from = document.find(begin), to = document.find(end);
  if (from == std::string::npos || to == std::string::npos) {
    throw std::runtime_error("performance.md has no marks for " + part);
  }
  document.replace(from + begin.size(), to - from - begin.size(), "\n" + text + "\n");
}

std::string processorName() {
  std::ifstream information("/proc/cpuinfo");
  for (std::string line; std::getline(information, line);) {
    if (line.starts_with("model name")) return line.substr(line.find(':') + 2);
  }
  return "unknown processor";
}

std::string machine() {
  std::string text = fmt::format("Measured on {:%Y-%m-%d} on one core of: {}",
                                 fmt::gmtime(std::time(nullptr)), processorName());
  for (const InstructionSet& set : instructionSets()) text += fmt::format(", {}", set.name);
  return text + ". Compiler: " PELORIN_COMPILER ".\n";
}

std::string scale(const std::string& folder) {
  const Scale measured = measureScale(QUENBY_COMMAND);
  write(folder + "/performance_time.png", photo::save(cli::drawPlot(measured.time), "PNG"));
  write(folder + "/performance_memory.png", photo::save(cli::drawPlot(measured.memory), "PNG"));
  return measured.tables;
}

void report(const std::string& folder, const std::vector<std::string>& wanted) {
  const std::vector<std::pair<std::string, std::function<std::string()>>> parts = {
      {"machine", machine},
      {"stages", stagesTable},
      {"files", [] { return wholeFileTable(QUENBY_COMMAND, AVX2_COMMAND); }},
      {"threads", threadsTable},
      {"memory", [] { return memoryTable(QUENBY_COMMAND); }},
      {"scale", [&] { return scale(folder); }},
  };
  const std::string path = folder + "/performance.md";
  for (const auto& [part, measure] : parts) {
    const bool isWanted = std::find(wanted.begin(), wanted.end(), part) != wanted.end();
    if (!wanted.empty() && !isWanted) continue;
    const std::string text = measure();
    std::printf("%s\n", text.c_str());
    std::string document = textOf(path);
    replacePart(document, part, text);
    write(path, document);
  }
}

}  // namespace
}  // namespace pelorin::bench

int main(int argc, char** argv) {
  if (argc < 2) {
    std::fputs("performance_report FOLDER [machine|stages|files|threads|memory|scale ...]\n",
               stderr);
    return 2;
  }
  try {
    pelorin::bench::report(argv[1], {argv + 2, argv + argc});
    return 0;
  } catch (const std::exception& error) {
    std::fprintf(stderr, "performance_report: %s\n", error.what());
    return 1;
  }
}

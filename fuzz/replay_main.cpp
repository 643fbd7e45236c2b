// Runs a libFuzzer-style target without libFuzzer: `TARGET FILE...` replays files, `TARGET --corpus FILE`
// the inputs of a corpus (corpus.py), `TARGET --random RUNS --seed N --max-length BYTES` feeds it random
// bytes.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <random>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

// A line of hexadecimal digits for each; no file at all is none.
static std::size_t replay(const char* corpus) {
  std::ifstream lines(corpus);
  std::size_t count = 0;
  for (std::string line; std::getline(lines, line); ++count) {
    std::vector<std::uint8_t> bytes;
    for (std::size_t i = 0; i + 1 < line.size(); i += 2)
      bytes.push_back(static_cast<std::uint8_t>(std::stoi(line.substr(i, 2), nullptr, 16)));
    LLVMFuzzerTestOneInput(bytes.data(), bytes.size());
  }
  return count;
}

int main(int argc, char** argv) {
  long runs = 0;
  unsigned long seed = 1, longest = 4096;
  std::vector<std::string> files;
  std::size_t inputs = 0;
  for (int i = 1; i < argc; ++i) {
    const std::string argument = argv[i];
    if (argument == "--random" && i + 1 < argc) {
      runs = std::atol(argv[++i]);
    } else if (argument == "--corpus" && i + 1 < argc) {
      inputs += replay(argv[++i]);
    } else if (argument == "--seed" && i + 1 < argc) {
      seed = std::strtoul(argv[++i], nullptr, 10);
    } else if (argument == "--max-length" && i + 1 < argc) {
      longest = std::strtoul(argv[++i], nullptr, 10);
    } else {
      files.push_back(argument);
    }
  }
  for (const std::string& file : files) {
    std::ifstream stream(file, std::ios::binary);
    const std::vector<char> bytes{std::istreambuf_iterator<char>(stream), {}};
    LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size());
  }
  std::mt19937_64 random(seed);
  std::vector<std::uint8_t> bytes;
  for (long run = 0; run < runs; ++run) {
    bytes.resize(random() % (longest + 1));
    for (std::uint8_t& byte : bytes) byte = static_cast<std::uint8_t>(random());
    LLVMFuzzerTestOneInput(bytes.data(), bytes.size());
  }
  std::printf("%ld random inputs, %zu of the corpus, %zu files\n", runs, inputs, files.size());
}

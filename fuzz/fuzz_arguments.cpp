// Arguments of the command: what they come to is told in one line, changes nothing and is the same again.
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "cli/frame/shown_text.h"
#include "cli/verbs/verbs.h"

using namespace pelorin::cli;

namespace {

void require(bool holds) {
  if (!holds) std::abort();
}

// Every word that the command knows, and values that mean something to some of them.
std::vector<std::string> vocabulary(const CommandLine& commandLine) {
  std::vector<std::string> words = {"a.jpg", "-",     "--",  "@list", "0",    "1",     "-1",
                                    "0.4",   "1e999", "nan", "4k",    "9G",   "=",     "",
                                    "[a]",   "all",   "gps", "1,2,3", "help", "--json"};
  const CommandText text = commandLine.text();
  for (const VerbText& verb : text.verbs) {
    words.push_back(verb.name);
    for (const OptionText& option : verb.options)
      words.insert(words.end(), option.names.begin(), option.names.end());
  }
  return words;
}

// A byte below 128 is a character, or ends an argument; two others are a word.
std::vector<std::string> argumentsOf(const std::vector<std::string>& words,
                                     const std::uint8_t* data, std::size_t size) {
  std::vector<std::string> arguments;
  bool ended = true;
  for (std::size_t i = 0; i < size && arguments.size() < 40; ++i) {
    if (ended) arguments.emplace_back();
    ended = data[i] == 0;
    if (data[i] >= 128) {
      const std::size_t first = data[i] - 128u;
      const std::size_t index = first * 256 + (++i < size ? data[i] : 0u);
      arguments.back() += words[index % words.size()];
      ended = index / words.size() % 2 == 0;
    } else if (!ended) {
      arguments.back() += static_cast<char>(data[i]);
    }
  }
  return arguments;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static CommandLine* const commandLine = [] {
    auto* const made = new CommandLine;
    addVerbs(*made);
    return made;
  }();
  static const std::vector<std::string> words = vocabulary(*commandLine);
  const std::vector<std::string> arguments = argumentsOf(words, data, size);
  const CommandLine::Reading first = commandLine->read(arguments);
  const CommandLine::Reading again = commandLine->read(arguments);
  require(first.runs == again.runs && first.code == again.code);
  require(first.answer == again.answer && first.refusal == again.refusal);
  if (first.runs) {
    require(first.answer.empty() && first.refusal.empty());
  } else if (first.code == ExitCode::allDone) {
    require(!first.answer.empty() && first.refusal.empty());
  } else {
    require(first.code == ExitCode::usage && first.answer.empty() && first.refusal.ends_with('\n'));
    if (arguments.empty()) return 0;  // with which all of the help is said
    const std::string line = first.refusal.substr(0, first.refusal.size() - 1);
    require(line.starts_with("quenby") && shownText(line) == line);
  }
  return 0;
}

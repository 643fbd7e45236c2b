#include "cli/verbs/pages/value_words.h"

#include <algorithm>
#include <sstream>

namespace pelorin::cli {
namespace {

bool isLowerCase(const std::string& word) {
  return std::ranges::all_of(
      word, [](char c) { return (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9') || c == '-'; });
}

}  // namespace

ValueWords valueWords(const OptionText& option, const CommandText& command) {
  ValueWords value;
  const bool isChoice = option.value.find('|') != std::string::npos;
  std::istringstream parts(option.value);
  for (std::string part; std::getline(parts, part, '|');) {
    if (const auto known = command.words.find(part); known != command.words.end()) {
      value.words.insert(value.words.end(), known->second.begin(), known->second.end());
    } else if (part == "FILE" || part == "IN") {
      value.files = true;
    } else if (part == "DIR") {
      value.folders = true;
    } else if (isLowerCase(part) && (isChoice || part.find_first_of("0123456789") != 0)) {
      value.words.push_back(part);  // but "1-100" is no word
    }
  }
  return value;
}

}  // namespace pelorin::cli

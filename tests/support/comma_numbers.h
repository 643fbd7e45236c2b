#pragma once

#include <stdlib.h>

#include <clocale>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "tests/support/temporary_folder.h"

namespace pelorin::test_support {

/// `strtod` and its kin expect "0,5", as long as this lives: a locale of glibc's, made here since
/// machines that test have none. Without effect where the C library is another.
class CommaNumbers {
 public:
  CommaNumbers() : before_(std::setlocale(LC_NUMERIC, nullptr)) {
    folder_.write("comma/LC_NUMERIC", numericLocale());
    setenv("LOCPATH", folder_.path().c_str(), 1);
    std::setlocale(LC_NUMERIC, "comma");
  }
  ~CommaNumbers() {
    std::setlocale(LC_NUMERIC, before_.c_str());
    unsetenv("LOCPATH");
  }
  CommaNumbers(const CommaNumbers&) = delete;
  CommaNumbers& operator=(const CommaNumbers&) = delete;

 private:
  // A mark, how many values, where each begins, the values: decimal point, separator and groups of
  // thousands, the first two as wide characters, encoding.
  static std::string numericLocale() {
    using namespace std::string_literals;
    const std::vector<std::string> values = {",\0"s, "\0"s, "\0"s, word(','), word(0), "UTF-8\0"s};
    std::string head = word(0x20031114) + word(static_cast<std::uint32_t>(values.size()));
    const std::size_t begin = head.size() + 4 * values.size();
    std::string body;
    for (const std::string& value : values) {
      body.resize((body.size() + 3) / 4 * 4);
      head += word(static_cast<std::uint32_t>(begin + body.size()));
      body += value;
    }
    return head + body;
  }

  static std::string word(std::uint32_t value) {
    std::string bytes(sizeof value, '\0');
    std::memcpy(bytes.data(), &value, sizeof value);
    return bytes;
  }

  std::string before_;
  TemporaryFolder folder_;
};

}  // namespace pelorin::test_support

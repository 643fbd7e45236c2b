#pragma once

#include <string>
#include <vector>

#include "cli/frame/command_text.h"

namespace pelorin::cli {

/// What a shell may offer for the value of an option.
struct ValueWords {
  std::vector<std::string> words;
  bool files = false, folders = false;
};

/// The help's name of a value tells: of "keep|drop" the two, of "FILE|DIR" files and folders, and what
/// `words` has for its name.
ValueWords valueWords(const OptionText& option, const CommandText& command);

}  // namespace pelorin::cli

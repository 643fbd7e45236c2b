#pragma once

#include <map>
#include <string>
#include <vector>

namespace pelorin::cli {

/// What the help says of an option or of a word that has no name.
struct OptionText {
  std::vector<std::string> names;  ///< "-o", "--output"; empty for what stands alone.
  std::string value;               ///< What the help calls its value: "FILE|DIR"; empty for a flag.
  std::string help, heading;
  bool required = false, repeated = false;
};

struct VerbText {
  std::string name, summary;
  std::vector<OptionText> options;
  std::vector<std::string> examples;  ///< Whole commands.
  std::string notes;                  ///< What else stands below the options.
};

/// All that the command's help holds, for pages and completions that are made from it.
struct CommandText {
  std::string name, version, summary;
  std::vector<OptionText> options;
  std::vector<VerbText> verbs;
  /// What may stand for a value that the help calls so: the looks for "LOOK".
  std::map<std::string, std::vector<std::string>> words = {};
};

}  // namespace pelorin::cli

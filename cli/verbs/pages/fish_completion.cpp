#include <string>

#include "cli/verbs/pages/completions.h"
#include "cli/verbs/pages/value_words.h"

namespace pelorin::cli {
namespace {

std::string inQuotes(const std::string& text) {
  std::string result = "'";
  for (const char c : text) {
    if (c == '\'' || c == '\\') result += '\\';
    result += c;
  }
  return result + "'";
}

std::string joined(const std::vector<std::string>& words) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : " ") + word;
  return text;
}

std::string line(const CommandText& command, const std::string& condition,
                 const OptionText& option) {
  std::string text = "complete -c " + command.name + " -n " + inQuotes(condition);
  for (const std::string& name : option.names) {
    text += name.starts_with("--") ? " -l " + name.substr(2) : " -s " + name.substr(1);
  }
  const ValueWords value = valueWords(option, command);
  if (!option.names.empty() && !option.value.empty()) text += value.files ? " -r -F" : " -x";
  if (option.names.empty()) text += value.files ? " -F" : " -f";
  std::string offered = joined(value.words);
  if (value.folders && !value.files) offered += " (__fish_complete_directories)";
  if (!offered.empty()) text += " -a " + inQuotes(offered);
  if (!option.names.empty()) text += " -d " + inQuotes(option.help);
  return text + "\n";
}

}  // namespace

std::string fishCompletion(const CommandText& command) {
  std::string text = "# fish completion for " + command.name + "\n\n";
  for (const OptionText& option : command.options) {
    text += line(command, "__fish_use_subcommand", option);
  }
  for (const VerbText& verb : command.verbs) {
    text += "\ncomplete -c " + command.name + " -n __fish_use_subcommand -f -a " + verb.name +
            " -d " + inQuotes(verb.summary) + "\n";
    for (const OptionText& option : verb.options) {
      text += line(command, "__fish_seen_subcommand_from " + verb.name, option);
    }
  }
  return text;
}

}  // namespace pelorin::cli

#include <string>

#include "cli/verbs/pages/completions.h"
#include "cli/verbs/pages/value_words.h"

namespace pelorin::cli {
namespace {

std::string inQuotes(const std::string& text) {
  std::string result = "'";
  for (const char c : text) {
    if (c == '\'') {
      result += "'\\''";
    } else {
      result += c;
    }
  }
  return result + "'";
}

// Inside an argument of _arguments, where ':' and brackets part its fields.
std::string field(const std::string& text) {
  std::string result;
  for (const char c : text) {
    if (c == ':' || c == '[' || c == ']' || c == '\\') result += '\\';
    result += c;
  }
  return result;
}

std::string action(const OptionText& option, const CommandText& command) {
  const ValueWords value = valueWords(option, command);
  std::string words;
  for (const std::string& word : value.words) words += (words.empty() ? "" : " ") + field(word);
  if (words.empty()) return value.files ? "_files" : value.folders ? "_files -/" : " ";
  if (!value.files && !value.folders) return "(" + words + ")";
  return "{_quenby_files_or " + words + "}";
}

std::string argument(const OptionText& option, const CommandText& command) {
  const std::string what =
      option.value.empty() ? "" : ":" + field(option.value) + ":" + action(option, command);
  if (option.names.empty()) return inQuotes((option.repeated ? "*" : "") + what);
  const std::string help = "[" + field(option.help) + "]";
  std::string all, text;
  for (const std::string& name : option.names) all += (all.empty() ? "" : " ") + name;
  for (const std::string& name : option.names) {
    const std::string again = option.repeated ? "*" : "(" + all + ")";
    text += (text.empty() ? "" : " \\\n        ") + inQuotes(again + name + help + what);
  }
  return text;
}

}  // namespace

std::string zshCompletion(const CommandText& command) {
  std::string text = "#compdef " + command.name + R"zsh(

_quenby_files_or() {
  _alternative "words:word:($*)" 'files:file:_files'
}

_quenby() {
  local curcontext=$curcontext state line
  typeset -A opt_args
  local -a verbs=(
)zsh";
  for (const VerbText& verb : command.verbs) {
    text += "    " + inQuotes(verb.name + ":" + field(verb.summary)) + "\n";
  }
  text += "  )\n  _arguments -C \\\n";
  for (const OptionText& option : command.options) {
    text += "        " + argument(option, command) + " \\\n";
  }
  text += R"(        '1:verb:->verb' '*::argument:->rest'
  case $state in
    verb) _describe verb verbs ;;
    rest)
      case $words[1] in
)";
  for (const VerbText& verb : command.verbs) {
    text += "      " + verb.name + ")\n        _arguments -s";
    for (const OptionText& option : verb.options) {
      text += " \\\n        " + argument(option, command);
    }
    text += "\n        ;;\n";
  }
  return text + "      esac\n      ;;\n  esac\n}\n\n_quenby \"$@\"\n";
}

}  // namespace pelorin::cli

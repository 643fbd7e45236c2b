#include <string>

#include "cli/verbs/pages/completions.h"
#include "cli/verbs/pages/value_words.h"

namespace pelorin::cli {
namespace {

std::string joined(const std::vector<std::string>& words, const char* separator) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : separator) + word;
  return text;
}

std::string optionNames(const std::vector<OptionText>& options) {
  std::string text;
  for (const OptionText& option : options) {
    if (!option.names.empty()) text += (text.empty() ? "" : " ") + joined(option.names, " ");
  }
  return text;
}

// Sets what is offered: "files", "folders" or words.
std::string offer(const ValueWords& value) {
  std::string text = "words='" + joined(value.words, " ") + "'";
  if (value.files) return text + " files=-f";
  return value.folders ? text + " files=-d" : text;
}

}  // namespace

std::string bashCompletion(const CommandText& command) {
  std::string verbs;
  for (const VerbText& verb : command.verbs) verbs += verb.name + " ";
  std::string text = "# bash completion for " + command.name + R"(

_quenby() {
  local word=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD - 1]}
  local verb='' options='' words='' files='' i
  # --option=value is three words.
  if [[ $word == = ]]; then
    word=''
  elif [[ $before == = ]]; then
    before=${COMP_WORDS[COMP_CWORD - 2]}
  fi
  for ((i = 1; i < COMP_CWORD; ++i)); do
    [[ ${COMP_WORDS[i]} == -* ]] || { verb=${COMP_WORDS[i]} && break; }
  done
  case $verb in
    '')
      words=')" + verbs +
                     R"('
      options=')" + optionNames(command.options) +
                     R"('
      ;;
)";
  for (const VerbText& verb : command.verbs) {
    text += "    " + verb.name + ")\n      options='" + optionNames(verb.options) + "'\n";
    text += "      case $before in\n";
    ValueWords alone;
    for (const OptionText& option : verb.options) {
      if (option.names.empty()) {
        const ValueWords one = valueWords(option, command);
        alone.words.insert(alone.words.end(), one.words.begin(), one.words.end());
        alone.files = alone.files || one.files;
        alone.folders = alone.folders || one.folders;
      } else if (!option.value.empty()) {
        text += "        " + joined(option.names, " | ") + ") options='' " +
                offer(valueWords(option, command)) + " ;;\n";
      }
    }
    text += "        *) " + offer(alone) + " ;;\n      esac\n      ;;\n";
  }
  return text + R"(  esac
  [[ $word != -* ]] || words=$options
  mapfile -t COMPREPLY < <(compgen -W "$words" -- "$word")
  if [[ -n $files && $word != -* ]]; then
    compopt -o filenames 2>/dev/null
    mapfile -t -O ${#COMPREPLY[@]} COMPREPLY < <(compgen "$files" -- "$word")
  fi
}

complete -F _quenby )" +
         command.name + "\n";
}

}  // namespace pelorin::cli

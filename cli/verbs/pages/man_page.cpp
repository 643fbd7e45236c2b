#include "cli/verbs/pages/man_page.h"

#include <algorithm>
#include <cctype>
#include <vector>

namespace pelorin::cli {
namespace {

std::string escaped(const std::string& text) {
  std::string result;
  bool lineBegins = true;
  for (const char c : text) {
    if (lineBegins && (c == '.' || c == '\'')) result += "\\&";
    lineBegins = c == '\n';
    if (c == '\\') {
      result += "\\e";
    } else if (c == '-') {
      result += "\\-";
    } else if (c == '\'') {
      result += "\\(aq";
    } else if (c == '`') {
      result += "\\(ga";
    } else if (c == '^') {
      result += "\\(ha";
    } else if (c == '~') {
      result += "\\(ti";
    } else {
      result += c;
    }
  }
  return result;
}

std::string upper(std::string text) {
  for (char& c : text) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  return text;
}

// No date: the page is the same whenever it is made.
std::string head(const CommandText& command, const std::string& page, const std::string& summary) {
  return ".TH " + escaped(upper(page)) + " 1 \"\" \"" +
         escaped(command.name + " " + command.version) + "\" \"User Commands\"\n.SH NAME\n" +
         escaped(page) + " \\- " + escaped(summary) + "\n";
}

std::string tagged(const OptionText& option) {
  std::string tag;
  for (const std::string& name : option.names) {
    tag += (tag.empty() ? "\\fB" : ", \\fB") + escaped(name) + "\\fR";
  }
  if (!option.value.empty()) {
    tag += (tag.empty() ? "\\fI" : " \\fI") + escaped(option.value) + "\\fR";
    if (option.names.empty() && option.repeated) tag += " ...";
  }
  return ".TP\n" + tag + "\n" + escaped(option.help) + "\n";
}

std::string optionSections(const std::vector<OptionText>& options) {
  std::vector<std::string> headings;
  for (const OptionText& option : options) {
    if (std::ranges::find(headings, option.heading) == headings.end()) {
      headings.push_back(option.heading);
    }
  }
  std::string text = ".SH OPTIONS\n";
  for (const std::string& heading : headings) {
    if (headings.size() > 1) text += ".SS " + escaped(heading) + "\n";
    for (const OptionText& option : options) {
      if (option.heading == heading) text += tagged(option);
    }
  }
  return text;
}

std::string asItStands(const std::string& text) {
  return ".nf\n" + escaped(text) + "\n.fi\n";
}

}  // namespace

std::string manPage(const CommandText& command) {
  std::string page = head(command, command.name, command.summary);
  page += ".SH SYNOPSIS\n\\fB" + command.name + "\\fR \\fIVERB\\fR [\\fIOPTIONS\\fR] ...\n";
  page += ".SH VERBS\n";
  for (const VerbText& verb : command.verbs) {
    page += ".TP\n\\fB" + escaped(command.name + "-" + verb.name) + "\\fR(1)\n" +
            escaped(verb.summary) + "\n";
  }
  return page + optionSections(command.options);
}

std::string manPage(const CommandText& command, const VerbText& verb) {
  std::string page = head(command, command.name + "-" + verb.name, verb.summary);
  page += ".SH SYNOPSIS\n\\fB" + command.name + " " + verb.name + "\\fR [\\fIOPTIONS\\fR]";
  for (const OptionText& option : verb.options) {
    if (!option.names.empty()) continue;
    page += " \\fI" + escaped(option.value) + "\\fR" + (option.repeated ? " ..." : "");
  }
  page += "\n" + optionSections(verb.options);
  std::string examples;
  for (const std::string& example : verb.examples) {
    examples += (examples.empty() ? "" : "\n") + example;
  }
  page += ".SH EXAMPLES\n" + asItStands(examples);
  const std::size_t start = verb.notes.find_first_not_of('\n');
  if (start != std::string::npos) page += ".SH NOTES\n" + asItStands(verb.notes.substr(start));
  return page + ".SH SEE ALSO\n\\fB" + command.name + "\\fR(1)\n";
}

}  // namespace pelorin::cli

#include <filesystem>
#include <memory>
#include <string>

#include "cli/frame/look_name.h"
#include "cli/verbs/pages/completions.h"
#include "cli/verbs/pages/man_page.h"
#include "cli/verbs/verbs.h"
#include "photo/file_io.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

void write(const fs::path& path, const std::string& text) {
  fs::create_directories(path.parent_path());
  photo::writeFileAtomically(path.string(),
                             {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()});
}

ExitCode makePages(CommandText command, const fs::path& folder) {
  for (const auto* filter : allFilters()) {
    command.words["FILTER"].push_back(filter->name);
    command.words["LOOK"].push_back(filter->name);
  }
  write(folder / "man" / (command.name + ".1"), manPage(command));
  for (const VerbText& verb : command.verbs) {
    write(folder / "man" / (command.name + "-" + verb.name + ".1"), manPage(command, verb));
  }
  write(folder / "bash" / command.name, bashCompletion(command));
  write(folder / "zsh" / ("_" + command.name), zshCompletion(command));
  write(folder / "fish" / (command.name + ".fish"), fishCompletion(command));
  return ExitCode::allDone;
}

}  // namespace

void addPages(CommandLine& commandLine) {
  const auto folder = std::make_shared<std::string>();
  Verb verb = commandLine.addVerb(
      "pages", "Write the manual and the completions of shells", "quenby pages build/pages",
      [folder, &commandLine] { return makePages(commandLine.text(), *folder); });
  verb.option("DIR", *folder, "The folder for them").required().type("");
  commandLine.hide("pages");
}

}  // namespace pelorin::cli

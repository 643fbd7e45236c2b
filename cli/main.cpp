#include <string_view>

#include "cli/verbs/verbs.h"

int main(int argc, char** argv) {
  using namespace pelorin::cli;
  const std::string_view asked = argc > 1 ? argv[1] : "";
  CommandLine commandLine;
  if (argc != 2 || (asked != "--version" && asked != "-V")) addVerbs(commandLine, asked);
  return static_cast<int>(commandLine.run(argc, argv));
}

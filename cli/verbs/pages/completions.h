#pragma once

#include <string>

#include "cli/frame/command_text.h"

namespace pelorin::cli {

// Scripts that teach a shell the verbs, the options of each and what may be their values.

std::string bashCompletion(const CommandText& command);
std::string zshCompletion(const CommandText& command);
std::string fishCompletion(const CommandText& command);

}  // namespace pelorin::cli

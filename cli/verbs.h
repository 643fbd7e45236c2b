#pragma once

#include "cli/common/command_line.h"

namespace pelorin::cli {

// Each is defined in the file of its verb.
void addEnhance(CommandLine& commandLine);
void addInfo(CommandLine& commandLine);

}  // namespace pelorin::cli

#pragma once

#include "cli/common/command_line.h"

namespace pelorin::cli {

// Each is defined in the file of its verb.
void addCurve(CommandLine& commandLine);
void addEnhance(CommandLine& commandLine);
void addInfo(CommandLine& commandLine);
void addMasks(CommandLine& commandLine);
void addSheet(CommandLine& commandLine);

}  // namespace pelorin::cli

#pragma once

#include "cli/frame/command_line.h"

namespace pelorin::cli {

// Each is defined in the file of its verb.
void addCompare(CommandLine& commandLine);
void addCurve(CommandLine& commandLine);
void addDupes(CommandLine& commandLine);
void addEnhance(CommandLine& commandLine);
void addInfo(CommandLine& commandLine);
void addLook(CommandLine& commandLine);
void addLooks(CommandLine& commandLine);
void addKeypoints(CommandLine& commandLine);
void addMasks(CommandLine& commandLine);
void addPages(CommandLine& commandLine);  // for the build
void addScore(CommandLine& commandLine);
void addSelftest(CommandLine& commandLine);
void addSheet(CommandLine& commandLine);
void addUndo(CommandLine& commandLine);
void addWatch(CommandLine& commandLine);

}  // namespace pelorin::cli

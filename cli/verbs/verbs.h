#pragma once

#include <string_view>

#include "cli/frame/command_line.h"

namespace pelorin::cli {

/// Adds every verb; or only `wanted`, where it is one: making the options of all takes longer than what
/// many a run is for.
void addVerbs(CommandLine& commandLine, std::string_view wanted = "");

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

#include "cli/verbs.h"

int main(int argc, char** argv) {
  using namespace pelorin::cli;
  CommandLine commandLine;
  addEnhance(commandLine);
  addLook(commandLine);
  addLooks(commandLine);
  addInfo(commandLine);
  addCurve(commandLine);
  addKeypoints(commandLine);
  addMasks(commandLine);
  addScore(commandLine);
  addSheet(commandLine);
  addDupes(commandLine);
  addCompare(commandLine);
  return static_cast<int>(commandLine.run(argc, argv));
}

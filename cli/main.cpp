#include "cli/verbs/verbs.h"

int main(int argc, char** argv) {
  using namespace pelorin::cli;
  CommandLine commandLine;
  addEnhance(commandLine);
  addLook(commandLine);
  addLooks(commandLine);
  addSheet(commandLine);
  addInfo(commandLine);
  addCurve(commandLine);
  addMasks(commandLine);
  addDupes(commandLine);
  addCompare(commandLine);
  addScore(commandLine);
  addKeypoints(commandLine);
  addUndo(commandLine);
  addWatch(commandLine);
  addPages(commandLine);
  return static_cast<int>(commandLine.run(argc, argv));
}

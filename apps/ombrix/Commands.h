#pragma once

namespace ombrix {

class Program;

// The commands, each in a file of its own; all answer the exit status.

int runTree(Program& program);
int runFind(Program& program);
int runGroups(Program& program);
int runObjects(Program& program);
int runPaths(Program& program);
int runInfo(Program& program);
int runExplain(Program& program);
int runMessage(Program& program);
int runPlugins(Program& program);
int runWatch(Program& program);
int runQuery(Program& program);
int runDiskFormat(Program& program);
int runMenu(Program& program);
int runOpen(Program& program);
int runReveal(Program& program);
int runExport(Program& program);
int runDoctor(Program& program);
int runVerify(Program& program);
int runHelp(Program& program);
/// Answers a question about a disk for another run of the program, which goes on without it when the disk is silent.
int runAnswer(Program& program);

} // namespace ombrix

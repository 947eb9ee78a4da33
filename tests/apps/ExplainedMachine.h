#pragma once

#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"

#include <string>
#include <vector>

namespace tests {

/// What the program says of one path.
struct ExplainAnswer {
    std::string path;
    bool listed = false;
    std::vector<std::string> groups {};
    std::vector<std::string> objects {}; ///< the group, a bar, and the path of each
    std::vector<std::string> rules {};
    std::string lastRule {};
    std::string lastPath {};
    std::string reason {};
    std::string remedy {}; ///< "null" when there is none
};

/// A machine with a library of projects and one of events in the home folder, and a stick.
struct ExplainedMachine {
    ExplainedMachine();

    /// A run of "explain" with these words.
    RunWishes wishes(std::vector<std::string> arguments);
    /// What is said of the paths, one answer each.
    std::vector<ExplainAnswer> answers(std::vector<std::string> paths);
    ExplainAnswer answer(const std::string& path);

    const TemporaryFolder folder;
    LibraryBuilder projects;
    LibraryBuilder events;
    LibraryBuilder stick;
    DescribedMachine description;
    bool hasEditor = true;
};

/// Checks that nothing stands for the path, which rule decided, and what it said.
void checkUnlisted(
    const ExplainAnswer& answer, const std::string& rule, const std::string& reason, const std::string& remedy);

} // namespace tests

#pragma once

#include <string>
#include <utility>
#include <vector>

namespace tests {

/// How a run of the program ended, and what it printed.
struct ProgramRun {
    int status = -1; ///< exit status, or 128 and the signal's number
    std::string output; ///< of a run on a terminal: everything the terminal got
    std::string errors;
};

/// A run of the program that is to be made.
struct RunWishes {
    std::vector<std::string> arguments {};
    std::vector<std::pair<std::string, std::string>> environment {}; ///< beside, or in place of, what every run gets
    std::string outputFile {}; ///< where standard output goes instead of into the answer
    std::string inputFile {}; ///< what standard input holds; nothing without one
    std::string program {}; ///< in place of ombrix
};

/// Runs the program with pipes and waits for its end.
ProgramRun runProgram(const RunWishes& wishes);

/// Runs the program with its standard output at a pipe that nobody reads any more.
ProgramRun runProgramForNobody(const RunWishes& wishes);

/// A terminal of its own for a run.
struct TerminalWishes {
    int lines = 24;
    int columns = 80;
    std::string type = "xterm"; ///< TERM
    std::string sendSignalAfter {}; ///< once the terminal has got this text,
    int signal = 0; ///< the program gets this signal
};

/// Runs the program on a terminal and waits for its end. The terminal's line ends are answered as line feeds.
ProgramRun runOnTerminal(const RunWishes& wishes, const TerminalWishes& terminal);

/// The same with standard output at a pipe, into `output`; `errors` is what the terminal got.
ProgramRun runWithErrorsOnTerminal(const RunWishes& wishes, const TerminalWishes& terminal);

/// A run of the program with pipes that goes on until the test ends it.
class RunningProgram {
public:
    explicit RunningProgram(const RunWishes& wishes);
    /// Kills it where it still runs.
    ~RunningProgram();
    RunningProgram(const RunningProgram&) = delete;
    RunningProgram& operator=(const RunningProgram&) = delete;

    /// Reads until standard output holds `text`; false when it has ended, or printed nothing for long, before that.
    bool prints(const std::string& text);
    /// What it has printed so far, as far as it was read.
    const std::string& output() const { return _run.output; }
    std::string workingFolder() const;
    /// Keeps it from doing anything, until `goOn`.
    void stop() const;
    void goOn() const;
    /// Closes the reading end of its standard output.
    void stopReading();
    /// Sends a signal, none for 0, and waits for the end.
    ProgramRun end(int signal);

private:
    int _child = -1;
    int _output = -1;
    int _errors = -1;
    ProgramRun _run;
};

} // namespace tests

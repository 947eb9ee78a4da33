#pragma once

#include <string>
#include <string_view>

namespace apps {

/// The width and height of a terminal, in columns and lines.
struct TerminalSize {
    int columns = 80;
    int lines = 24;
};

bool isTerminal(int descriptor);
/// What the terminal itself says; 80 by 24 where it says nothing. Never sends it a query.
TerminalSize sizeOfTerminal(int descriptor);

/// The value of an environment variable; empty when it is not set.
std::string_view environmentVariable(const char* name);

/// This machine's name, for links that other machines may be shown.
std::string hostName();

/// Sees to it that descriptors 0 to 2 are open, so that no file that is read later takes the place of one of them. What
/// was closed stays unusable for writing.
void guardStandardDescriptors();

/// Ends the process at once: no thread is joined and nothing is destroyed.
[[noreturn]] void endProcess(int status);

} // namespace apps

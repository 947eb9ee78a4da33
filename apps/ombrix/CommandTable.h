#pragma once

#include <cstddef>
#include <span>
#include <string_view>

namespace ombrix {

class Program;

/// An option as it is typed and explained.
struct OptionInfo {
    std::string_view name; ///< "--group"
    std::string_view shortName; ///< "-h"; empty for most
    std::string_view value; ///< what its value is called in help; empty for an option without one
    std::string_view text;
    bool isRequired = false;
    bool mayRepeat = false; ///< each value counts, or the last; else two values are a mistake, for one would be lost
    std::string_view excludes {}; ///< the option that it makes no sense with
};

struct Example {
    std::string_view command;
    std::string_view text;
};

/// What a command is for; help lists the commands by it.
enum class Intent { look, follow, act, ask };

/// One command. Parsing, help and suggestions know nothing of it but this.
struct CommandInfo {
    std::string_view name;
    Intent intent;
    std::string_view operands; ///< such as "[ID|NAME]"; empty when it takes none
    std::size_t mostOperands;
    std::string_view summary; ///< one line
    std::string_view details; ///< lines of at most 78 columns
    std::span<const OptionInfo> options; ///< its own ones
    bool takesSource; ///< whether it asks one source, and so option --source means something
    std::span<const Example> examples;
    int (*run)(Program&); ///< answers the exit status
};

std::span<const CommandInfo> commands();
/// Null when there is no such command. Finds also what the program asks of itself, which is listed nowhere.
const CommandInfo* commandNamed(std::string_view name);
/// Those that every command takes, before or after its name; --source only where it asks one source.
std::span<const OptionInfo> globalOptions();

} // namespace ombrix

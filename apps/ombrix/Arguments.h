#pragma once

#include "apps/common/Style.h"
#include "apps/ombrix/CommandTable.h"

#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace ombrix {

/// The plug-in whose tree is meant where none is named.
inline constexpr std::string_view defaultSource = "org.ombrix.OBMontaroPlugin";

/// What was typed, byte for byte.
struct Arguments {
    const CommandInfo* command = nullptr; ///< null when help or the version alone is wanted
    std::vector<std::string> operands {};
    bool wantsHelp = false;
    bool wantsVersion = false;
    std::optional<std::string> machineFile {};
    std::string source { defaultSource };
    apps::When color = apps::When::automatic;
    apps::When hyperlink = apps::When::automatic;
    /// The command's own options, by name, in the order typed; without a value where they take none.
    std::vector<std::pair<std::string_view, std::string>> options {};

    bool has(std::string_view option) const;
    /// The value typed last; null when the option was not typed.
    const std::string* valueOf(std::string_view option) const;
};

/// Arguments, or what is wrong with them.
struct ParsedArguments {
    Arguments arguments {};
    std::string problem {}; ///< one line for people, with a suggestion where there is one; empty when nothing is wrong
};

/// Reads the words after the program's name. An option's value follows it as the next word or after "="; "--" ends the
/// options.
ParsedArguments parseArguments(std::span<const std::string_view> words);

/// What is wrong with asking for a command that does not exist.
std::string unknownCommand(std::string_view name);

} // namespace ombrix

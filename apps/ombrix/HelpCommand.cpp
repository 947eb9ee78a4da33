// Help comes from the table of commands alone, so it cannot disagree with what is parsed.

#include "apps/ombrix/Help.h"

#include "apps/common/DisplayWidth.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
#include "host/OBConstants.h"

#include <utility>

namespace ombrix {
namespace {

    constexpr std::string_view version = OMBRIX_VERSION;
    constexpr int textColumn = 26;

    std::string described(const std::string& what, std::string_view text)
    {
        return "  " + apps::paddedAfter(what, textColumn - 2) + std::string(text) + "\n";
    }

    std::string describedOption(const OptionInfo& option)
    {
        std::string name;
        if (!option.shortName.empty())
            name.append(option.shortName).append(", ");
        name += option.name;
        if (!option.value.empty())
            name.append(" ").append(option.value);
        return described(name, option.text);
    }

    std::string listed(std::string_view title, Intent intent)
    {
        std::string text(title);
        for (const CommandInfo& command : commands()) {
            // The last line of the text says how to get help.
            if (command.intent == intent && command.name != "help")
                text += described(std::string(command.name), command.summary);
        }
        return text;
    }

    std::string usageOf(const CommandInfo& command)
    {
        std::string usage = "  ombrix ";
        usage += command.name;
        if (!command.operands.empty())
            usage.append(" ").append(command.operands);
        for (const OptionInfo& option : command.options) {
            usage.append(option.isRequired ? " " : " [").append(option.name);
            if (!option.value.empty())
                usage.append(" ").append(option.value);
            usage += option.isRequired ? "" : "]";
        }
        return usage + "\n";
    }

} // namespace

std::string helpText()
{
    std::string text = "Show, follow and explain the media tree of your video editor.\n\n"
                       "  ombrix [OPTION...] COMMAND [ARGUMENT...]\n\n";
    text += listed("Look\n", Intent::look);
    text += listed("Follow\n", Intent::follow);
    text += listed("Act\n", Intent::act);
    text += listed("Ask\n", Intent::ask);
    text += "Options, before or after the command\n";
    for (const OptionInfo& option : globalOptions())
        text += describedOption(option);
    const Example& example = commandNamed("tree")->examples[0];
    text += "Example\n";
    text += "  " + apps::paddedAfter(example.command, 40) + " " + std::string(example.text) + "\n";
    text += "Environment\n";
    text += described("OMBRIX_LOG=2", "logs go to standard error");
    text += described("OMBRIX_PLUGIN_PATH", "folders that are searched for plug-ins first");
    text += described("NO_COLOR", "no colours; CLICOLOR_FORCE: also in a pipe");
    text += "Exit status: 0 done, 1 not done, 2 wrong usage. More: \"ombrix help COMMAND\"\n";
    return text;
}

std::string helpText(const CommandInfo& command)
{
    std::string text = "ombrix " + std::string(command.name) + ": " + std::string(command.summary) + "\n\n";
    text += usageOf(command) + "\n" + std::string(command.details) + "\n";
    if (!command.options.empty())
        text += "\nOptions\n";
    for (const OptionInfo& option : command.options)
        text += describedOption(option);
    text += "\nExamples\n";
    for (const Example& example : command.examples) {
        text += "  " + std::string(example.command) + "\n";
        text += "      " + std::string(example.text) + "\n";
    }
    text += command.takesSource ? "\nOptions of every command" : "\nOptions of every command, without --source";
    text += ": \"ombrix --help\".\n";
    return text;
}

std::string versionText()
{
    return "ombrix " + std::string(version) + " (host interface " + std::to_string(OBHostInterfaceVersion) + "."
        + std::to_string(OBHostInterfaceMinorVersion) + ")\n";
}

int runHelp(Program& program)
{
    const std::vector<std::string>& operands = program.arguments().operands;
    if (operands.empty()) {
        program.output().write(helpText());
        return done;
    }
    const CommandInfo* command = commandNamed(operands[0]);
    if (!command)
        return program.failUsage(unknownCommand(operands[0]));
    program.output().write(helpText(*command));
    return done;
}

} // namespace ombrix

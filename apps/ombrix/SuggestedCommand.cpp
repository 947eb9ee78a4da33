#include "apps/ombrix/SuggestedCommand.h"

#include "apps/ombrix/ShellWord.h"

namespace ombrix {

std::string suggestedCommand(const Arguments& arguments, std::string_view command, std::string_view operand)
{
    std::string text = "ombrix " + std::string(command);
    const bool looksLikeOption = operand.starts_with('-');
    if (!operand.empty() && !looksLikeOption)
        text += " " + shellWord(operand);
    if (arguments.machineFile)
        text += " --machine " + shellWord(*arguments.machineFile);
    if (arguments.source != defaultSource)
        text += " --source " + shellWord(arguments.source);
    if (looksLikeOption)
        text += " -- " + shellWord(operand);
    return text;
}

std::vector<std::string> machineArguments(const Arguments& arguments)
{
    std::vector<std::string> words { "--source", arguments.source };
    if (arguments.machineFile)
        words.insert(words.end(), { "--machine", *arguments.machineFile });
    return words;
}

} // namespace ombrix

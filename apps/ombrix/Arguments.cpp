#include "apps/ombrix/Arguments.h"

#include "apps/common/DidYouMean.h"
#include "apps/common/HostileNames.h"

namespace ombrix {
namespace {

    constexpr std::string_view endOfOptions = "--";

    const OptionInfo* optionNamed(std::span<const OptionInfo> options, std::string_view name)
    {
        for (const OptionInfo& option : options) {
            if (option.name == name || (!option.shortName.empty() && option.shortName == name))
                return &option;
        }
        return nullptr;
    }

    std::optional<apps::When> readWhen(std::string_view text)
    {
        if (text == "auto")
            return apps::When::automatic;
        if (text == "always")
            return apps::When::always;
        if (text == "never")
            return apps::When::never;
        return std::nullopt;
    }

    class Parser {
    public:
        explicit Parser(std::span<const std::string_view> words)
            : _words(words)
        {
        }

        ParsedArguments parse()
        {
            bool optionsEnded = false;
            while (_next < _words.size() && _result.problem.empty()) {
                const std::string_view word = _words[_next++];
                if (!optionsEnded && word == endOfOptions)
                    optionsEnded = true;
                else if (!optionsEnded && word.size() > 1 && word.front() == '-')
                    readOption(word);
                else
                    readOperand(word);
            }
            const Arguments& arguments = _result.arguments;
            if (_result.problem.empty() && !arguments.command && !arguments.wantsHelp && !arguments.wantsVersion)
                _result.problem = "no command given (\"ombrix --help\" lists them)";
            return std::move(_result);
        }

    private:
        void readOperand(std::string_view word)
        {
            Arguments& arguments = _result.arguments;
            if (!arguments.command) {
                arguments.command = commandNamed(word);
                if (!arguments.command)
                    _result.problem = unknownCommand(word);
                return;
            }
            arguments.operands.emplace_back(word);
            if (arguments.operands.size() > arguments.command->mostOperands)
                fail(apps::escapedText(word) + ": one argument too many");
        }

        void readOption(std::string_view word)
        {
            const std::size_t equals = word.substr(0, 2) == "--" ? word.find('=') : std::string_view::npos;
            const std::string_view name = word.substr(0, equals);
            const OptionInfo* option = optionNamed(globalOptions(), name);
            const bool isGlobal = option != nullptr;
            if (!option && _result.arguments.command)
                option = optionNamed(_result.arguments.command->options, name);
            if (!option)
                return fail("unknown option " + apps::escapedText(name) + suggestionFor(name));
            std::string value;
            if (equals != std::string_view::npos) {
                if (option->value.empty())
                    return fail("option " + std::string(name) + " takes no value");
                value = word.substr(equals + 1);
            } else if (!option->value.empty()) {
                if (_next == _words.size())
                    return fail("option " + std::string(name) + " needs a value: " + std::string(option->value));
                value = _words[_next++];
            }
            if (isGlobal)
                setGlobal(option->name, std::move(value));
            else
                _result.arguments.options.emplace_back(option->name, std::move(value));
        }

        void setGlobal(std::string_view name, std::string value)
        {
            Arguments& arguments = _result.arguments;
            if (name == "--machine")
                arguments.machineFile = std::move(value);
            else if (name == "--source")
                arguments.source = std::move(value);
            else if (name == "--color")
                setWhen(name, value, arguments.color);
            else if (name == "--hyperlink")
                setWhen(name, value, arguments.hyperlink);
            else if (name == "--help")
                arguments.wantsHelp = true;
            else if (name == "--version")
                arguments.wantsVersion = true;
        }

        void setWhen(std::string_view name, std::string_view value, apps::When& when)
        {
            constexpr std::string_view values[] { "auto", "always", "never" };
            if (const std::optional<apps::When> read = readWhen(value))
                when = *read;
            else
                fail("option " + std::string(name) + " is auto, always or never, not \"" + apps::escapedText(value)
                    + "\"" + apps::didYouMean(value, values));
        }

        std::string suggestionFor(std::string_view name) const
        {
            std::vector<std::string_view> names;
            for (const OptionInfo& option : globalOptions())
                names.push_back(option.name);
            const CommandInfo* command = _result.arguments.command;
            for (const OptionInfo& option : command ? command->options : std::span<const OptionInfo>())
                names.push_back(option.name);
            if (!command && isOptionOfSomeCommand(name))
                return " before the command (options of a command follow its name)";
            return apps::didYouMean(name, names);
        }

        static bool isOptionOfSomeCommand(std::string_view name)
        {
            for (const CommandInfo& command : commands()) {
                if (optionNamed(command.options, name))
                    return true;
            }
            return false;
        }

        void fail(const std::string& problem)
        {
            const CommandInfo* command = _result.arguments.command;
            _result.problem = command ? std::string(command->name) + ": " + problem : problem;
        }

        const std::span<const std::string_view> _words;
        std::size_t _next = 0;
        ParsedArguments _result;
    };

} // namespace

bool Arguments::has(std::string_view option) const
{
    return valueOf(option) != nullptr;
}

const std::string* Arguments::valueOf(std::string_view option) const
{
    const std::string* value = nullptr;
    for (const auto& [name, typed] : options) {
        if (name == option)
            value = &typed;
    }
    return value;
}

ParsedArguments parseArguments(std::span<const std::string_view> words)
{
    return Parser(words).parse();
}

std::string unknownCommand(std::string_view name)
{
    std::vector<std::string_view> names;
    for (const CommandInfo& command : commands())
        names.push_back(command.name);
    const std::string suggestion = apps::didYouMean(name, names);
    return "unknown command \"" + apps::escapedText(name) + "\""
        + (suggestion.empty() ? " (\"ombrix --help\" lists them)" : suggestion);
}

} // namespace ombrix

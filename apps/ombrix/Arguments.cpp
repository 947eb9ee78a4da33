#include "apps/ombrix/Arguments.h"

#include "apps/common/DidYouMean.h"
#include "apps/common/HostileNames.h"

#include <algorithm>

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
            while (_next < _words.size()) {
                const std::string_view word = _words[_next++];
                if (!optionsEnded && word == endOfOptions)
                    optionsEnded = true;
                else if (!optionsEnded && word.size() > 1 && word.front() == '-')
                    readOption(word);
                else
                    readOperand(word);
            }
            checkWhole();
            return std::move(_result);
        }

    private:
        /// What only the whole line can tell. Whoever asks for help gets it, whatever else was typed.
        void checkWhole()
        {
            const Arguments& arguments = _result.arguments;
            if (arguments.wantsHelp || arguments.wantsVersion)
                _result.problem.clear();
            else if (!arguments.command && _result.problem.empty())
                fail("no command given (\"ombrix --help\" lists them)");
            else if (arguments.command)
                checkOptions(*arguments.command);
        }

        void checkOptions(const CommandInfo& command)
        {
            if (isTyped("--source") && !command.takesSource)
                fail("option --source means nothing here");
            for (const OptionInfo& option : command.options) {
                if (isTyped(option.name) && isTyped(option.excludes))
                    fail("options " + std::string(option.name) + " and " + std::string(option.excludes)
                        + " exclude each other");
                if (option.isRequired && !isTyped(option.name))
                    fail("option " + std::string(option.name) + " " + std::string(option.value)
                        + " is missing (\"ombrix help " + std::string(command.name) + "\")");
            }
        }

        bool isTyped(std::string_view option) const
        {
            return std::find(_typed.begin(), _typed.end(), option) != _typed.end();
        }

        void readOperand(std::string_view word)
        {
            Arguments& arguments = _result.arguments;
            if (!arguments.command) {
                arguments.command = commandNamed(word);
                if (!arguments.command)
                    fail(unknownCommand(word));
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
            if (isTyped(option->name) && !option->value.empty() && !option->mayRepeat)
                return fail("option " + std::string(name) + " is given twice");
            _typed.push_back(option->name);
            if (isGlobal && !option->value.empty() && value.empty())
                fail("option " + std::string(name) + " needs a value: " + std::string(option->value));
            else if (isGlobal)
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
            return apps::didYouMeanOption(name, names);
        }

        static bool isOptionOfSomeCommand(std::string_view name)
        {
            for (const CommandInfo& command : commands()) {
                if (optionNamed(command.options, name))
                    return true;
            }
            return false;
        }

        /// Keeps the first problem, which later ones may only follow from.
        void fail(const std::string& problem)
        {
            if (!_result.problem.empty())
                return;
            const CommandInfo* command = _result.arguments.command;
            _result.problem = command ? std::string(command->name) + ": " + problem : problem;
        }

        const std::span<const std::string_view> _words;
        std::size_t _next = 0;
        std::vector<std::string_view> _typed {}; // options, by name
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

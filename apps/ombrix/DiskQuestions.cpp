#include "apps/ombrix/DiskQuestions.h"

#include <array>
#include <charconv>

namespace ombrix {
namespace {

    constexpr std::array<std::string_view, 7> names { "volumes", "source", "editor", "videos", "preferences", "folder",
        "count" };

    std::uint64_t numberIn(const DiskAnswer& answer, std::string_view name)
    {
        const std::string text = textIn(answer, name).value_or("0");
        std::uint64_t number = 0;
        std::from_chars(text.data(), text.data() + text.size(), number);
        return number;
    }

} // namespace

std::vector<std::string> wordsOf(DiskQuestion question, std::string_view about)
{
    return { std::string(names[static_cast<std::size_t>(question)]), std::string(about) };
}

std::optional<std::pair<DiskQuestion, std::string>> questionOfWords(const std::vector<std::string>& words)
{
    for (std::size_t index = 0; index < names.size() && words.size() == 2; ++index) {
        if (names[index] == words[0])
            return std::pair(static_cast<DiskQuestion>(index), words[1]);
    }
    return std::nullopt;
}

std::string bytesOfAnswer(const std::vector<std::pair<std::string, std::string>>& answer)
{
    std::string bytes;
    for (const auto& [name, text] : answer) {
        for (const std::string& part : { name, text })
            bytes.append(part.c_str()).push_back('\0');
    }
    return bytes.append("end").append(1, '\0');
}

DiskAnswer answerOfBytes(std::string_view bytes)
{
    std::vector<std::string> parts;
    for (std::size_t end = bytes.find('\0'); end != bytes.npos; end = bytes.find('\0')) {
        parts.emplace_back(bytes.substr(0, end));
        bytes.remove_prefix(end + 1);
    }
    if (!bytes.empty() || parts.size() % 2 == 0 || parts.back() != "end")
        return std::nullopt;
    DiskAnswer answer(std::in_place);
    for (std::size_t index = 0; index + 1 < parts.size(); index += 2)
        answer->emplace_back(parts[index], parts[index + 1]);
    return answer;
}

std::optional<std::string> textIn(const DiskAnswer& answer, std::string_view name)
{
    std::vector<std::string> texts = textsIn(answer, name);
    return texts.empty() ? std::nullopt : std::optional(texts.front());
}

std::vector<std::string> textsIn(const DiskAnswer& answer, std::string_view name)
{
    std::vector<std::string> texts;
    if (!answer)
        return texts;
    for (const auto& [key, text] : *answer) {
        if (key == name)
            texts.push_back(text);
    }
    return texts;
}

std::vector<std::pair<std::string, std::string>> answerOfState(const FolderState& state)
{
    return { { "problem", std::to_string(static_cast<int>(state.problem)) }, { "blockedAt", state.blockedAt },
        { "realPath", state.realPath }, { "fileSystem", state.fileSystem }, { "isFit", state.isFit ? "1" : "0" },
        { "means", std::to_string(static_cast<int>(state.means)) } };
}

FolderState stateOfAnswer(const FolderState& asked, const DiskAnswer& answer)
{
    FolderState state;
    state.path = asked.path;
    state.name = asked.name;
    state.timesSearched = asked.timesSearched;
    state.isSilent = !answer;
    state.problem = static_cast<platform::FileProblem>(numberIn(answer, "problem"));
    state.blockedAt = textIn(answer, "blockedAt").value_or("");
    state.realPath = textIn(answer, "realPath").value_or("");
    state.fileSystem = textIn(answer, "fileSystem").value_or("");
    state.isFit = numberIn(answer, "isFit") == 1;
    state.means = static_cast<platform::FollowingMeans>(numberIn(answer, "means"));
    return state;
}

} // namespace ombrix

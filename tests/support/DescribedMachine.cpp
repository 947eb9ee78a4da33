#include "tests/support/DescribedMachine.h"

#include "platform/described/DescribedPlatform.h"
#include "tests/support/TemporaryFolder.h"

#include <cstdio>
#include <cstdlib>
#include <utility>

namespace tests {

namespace {

    std::string quoted(const std::string& text)
    {
        std::string result = "\"";
        for (char letter : text) {
            if (letter == '"' || letter == '\\')
                result.push_back('\\');
            result.push_back(letter);
        }
        return result + "\"";
    }

    void appendMember(std::string& object, const std::string& key, const std::string& value)
    {
        object += (object.empty() ? "" : ", ") + quoted(key) + ": " + value;
    }

    std::string quotedOrNull(const std::optional<std::string>& text)
    {
        return text ? quoted(*text) : "null";
    }

} // namespace

DescribedMachine::DescribedMachine() = default;
DescribedMachine::~DescribedMachine() = default;

DescribedMachine& DescribedMachine::home(const std::string& path)
{
    _home = path;
    return *this;
}

DescribedMachine& DescribedMachine::editor(const std::string& path)
{
    _editor = path;
    return *this;
}

DescribedMachine& DescribedMachine::localVolume(
    const std::string& path, std::optional<std::string> displayName, std::optional<std::string> fileSystem)
{
    _localVolumes.push_back({ path, std::move(displayName), std::move(fileSystem) });
    return *this;
}

DescribedMachine& DescribedMachine::removableMedium(
    const std::string& path, std::optional<std::string> displayName, std::optional<std::string> fileSystem)
{
    _removableMedia.push_back({ path, std::move(displayName), std::move(fileSystem) });
    return *this;
}

DescribedMachine& DescribedMachine::link(const std::string& path, const std::string& target)
{
    _links.push_back({ path, target });
    return *this;
}

std::string DescribedMachine::jsonOf(const std::vector<Volume>& volumes)
{
    std::string list;
    for (const Volume& volume : volumes) {
        std::string object;
        appendMember(object, "path", quoted(volume.path));
        if (volume.displayName)
            appendMember(object, "displayName", quoted(*volume.displayName));
        if (volume.fileSystem)
            appendMember(object, "fileSystem", quoted(*volume.fileSystem));
        list += (list.empty() ? "{" : ", {") + object + "}";
    }
    return "[" + list + "]";
}

std::string DescribedMachine::json() const
{
    std::string links;
    for (const Link& link : _links)
        appendMember(links, link.path, quoted(link.target));
    std::string machine;
    appendMember(machine, "home", quotedOrNull(_home));
    appendMember(machine, "localVolumes", jsonOf(_localVolumes));
    appendMember(machine, "removableMedia", jsonOf(_removableMedia));
    appendMember(machine, "links", "{" + links + "}");
    appendMember(machine, "editor", _editor ? "{\"path\": " + quoted(*_editor) + "}" : "null");
    return "{" + machine + "}\n";
}

void DescribedMachine::write(const std::string& file) const
{
    writeFile(file, json());
}

platform::Platform DescribedMachine::platform(const std::string& file, const platform::Platform& base)
{
    if (!_machine) {
        write(file);
        platform::DescribedPlatformResult result = platform::describedPlatform(file, base);
        if (!result.machine) {
            std::fprintf(stderr, "tests: %s\n", result.problem.c_str());
            std::abort();
        }
        _machine = std::move(result.machine);
    }
    return _machine->platform();
}

} // namespace tests

#include "platform/described/MachineDescription.h"

#include "platform/PathText.h"
#include "platform/common/LexicalPath.h"
#include "platform/formats/JsonShape.h"
#include "platform/formats/Quoted.h"

#include <array>
#include <set>
#include <utility>

namespace platform {

namespace {

    constexpr std::array<JsonKey, 5> machineKeys { {
        { "home", JsonTypes::text | JsonTypes::null, JsonPresence::optional },
        { "localVolumes", JsonTypes::list, JsonPresence::optional },
        { "removableMedia", JsonTypes::list, JsonPresence::optional },
        { "links", JsonTypes::object, JsonPresence::optional },
        { "editor", JsonTypes::object | JsonTypes::null, JsonPresence::optional },
    } };
    constexpr std::array<JsonKey, 3> volumeKeys { {
        { "path" },
        { "displayName", JsonTypes::text, JsonPresence::optional },
        { "fileSystem", JsonTypes::text, JsonPresence::optional },
    } };
    constexpr std::array<JsonKey, 1> editorKeys { { { "path" } } };

    std::string nameOfKey(std::string_view key)
    {
        return "key " + quoted(key);
    }

    /// Goes through a document and keeps the first thing that is wrong with it.
    class Reader {
    public:
        explicit Reader(std::string_view folder)
            : _folder(folder)
        {
        }

        MachineDescriptionResult read(const JsonNode& root)
        {
            if (!hasShape(root, machineKeys, "the description"))
                return { {}, std::move(_problem) };
            MachineDescription machine;
            if (const JsonNode* home = presentMember(root, "home"))
                machine.home = path(*home, "home");
            machine.localVolumes = volumes(root, "localVolumes");
            machine.removableMedia = volumes(root, "removableMedia");
            if (const JsonNode* links = root.member("links"))
                machine.links = linksIn(*links);
            if (const JsonNode* editor = presentMember(root, "editor");
                editor && hasShape(*editor, editorKeys, "the editor"))
                machine.editorPath = path(*editor->member("path"), "path");
            if (!_problem.empty())
                return { {}, std::move(_problem) };
            return { std::move(machine), {} };
        }

    private:
        static const JsonNode* presentMember(const JsonNode& object, std::string_view key)
        {
            const JsonNode* member = object.member(key);
            return member && member->kind != JsonNode::Kind::null ? member : nullptr;
        }

        bool keep(std::string problem)
        {
            if (_problem.empty())
                _problem = std::move(problem);
            return _problem.empty();
        }
        bool fail(int line, const std::string& what) { return keep(std::to_string(line) + ": " + what); }
        bool hasShape(const JsonNode& node, std::span<const JsonKey> keys, std::string_view name)
        {
            return keep(shapeProblem(node, keys, name));
        }

        bool isUsable(std::string_view text, int line, std::string_view key)
        {
            if (text.empty())
                return fail(line, nameOfKey(key) + " must not be empty");
            return holdsNoZero(text, line, key);
        }
        bool holdsNoZero(std::string_view text, int line, std::string_view key)
        {
            return text.find('\0') == std::string_view::npos || fail(line, nameOfKey(key) + " holds a zero byte");
        }

        std::string path(const JsonNode& node, std::string_view key)
        {
            return isUsable(node.text, node.line, key) ? lexicallyAbsolute(node.text, _folder) : std::string();
        }

        std::vector<DescribedVolume> volumes(const JsonNode& root, std::string_view key)
        {
            std::vector<DescribedVolume> volumes;
            const JsonNode* list = root.member(key);
            for (std::size_t index = 0; list && index < list->items.size(); ++index) {
                const JsonNode& item = list->items[index];
                if (!hasShape(item, volumeKeys, "an item of " + nameOfKey(key)))
                    break;
                volumes.push_back(volume(item));
            }
            return volumes;
        }

        DescribedVolume volume(const JsonNode& item)
        {
            DescribedVolume volume;
            volume.path = path(*item.member("path"), "path");
            volume.displayName = lastPathComponent(volume.path);
            if (const JsonNode* name = item.member("displayName");
                name && holdsNoZero(name->text, name->line, "displayName"))
                volume.displayName = name->text;
            if (const JsonNode* type = item.member("fileSystem");
                type && isUsable(type->text, type->line, "fileSystem"))
                volume.fileSystem = type->text;
            return volume;
        }

        std::vector<AddedLink> linksIn(const JsonNode& object)
        {
            std::vector<AddedLink> links;
            std::set<std::string> paths;
            for (const JsonMember& member : object.members) {
                if (!keep(typeProblem(member.value, JsonTypes::text, nameOfKey(member.key)))
                    || !holdsNoZero(member.key, member.line, member.key) || !isLinkPath(member))
                    break;
                AddedLink link { lexicallyAbsolute(member.key, _folder), path(member.value, member.key) };
                if (!paths.insert(link.path).second) {
                    fail(member.line, nameOfKey(member.key) + " names the same path as a key before it");
                    break;
                }
                links.push_back(std::move(link));
            }
            return links;
        }

        bool isLinkPath(const JsonMember& member)
        {
            if (member.key.empty())
                return fail(member.line, "a key of \"links\" must not be empty");
            return lexicallyAbsolute(member.key, _folder) != "/"
                || fail(member.line, nameOfKey(member.key) + " is the root, which cannot be a link");
        }

        const std::string_view _folder;
        std::string _problem {};
    };

} // namespace

MachineDescriptionResult readMachineDescription(std::string_view bytes, std::string_view folder)
{
    const JsonResult document = readJson(bytes);
    if (!document.problem.empty())
        return { {}, document.problem };
    return Reader(folder).read(document.root);
}

} // namespace platform

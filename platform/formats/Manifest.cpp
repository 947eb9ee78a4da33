#include "platform/formats/Manifest.h"

#include "platform/formats/JsonShape.h"
#include "platform/formats/Quoted.h"

#include <array>
#include <limits>

namespace platform {
namespace {

    constexpr std::array<JsonKey, 6> manifestKeys { { { "identifier" }, { "version" },
        { "hostInterface", JsonTypes::object }, { "library" }, { "class" }, { "languages", JsonTypes::list } } };

    constexpr std::array<JsonKey, 2> rangeKeys { { { "minimum", JsonTypes::integer },
        { "maximum", JsonTypes::integer } } };

    std::string problemOn(const JsonNode& node, const std::string& what)
    {
        return std::to_string(node.line) + ": " + what;
    }

    /// Names of files and languages become one component of a path.
    bool isPathComponent(std::string_view name)
    {
        constexpr std::string_view forbidden("/\0", 2);
        return !name.empty() && name != "." && name != ".." && name.find_first_of(forbidden) == std::string_view::npos;
    }

    std::string rangeProblem(const JsonNode& range)
    {
        std::string problem = shapeProblem(range, rangeKeys, "key \"hostInterface\"");
        if (!problem.empty())
            return problem;
        for (const JsonMember& member : range.members) {
            if (member.value.integer < 0 || member.value.integer > std::numeric_limits<int>::max())
                return problemOn(member.value, "key " + quoted(member.key) + " is out of range");
        }
        const JsonNode& maximum = *range.member("maximum");
        if (maximum.integer < range.member("minimum")->integer)
            return problemOn(maximum, "key \"maximum\" is less than \"minimum\"");
        return {};
    }

    std::string languagesProblem(const JsonNode& languages)
    {
        for (const JsonNode& language : languages.items) {
            std::string problem = typeProblem(language, JsonTypes::text, "a language");
            if (!problem.empty())
                return problem;
            if (!isPathComponent(language.text))
                return problemOn(language, quoted(language.text) + " is no language");
        }
        return {};
    }

    std::string manifestProblem(const JsonNode& root)
    {
        std::string problem = shapeProblem(root, manifestKeys, "the manifest");
        if (!problem.empty())
            return problem;
        for (std::string_view key : { "identifier", "library", "class" }) {
            const JsonNode& node = *root.member(key);
            if (node.text.empty() || node.text.find('\0') != std::string::npos)
                return problemOn(node, "key " + quoted(key) + " holds no name");
        }
        if (const JsonNode& library = *root.member("library"); !isPathComponent(library.text))
            return problemOn(library, "key \"library\" must be the name of a file in the bundle");
        problem = rangeProblem(*root.member("hostInterface"));
        return problem.empty() ? languagesProblem(*root.member("languages")) : problem;
    }

} // namespace

ManifestAnswer readManifest(std::string_view bytes)
{
    const JsonResult document = readJson(bytes);
    ManifestAnswer answer;
    answer.problem = document.problem.empty() ? manifestProblem(document.root) : document.problem;
    if (!answer.problem.empty())
        return answer;
    const auto textUnder = [&](std::string_view key) { return document.root.member(key)->text; };
    const JsonNode& range = *document.root.member("hostInterface");
    BundleManifest& manifest = answer.manifest;
    manifest.identifier = textUnder("identifier");
    manifest.version = textUnder("version");
    manifest.hostInterfaceMinimum = static_cast<int>(range.member("minimum")->integer);
    manifest.hostInterfaceMaximum = static_cast<int>(range.member("maximum")->integer);
    manifest.library = textUnder("library");
    manifest.className = textUnder("class");
    for (const JsonNode& language : document.root.member("languages")->items)
        manifest.languages.push_back(language.text);
    return answer;
}

} // namespace platform

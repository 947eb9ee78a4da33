// What the source writes for the editor when a person copies or drags: the projects of what was chosen, each with all
// that was rendered of it.
//
// The surprises, all meant: movies that are no representatives, and clips, name themselves as their project, which then
// is not found, so an empty dictionary is written; and a project that was chosen twice is listed twice.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"

#include "host/OBConstants.h"
#include "platform/NumberText.h"
#include "platform/Pasteboard.h"

#include <unordered_map>
#include <utility>

using platform::Size;
using platform::Text;
using platform::Value;

namespace {

constexpr const char* projectsPasteboardType = "OBMontaroProjectsPboardType";

std::string dimensionsText(const Size& size)
{
    return "{" + platform::numberText(size.width) + ", " + platform::numberText(size.height) + "}";
}

/// Null for an object whose file is gone.
Value renderedVersion(OBMediaObject& object)
{
    const Text path = object.aliasResolvedPath();
    if (!path)
        return {};
    Value::Dictionary version { { "Path", path } };
    if (const Text name = object.name())
        version.emplace_back("Name", name);
    const Value resolution = object.attributeForKey(OBMediaObjectResolutionKey);
    if (const Size* size = resolution.size())
        version.emplace_back("Dimensions", Text(dimensionsText(*size)));
    if (Value duration = object.attributeForKey(OBMediaObjectDurationKey); !duration.isNull())
        version.emplace_back("Duration", std::move(duration));
    return version;
}

/// Null for a project without a path, or of which nothing rendered is left.
Value projectEntry(const OBMediaGroup& project)
{
    Value::List versions;
    project.mediaObjects().visit([&](OBMediaObject& object) {
        if (Value version = renderedVersion(object); !version.isNull())
            versions.push_back(std::move(version));
        return true;
    });
    const Text path = project.URL().path;
    if (!path || versions.empty())
        return {};
    Value::Dictionary entry { { "RenderedVersions", std::move(versions) }, { "ProjectPath", path } };
    if (const Text name = project.name())
        entry.emplace_back("ProjectName", name);
    return entry;
}

} // namespace

Value OBMontaroPlugin::supportedPasteboardTypes()
{
    const Value types = Value::List { projectsPasteboardType };
    return Value::List { types };
}

bool OBMontaroPlugin::writeMediaObjects_toPasteboard(const OBMediaObjectList& objects, platform::Pasteboard& pasteboard)
{
    const bool written = OBMediaManager::writeMediaObjects_toPasteboard(objects, pasteboard);
    std::vector<Text> paths;
    objects.visit([&](OBMediaObject& object) {
        const Value path = object.attributeForKey(OBMontaroProjectPathKey);
        if (const Text* text = path.text())
            paths.push_back(*text);
        return true;
    });
    if (paths.empty())
        return written;
    writeProjects(projectGroupsForPaths(paths), pasteboard);
    return true;
}

bool OBMontaroPlugin::writeMediaGroups_toPasteboard(const OBMediaGroupList& groups, platform::Pasteboard& pasteboard)
{
    std::vector<OBMediaGroupRef> forHost;
    std::vector<OBMediaGroupRef> projects;
    for (const OBMediaGroupRef& group : groups) {
        if (!group)
            continue;
        if (group->typeIdentifier() != OBMontaroProjectGroupTypeIdentifier) {
            forHost.push_back(group);
            continue;
        }
        const OBMediaObjectList movies = group->mediaObjects();
        if (movies.size() >= 2) {
            const OBMediaGroupRef oneMovie = group->copy();
            oneMovie->setMediaObjects(movies.prefix(1));
            forHost.push_back(oneMovie);
        } else {
            forHost.push_back(group);
        }
        projects.push_back(group);
    }
    const bool written
        = OBMediaManager::writeMediaGroups_toPasteboard(OBMediaGroupList(std::move(forHost)), pasteboard);
    if (projects.empty())
        return written;
    writeProjects(OBMediaGroupList(std::move(projects)), pasteboard);
    return true;
}

void OBMontaroPlugin::writeProjects(const OBMediaGroupList& projects, platform::Pasteboard& pasteboard)
{
    pasteboard.addTypes({ projectsPasteboardType }, this);
    pasteboard.setPropertyList(dictionaryWithProjects(projects), projectsPasteboardType);
}

OBMediaGroupList OBMontaroPlugin::projectGroupsForPaths(const std::vector<Text>& paths)
{
    std::vector<OBMediaGroupRef> results;
    projectGroupsForPaths_currentGroup_resultsArray(paths, rootMediaGroup(), results);
    return OBMediaGroupList(std::move(results));
}

/// Keeps a list of what is still to be searched, so that a tree may be as deep as it likes.
void OBMontaroPlugin::projectGroupsForPaths_currentGroup_resultsArray(
    const std::vector<Text>& paths, const OBMediaGroupRef& currentGroup, std::vector<OBMediaGroupRef>& results)
{
    std::unordered_map<std::string_view, std::size_t> occurrences;
    for (const Text& path : paths)
        ++occurrences[path];
    std::vector<OBMediaGroupRef> waiting;
    if (currentGroup)
        waiting.push_back(currentGroup);
    while (!waiting.empty()) {
        const OBMediaGroupRef group = std::move(waiting.back());
        waiting.pop_back();
        if (group->typeIdentifier() == OBMontaroProjectGroupTypeIdentifier) {
            const Text path = group->URL().path;
            const auto known = path ? occurrences.find(path) : occurrences.end();
            if (known != occurrences.end())
                results.insert(results.end(), known->second, group);
        }
        const OBMediaGroupList children = group->childGroups();
        for (std::size_t index = children.size(); index > 0; --index)
            waiting.push_back(children[index - 1]);
    }
}

Value OBMontaroPlugin::dictionaryWithProjects(const OBMediaGroupList& projects)
{
    Value::List entries;
    for (const OBMediaGroupRef& project : projects) {
        if (Value entry = projectEntry(*project); !entry.isNull())
            entries.push_back(std::move(entry));
    }
    Value::Dictionary dictionary;
    if (!entries.empty())
        dictionary.emplace_back("ProjectList", std::move(entries));
    return dictionary;
}

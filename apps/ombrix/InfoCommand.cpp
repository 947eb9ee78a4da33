// "info": what is known of a source without loading its tree.

#include "apps/common/DisplayWidth.h"
#include "apps/common/HumanText.h"
#include "apps/common/RecordJson.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/SearchFolders.h"
#include "apps/ombrix/SuggestedCommand.h"
#include "apps/ombrix/TextLine.h"
#include "host/OBBundle.h"
#include "host/OBSourceInspection.h"
#include "platform/FileSystem.h"
#include "platform/NumberText.h"

namespace ombrix {
namespace {

    using platform::Text;
    using platform::Value;

    /// A null value for an absent text.
    Value valueOf(const Text& text)
    {
        return text ? Value(text) : Value();
    }

    template <class Fact> Value valueOf(const std::optional<Fact>& fact)
    {
        return fact ? Value(*fact) : Value();
    }

    Value pasteboardTypes(Program& program)
    {
        const OBMediaManagerClass* managerClass = program.session()->host().managerClass(program.session()->source());
        Value types = managerClass ? managerClass->supportedPasteboardTypes() : Value();
        return types.list() ? types : Value(Value::List());
    }

    void printJson(Program& program, OBMediaManager& manager)
    {
        OBSourceInspection* inspection = manager.inspection();
        Value::Dictionary info;
        info.emplace_back("displayName", valueOf(manager.displayName()));
        info.emplace_back("uniqueID", valueOf(manager.uniqueID()));
        info.emplace_back("appPath", valueOf(manager.getAppPath()));
        info.emplace_back("appInstalled", manager.appInstalled());
        info.emplace_back("canLoadData", manager.canLoadData());
        info.emplace_back("applicationVersion", valueOf(manager.applicationVersion()));
        info.emplace_back("mediaTypesSupported", manager.mediaTypesSupported());
        info.emplace_back("mostRecentEventFirst", inspection ? valueOf(inspection->mostRecentEventFirst()) : Value());
        info.emplace_back("loadThreadPriority", manager.loadThreadPriority());
        info.emplace_back("supportedPasteboardTypes", pasteboardTypes(program));
        info.emplace_back("pluginVersionNumber", inspection ? valueOf(inspection->pluginVersionNumber()) : Value());
        const auto version = inspection ? inspection->pluginVersionString() : std::nullopt;
        info.emplace_back("pluginVersionString", version ? Value(std::string_view(*version)) : Value());
        apps::printValue(program.output(), std::move(info));
    }

    constexpr int labelEnd = 10;
    constexpr int textStart = labelEnd + 3;

    void printFact(Program& program, std::string_view label, const std::string& text)
    {
        TextLine line(program.style(), program.columns());
        line.add(labelEnd - static_cast<int>(label.size()), label, TextLine::Look::dim);
        program.printWrapped(line, textStart, text);
    }

    std::string editorText(Program& program, OBMediaManager& manager, bool canLoad)
    {
        if (!manager.appInstalled())
            return "not installed";
        const Text path = manager.getAppPath();
        const Text version = manager.applicationVersion();
        return program.style().name(path) + (version ? " (" + version.string() + ")" : std::string())
            + (canLoad ? "" : ", but nothing exists there");
    }

    std::string countsText(
        const platform::FileSystem& fileSystem, const std::vector<std::string>& folders, std::string_view what)
    {
        const SearchFolderCounts counts = countSearchFolders(fileSystem, folders);
        std::string text = apps::countText(counts.existing) + " of " + apps::countText(folders.size()) + " "
            + std::string(what) + " folders exist";
        if (counts.unreadable > 0)
            text += " (" + apps::countText(counts.unreadable) + " not readable)";
        return text;
    }

    std::string librariesText(OBMediaManager& manager, OBSourceInspection& inspection)
    {
        const platform::FileSystem& fileSystem = manager.platform().fileSystem;
        return countsText(fileSystem, inspection.projectSearchPaths(), "project") + ", "
            + countsText(fileSystem, inspection.eventSearchPaths(), "event");
    }

    /// A command is to be typed, so it stands on a line of its own where it would be broken.
    void printLibraries(Program& program, OBMediaManager& manager, OBSourceInspection& inspection)
    {
        const std::string text = librariesText(manager, inspection);
        const std::string hint = "\"" + suggestedCommand(program.arguments(), "paths") + "\"";
        const std::string both = text + "   " + hint;
        if (!program.columns() || textStart + apps::displayWidth(both) <= *program.columns())
            return printFact(program, "libraries", both);
        printFact(program, "libraries", text);
        TextLine line(program.style(), program.columns());
        program.printLine(line.addWhole(textStart, hint).text());
    }

    /// The names in a list of types, or of lists of them.
    void addTypes(const Value& types, std::string& text)
    {
        if (const Text* name = types.text())
            text += (text.empty() ? "" : ", ") + name->string();
        else if (const Value::List* list = types.list()) {
            for (const Value& type : *list)
                addTypes(type, text);
        }
    }

    std::string typesText(const Value& types)
    {
        std::string text;
        addTypes(types, text);
        return text.empty() ? "nothing" : text;
    }

    void printText(Program& program, OBMediaManager& manager)
    {
        TextLine title(program.style(), program.columns());
        title.addBehind(program.style().name(manager.displayName()), TextLine::Look::bold);
        const bool canLoad = manager.canLoadData();
        const std::string state = canLoad ? "ready, " : "cannot load, ";
        title.addBehind(
            "   " + state + manager.pluginIdentifier().string() + " " + manager.pluginBundle().manifest().version);
        program.printLine(title.text());
        // A source that loads without an editor has none.
        if (!canLoad || manager.appInstalled())
            printFact(program, "editor", editorText(program, manager, canLoad));
        if (OBSourceInspection* inspection = manager.inspection()) {
            printLibraries(program, manager, *inspection);
            if (const std::optional<bool> newest = inspection->mostRecentEventFirst())
                printFact(program, "order", *newest ? "newest events first" : "oldest events first");
        }
        printFact(program, "thread", "load priority " + platform::numberText(manager.loadThreadPriority()));
        printFact(program, "offers", typesText(pasteboardTypes(program)));
    }

} // namespace

int runInfo(Program& program)
{
    const std::shared_ptr<OBMediaManager> manager = program.manager();
    if (!manager)
        return failed;
    if (program.wantsJson())
        printJson(program, *manager);
    else
        printText(program, *manager);
    return done;
}

} // namespace ombrix

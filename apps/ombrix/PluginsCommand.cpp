// "plugins": every bundle that was found, and whether it works.

#include "apps/common/DisplayWidth.h"
#include "apps/common/PluginPath.h"
#include "apps/common/RecordJson.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/TextLine.h"

#include <algorithm>

namespace ombrix {
namespace {

    using platform::Value;

    Value textOrNull(const std::string& text)
    {
        return text.empty() ? Value() : Value(std::string_view(text));
    }

    /// Why it is refused, else what is amiss in it; empty when all is well.
    const std::string& remarkOn(const OBPluginInfo& plugin)
    {
        return plugin.reason.empty() ? plugin.flaw : plugin.reason;
    }

    void printJson(Program& program, const std::vector<OBPluginInfo>& plugins)
    {
        Value::List list;
        for (const OBPluginInfo& plugin : plugins) {
            list.emplace_back(Value::Dictionary { { "identifier", textOrNull(plugin.identifier) },
                { "version", textOrNull(plugin.version) }, { "path", textOrNull(plugin.path) },
                { "loaded", plugin.loaded }, { "reason", textOrNull(remarkOn(plugin)) } });
        }
        apps::printValue(program.output(), std::move(list));
    }

    void printText(Program& program, const std::vector<OBPluginInfo>& plugins)
    {
        const apps::Style& style = program.style();
        int identifier = 0;
        int version = 0;
        for (const OBPluginInfo& plugin : plugins) {
            identifier = std::max(identifier, apps::displayWidth(style.name(plugin.identifier)));
            version = std::max(version, apps::displayWidth(style.name(plugin.version)));
        }
        for (const OBPluginInfo& plugin : plugins) {
            TextLine line(style, program.columns());
            line.add(0, style.name(plugin.identifier.empty() ? "?" : plugin.identifier), TextLine::Look::bold);
            line.add(identifier + 3, style.name(plugin.version));
            line.add(identifier + 3 + version + 3, plugin.loaded ? "loaded" : "refused",
                plugin.loaded ? TextLine::Look::plain : TextLine::Look::warning);
            const std::string path = style.name(plugin.path);
            const int pathStart = identifier + 3 + version + 3 + 10;
            const bool isBeside = !program.columns() || pathStart + apps::displayWidth(path) <= *program.columns();
            if (isBeside)
                line.add(pathStart, path, TextLine::Look::dim);
            program.printLine(line.text());
            if (!isBeside)
                program.printLine(TextLine(style, program.columns()).addName(4, path, TextLine::Look::dim).text());
            if (const std::string& remark = remarkOn(plugin); !remark.empty())
                program.printWrapped(TextLine(style, program.columns()), 4, style.name(remark));
        }
    }

} // namespace

int runPlugins(Program& program)
{
    apps::Session* session = program.session();
    if (!session)
        return failed;
    const std::vector<OBPluginInfo> plugins = session->host().tryAllPlugins();
    if (program.wantsJson())
        printJson(program, plugins);
    else
        printText(program, plugins);
    program.output().flush();
    for (const std::string& problem : apps::problemsOfPluginPath(session->platform().fileSystem))
        program.warn(problem);
    return done;
}

} // namespace ombrix

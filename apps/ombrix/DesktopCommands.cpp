// "open" and "reveal": the actions of a movie's menu.

#include "apps/ombrix/AbsolutePath.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"

#include "host/OBConstants.h"
#include "host/OBMediaObject.h"
#include "platform/Notifications.h"
#include "platform/Workspace.h"

#include <algorithm>
#include <chrono>
#include <future>
#include <memory>

namespace ombrix {
namespace {

    constexpr std::chrono::seconds longestWait { 4 };

    /// False where `menu` has no such item.
    bool chooseItem(const OBMenuRef& menu, std::string_view action)
    {
        if (!menu)
            return false;
        const auto item = std::find_if(menu->items.begin(), menu->items.end(),
            [action](const OBMenuItem& each) { return each.action->name == action; });
        if (item == menu->items.end())
            return false;
        item->choose();
        return true;
    }

    /// Chooses the item called `action` of the menu for the file at `path`, and waits for what becomes of it. `place`
    /// and `notAttempted` say what is wrong where nothing was attempted.
    int choose(Program& program, std::string_view action, const std::string& path, std::string_view place,
        std::string_view notAttempted)
    {
        const std::shared_ptr<OBMediaManager> manager = program.manager();
        if (!manager)
            return failed;
        const OBMediaObjectRef object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, path);
        object->setPath(path);
        const platform::Platform& machine = manager->platform();
        bool isAttempted = false;
        const auto token = machine.notifications.addObserver(OBWillOpenOrRevealInSourceNotification, manager.get(),
            [&isAttempted](const platform::Notification&) { isAttempted = true; });
        const auto answer = std::make_shared<std::promise<platform::HandOver>>();
        std::future<platform::HandOver> handedOver = answer->get_future();
        machine.workspace.observeHandOvers([answer](const platform::HandOver& outcome) { answer->set_value(outcome); });

        const bool isOffered = chooseItem(manager->contextMenuForMediaObject_inMediaGroup(object, nullptr), action);
        machine.notifications.removeObserver(token);
        int status = done;
        if (!isOffered)
            status = program.fail(place, "the menu of " + manager->displayName().string() + " does not offer this");
        else if (!isAttempted)
            status = program.fail(place, notAttempted);
        else if (handedOver.wait_for(longestWait) != std::future_status::ready)
            status = program.fail(place, "the desktop did not answer within 4 seconds");
        else if (const platform::HandOver outcome = handedOver.get(); !outcome.isDone)
            status = program.fail(place, outcome.problem);
        machine.workspace.observeHandOvers(nullptr);
        return status;
    }

    int chooseFor(Program& program, std::string_view action, const std::string& typed, std::string_view notAttempted)
    {
        const std::optional<std::string> path = typed.empty() ? typed : absolutePath(typed);
        if (!path)
            return program.fail(typed, noCurrentFolder);
        return choose(program, action, *path, typed.empty() ? "editor" : typed, notAttempted);
    }

} // namespace

int runOpen(Program& program)
{
    const std::vector<std::string>& operands = program.arguments().operands;
    const std::string path = operands.empty() ? std::string() : operands[0];
    return chooseFor(program, "contextMenuOpen:", path, "the editor is not installed");
}

int runReveal(Program& program)
{
    const std::vector<std::string>& operands = program.arguments().operands;
    if (operands.empty())
        return program.failUsage("reveal: PATH is missing (\"ombrix help reveal\")");
    return chooseFor(program, "contextMenuReveal:", operands[0], "no such file or directory");
}

} // namespace ombrix

// "open" and "reveal": the actions of a movie's menu.

#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"

#include "host/OBConstants.h"
#include "host/OBMediaObject.h"
#include "platform/Notifications.h"
#include "platform/Threads.h"
#include "platform/Workspace.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <filesystem>
#include <future>
#include <memory>
#include <system_error>

namespace ombrix {
namespace {

    constexpr std::chrono::seconds longestWait { 4 };

    /// What became of the first thing that was handed over; one action may hand over several.
    struct FirstAnswer {
        void take(const platform::HandOver& outcome)
        {
            if (!_isThere.exchange(true))
                promise.set_value(outcome);
        }
        std::promise<platform::HandOver> promise {};

    private:
        std::atomic<bool> _isThere { false };
    };

    /// False where `menu` has no such item.
    bool chooseItem(const OBMenuRef& menu, std::string_view action)
    {
        if (!menu)
            return false;
        const auto item = std::find_if(menu->items.begin(), menu->items.end(),
            [action](const OBMenuItem& each) { return each.action && each.action->name == action; });
        if (item == menu->items.end())
            return false;
        item->choose();
        return true;
    }

    enum class Choice { notOffered, notAttempted, attempted };

    /// Chooses the item called `action` of the menu for the file at `path`. Waits for the disks that are asked.
    Choice choose(OBMediaManager& manager, std::string_view action, const std::string& path)
    {
        const OBMediaObjectRef object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, path);
        object->setPath(path);
        bool isAttempted = false;
        platform::NotificationCenter& notifications = manager.platform().notifications;
        const auto token = notifications.addObserver(OBWillOpenOrRevealInSourceNotification, &manager,
            [&isAttempted](const platform::Notification&) { isAttempted = true; });
        const bool isOffered = chooseItem(manager.contextMenuForMediaObject_inMediaGroup(object, nullptr), action);
        notifications.removeObserver(token);
        if (!isOffered)
            return Choice::notOffered;
        return isAttempted ? Choice::attempted : Choice::notAttempted;
    }

    /// The same on another thread, so that a disk that does not answer keeps nobody waiting for longer than the desktop
    /// may. `place` and `notAttempted` say what is wrong where nothing was attempted.
    int chooseInTime(Program& program, std::string_view action, const std::string& path, std::string_view place,
        std::string_view notAttempted)
    {
        const std::shared_ptr<OBMediaManager> manager = program.manager();
        if (!manager)
            return failed;
        const platform::Platform& machine = manager->platform();
        const auto answer = std::make_shared<FirstAnswer>();
        std::future<platform::HandOver> handedOver = answer->promise.get_future();
        machine.workspace.observeHandOvers([answer](const platform::HandOver& outcome) { answer->take(outcome); });
        const auto choosing = std::make_shared<std::packaged_task<Choice()>>(
            [manager, action, path] { return choose(*manager, action, path); });
        std::future<Choice> chosen = choosing->get_future();
        if (!machine.threads.startDetached("choose", [choosing] { (*choosing)(); }))
            return program.fail(place, "the system gives no thread");

        const auto end = std::chrono::steady_clock::now() + longestWait;
        if (chosen.wait_until(end) != std::future_status::ready)
            return program.fail(place, "the disk did not answer within 4 seconds");
        switch (chosen.get()) {
        case Choice::notOffered:
            return program.fail(place, "the menu of " + manager->displayName().string() + " does not offer this");
        case Choice::notAttempted:
            return program.fail(place, notAttempted);
        case Choice::attempted:
            break;
        }
        if (handedOver.wait_until(end) != std::future_status::ready)
            return program.fail(place, "the desktop did not answer within 4 seconds");
        const platform::HandOver outcome = handedOver.get();
        return outcome.isDone ? done : program.fail(place, outcome.problem);
    }

    /// `typed` from the working folder on. Not as text alone: ".." behind a link leads out of where that leads.
    std::string fromHere(const std::string& typed)
    {
        std::error_code error;
        const std::filesystem::path current = std::filesystem::current_path(error);
        return typed.empty() || error ? typed : (current / typed).string();
    }

} // namespace

int runOpen(Program& program)
{
    const std::vector<std::string>& operands = program.arguments().operands;
    const std::string path = operands.empty() ? std::string() : operands[0];
    const std::string_view place = path.empty() ? std::string_view("editor") : path;
    return chooseInTime(program, "contextMenuOpen:", fromHere(path), place, "the editor is not installed");
}

int runReveal(Program& program)
{
    const std::vector<std::string>& operands = program.arguments().operands;
    if (operands.empty() || operands[0].empty())
        return program.failUsage("reveal: PATH is missing (\"ombrix help reveal\")");
    const std::string& path = operands[0];
    return chooseInTime(program, "contextMenuReveal:", fromHere(path), path, "no such file or directory");
}

} // namespace ombrix

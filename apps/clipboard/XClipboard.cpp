// The clipboard of an X display, through the toolkit. It adds names of its own to what is offered, which it leaves
// nobody a choice about: UTF8_STRING, STRING and TEXT beside text/plain, and text/x-moz-url beside text/uri-list.

#include "apps/clipboard/XClipboard.h"

#include "apps/clipboard/OfferedData.h"

#include <QClipboard>
#include <QGuiApplication>
#include <QSocketNotifier>

#include <cstdlib>
#include <utility>

#include <unistd.h>

namespace {

OfferChannel* toldOfFailure = nullptr;

/// Nothing but the display is wanted of the toolkit: what else the desktop would have it load costs time, and may wait
/// for a bus that does not answer.
void narrowToolkit()
{
    ::setenv("QT_QPA_PLATFORM", "xcb", 1);
    ::setenv("QT_QPA_PLATFORMTHEME", "generic", 1);
    ::setenv("QT_IM_MODULE", "none", 1);
    ::setenv("QT_XCB_GL_INTEGRATION", "none", 1);
    ::setenv("QT_NO_GLIB", "1", 1);
    ::setenv("DBUS_SESSION_BUS_ADDRESS", "disabled:", 1);
    for (const char* const name : { "SESSION_MANAGER", "QT_LINUX_ACCESSIBILITY_ALWAYS_ON", "QT_ACCESSIBILITY" })
        ::unsetenv(name);
}

/// The toolkit's own way to end where it can open no display is a core dump.
void hear(QtMsgType type, const QMessageLogContext&, const QString&)
{
    if (type != QtFatalMsg)
        return;
    toldOfFailure->say(apps::ClipboardWord::noDisplay);
    endNow(1);
}

void offer(OfferChannel& channel, std::vector<apps::ClipboardItem> items)
{
    QClipboard* const clipboard = QGuiApplication::clipboard();
    clipboard->setMimeData(new OfferedData(std::move(items)));
    if (!clipboard->ownsClipboard()) {
        channel.say(apps::ClipboardWord::refused);
        endNow(1);
    }
    QObject::connect(clipboard, &QClipboard::dataChanged, clipboard, [clipboard] {
        if (!clipboard->ownsClipboard())
            endNow(0);
    });
    channel.say(apps::ClipboardWord::owned);
}

} // namespace

void ownXClipboard(OfferChannel& channel, int count, char** words)
{
    narrowToolkit();
    toldOfFailure = &channel;
    qInstallMessageHandler(hear);
    const QGuiApplication application(count, words);
    QSocketNotifier notifier(channel.descriptor(), QSocketNotifier::Read);
    QObject::connect(&notifier, &QSocketNotifier::activated, &notifier, [&] {
        if (std::optional<std::vector<apps::ClipboardItem>> items = channel.receive())
            offer(channel, *std::move(items));
        notifier.setEnabled(channel.isOpen());
    });
    ::alarm(0);
    channel.say(apps::ClipboardWord::opened);
    endNow(QGuiApplication::exec());
}

// Offers on the desktop's clipboard what "ombrix export --clipboard" hands over, until another program copies something
// or the display goes.

#include "apps/clipboard/OfferChannel.h"
#include "apps/clipboard/WaylandClipboard.h"
#include "apps/clipboard/XClipboard.h"

#include <cstdio>
#include <cstdlib>

#include <unistd.h>

namespace {

constexpr int wrongUsage = 2;

bool isSet(const char* variable)
{
    const char* const value = std::getenv(variable);
    return value && *value;
}

} // namespace

int main(int count, char** words)
{
    std::optional<OfferChannel> channel = OfferChannel::ofThisProcess();
    if (!channel) {
        std::fputs("ombrix-clipboard: started by \"ombrix export --clipboard\" alone\n", stderr);
        return wrongUsage;
    }
    // A display may never answer, and whoever waits for it has gone by then.
    ::alarm(apps::clipboardPatience + 1);
    if (isSet("WAYLAND_DISPLAY"))
        ownWaylandClipboard(*channel);
    if (isSet("DISPLAY"))
        ownXClipboard(*channel, count, words);
    channel->say(apps::ClipboardWord::noDisplay);
    return 1;
}

#pragma once

#include "apps/clipboard/OfferChannel.h"

/// Offers on the clipboard of the X display that DISPLAY names what comes over the channel. Never returns: the process
/// ends when another program has taken the clipboard over or the display is gone.
[[noreturn]] void ownXClipboard(OfferChannel& channel, int count, char** words);

#pragma once

#include "apps/clipboard/OfferChannel.h"

/// Offers on the clipboard of the compositor that WAYLAND_DISPLAY names what comes over the channel. Returns only where
/// that cannot be reached; else the process ends when another program has taken the clipboard over or the compositor is
/// gone.
void ownWaylandClipboard(OfferChannel& channel);

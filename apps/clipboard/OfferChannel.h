#pragma once

#include "apps/common/ClipboardOffer.h"

#include <optional>
#include <string>
#include <vector>

/// The way to the command that started this program. When that ends before it has said that the clipboard is to be
/// kept, this process does too.
class OfferChannel {
public:
    /// Takes standard input, and lets go of all else that was handed down: whoever waits for the end of a pipe would
    /// wait for as long as this program lives. Absent where standard input is no stream that leads both ways.
    static std::optional<OfferChannel> ofThisProcess();

    int descriptor() const { return _descriptor; }
    /// Whether anything is still to come.
    bool isOpen() const { return !_isKept; }
    void say(apps::ClipboardWord word);
    /// Takes in what has arrived. Answers the offer, once, when all of it has.
    std::optional<std::vector<apps::ClipboardItem>> receive();

private:
    explicit OfferChannel(int descriptor);

    int _descriptor;
    std::string _arrived {};
    bool _isOffered = false;
    bool _isKept = false;
};

/// Ends the process and tidies nothing up: a toolkit that is asked to end looks for a clipboard manager first, and
/// waits.
[[noreturn]] void endNow(int status);

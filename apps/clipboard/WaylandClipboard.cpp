// The clipboard of a Wayland compositor, by its core protocol: what sets a clipboard has to carry the number of the
// event that gave the window its focus, and the toolkit knows only those of keys and buttons, so that a compositor
// where something was copied before would not listen to it.

#include "apps/clipboard/WaylandClipboard.h"

#include "apps/clipboard/FocusWindow.h"
#include "apps/clipboard/PendingReads.h"
#include "apps/clipboard/WaylandDisplay.h"

#include <algorithm>
#include <csignal>
#include <string_view>
#include <utility>

#include <poll.h>
#include <unistd.h>

#include <wayland-client.h>

namespace {

class WaylandClipboard {
public:
    WaylandClipboard(const WaylandDisplay& display, OfferChannel& channel);

    [[noreturn]] void run();

private:
    void attend();
    void receive();
    void followKeyboard(uint32_t capabilities);
    void haveFocus(uint32_t serial);
    void takeClipboard();
    void hearOfSelection(wl_data_offer* selection);
    void give(std::string_view type, int pipe);
    void lose() { _isLost = true; }

    static const wl_seat_listener seatListener;
    static const wl_keyboard_listener keyboardListener;
    static const wl_callback_listener callbackListener;
    static const wl_data_device_listener deviceListener;
    static const wl_data_source_listener sourceListener;

    const WaylandDisplay& _display;
    OfferChannel& _channel;
    wl_data_device* const _device;
    wl_keyboard* _keyboard = nullptr;
    std::vector<apps::ClipboardItem> _items {};
    std::optional<FocusWindow> _window {};
    uint32_t _focusSerial = 0;
    wl_data_source* _source = nullptr;
    bool _isAsked = false; ///< since the focus came
    bool _isOwner = false;
    bool _isLost = false; ///< another program has the clipboard; who reads already gets the rest
    PendingReads _reads {};
};

WaylandClipboard& clipboardOf(void* self)
{
    return *static_cast<WaylandClipboard*>(self);
}

const wl_seat_listener WaylandClipboard::seatListener {
    .capabilities = [](void* self, wl_seat*, uint32_t capabilities) { clipboardOf(self).followKeyboard(capabilities); },
    .name = nullptr,
};

const wl_keyboard_listener WaylandClipboard::keyboardListener {
    .keymap = [](void*, wl_keyboard*, uint32_t, int32_t file, uint32_t) { ::close(file); },
    .enter
    = [](void* self, wl_keyboard*, uint32_t serial, wl_surface*, wl_array*) { clipboardOf(self).haveFocus(serial); },
    .leave = [](void*, wl_keyboard*, uint32_t, wl_surface*) {},
    .key = [](void*, wl_keyboard*, uint32_t, uint32_t, uint32_t, uint32_t) {},
    .modifiers = [](void*, wl_keyboard*, uint32_t, uint32_t, uint32_t, uint32_t, uint32_t) {},
    .repeat_info = nullptr,
};

const wl_callback_listener WaylandClipboard::callbackListener {
    .done =
        [](void* self, wl_callback* callback, uint32_t) {
            wl_callback_destroy(callback);
            clipboardOf(self).takeClipboard();
        },
};

// What is dragged is of no interest.
const wl_data_device_listener WaylandClipboard::deviceListener {
    .data_offer = [](void*, wl_data_device*, wl_data_offer*) {},
    .enter = [](void*, wl_data_device*, uint32_t, wl_surface*, wl_fixed_t, wl_fixed_t, wl_data_offer*) {},
    .leave = [](void*, wl_data_device*) {},
    .motion = [](void*, wl_data_device*, uint32_t, wl_fixed_t, wl_fixed_t) {},
    .drop = [](void*, wl_data_device*) {},
    .selection
    = [](void* self, wl_data_device*, wl_data_offer* selection) { clipboardOf(self).hearOfSelection(selection); },
};

const wl_data_source_listener WaylandClipboard::sourceListener {
    .target = [](void*, wl_data_source*, const char*) {},
    .send = [](void* self, wl_data_source*, const char* type, int32_t pipe) { clipboardOf(self).give(type, pipe); },
    .cancelled = [](void* self, wl_data_source*) { clipboardOf(self).lose(); },
    .dnd_drop_performed = nullptr,
    .dnd_finished = nullptr,
    .action = nullptr,
};

WaylandClipboard::WaylandClipboard(const WaylandDisplay& display, OfferChannel& channel)
    : _display(display)
    , _channel(channel)
    , _device(wl_data_device_manager_get_data_device(display.clipboards(), display.seat()))
{
    wl_data_device_add_listener(_device, &deviceListener, this);
    wl_seat_add_listener(display.seat(), &seatListener, this);
    _channel.say(apps::ClipboardWord::opened);
}

void WaylandClipboard::run()
{
    while (!_isLost || !_reads.isEmpty())
        attend();
    endNow(0);
}

// Reading comes between preparing and dispatching, as wl_display_prepare_read(3) wants it.
void WaylandClipboard::attend()
{
    wl_display* const connection = _display.connection();
    while (wl_display_prepare_read(connection) != 0)
        wl_display_dispatch_pending(connection);
    wl_display_flush(connection);
    std::vector<pollfd> sides = _reads.sides();
    sides.push_back({ _channel.isOpen() ? _channel.descriptor() : -1, POLLIN, 0 });
    sides.push_back({ wl_display_get_fd(connection), POLLIN, 0 });
    const bool isWoken = ::poll(sides.data(), sides.size(), -1) > 0;
    if (isWoken && sides.back().revents != 0)
        wl_display_read_events(connection);
    else
        wl_display_cancel_read(connection);
    if (wl_display_dispatch_pending(connection) < 0)
        endNow(1);
    _reads.goOn();
    if (isWoken && sides[sides.size() - 2].revents != 0)
        receive();
}

void WaylandClipboard::receive()
{
    std::optional<std::vector<apps::ClipboardItem>> items = _channel.receive();
    if (!items)
        return;
    _items = *std::move(items);
    _window.emplace(_display);
}

void WaylandClipboard::followKeyboard(uint32_t capabilities)
{
    const bool isThere = (capabilities & WL_SEAT_CAPABILITY_KEYBOARD) != 0;
    if (isThere && !_keyboard) {
        _keyboard = wl_seat_get_keyboard(_display.seat());
        wl_keyboard_add_listener(_keyboard, &keyboardListener, this);
    } else if (!isThere && _keyboard) {
        wl_keyboard_destroy(std::exchange(_keyboard, nullptr));
    }
}

// With the focus comes word of what the clipboard holds. It is waited for, so that word of ours is told from it.
void WaylandClipboard::haveFocus(uint32_t serial)
{
    _focusSerial = serial;
    _isAsked = false;
    if (!_isOwner)
        wl_callback_add_listener(wl_display_sync(_display.connection()), &callbackListener, this);
}

void WaylandClipboard::takeClipboard()
{
    if (_isOwner)
        return;
    if (_source)
        wl_data_source_destroy(_source);
    _source = wl_data_device_manager_create_data_source(_display.clipboards());
    wl_data_source_add_listener(_source, &sourceListener, this);
    for (const apps::ClipboardItem& item : _items)
        wl_data_source_offer(_source, item.type.c_str());
    wl_data_device_set_selection(_device, _source, _focusSerial);
    _isAsked = true;
}

void WaylandClipboard::hearOfSelection(wl_data_offer* selection)
{
    if (selection)
        wl_data_offer_destroy(selection);
    if (!selection || !_isAsked || _isOwner)
        return;
    _isOwner = true;
    _window.reset();
    _channel.say(apps::ClipboardWord::owned);
}

void WaylandClipboard::give(std::string_view type, int pipe)
{
    const auto found = std::find_if(
        _items.begin(), _items.end(), [type](const apps::ClipboardItem& item) { return item.type == type; });
    _reads.add(pipe, found == _items.end() ? std::string_view() : std::string_view(found->bytes));
}

} // namespace

void ownWaylandClipboard(OfferChannel& channel)
{
    const std::unique_ptr<WaylandDisplay> display = WaylandDisplay::open();
    if (!display)
        return;
    ::alarm(0);
    // A reader that goes away is no reason to end.
    std::signal(SIGPIPE, SIG_IGN);
    WaylandClipboard(*display, channel).run();
}

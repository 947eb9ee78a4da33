#include "apps/common/Style.h"

#include "apps/common/HostileNames.h"
#include "apps/common/Terminal.h"
#include "platform/FileUri.h"

#include <utility>

namespace apps {
namespace {

    constexpr std::string_view normal = "\x1b[0m";
    constexpr std::string_view dimmed = "\x1b[2m";

    bool wantsColor(const StyleWishes& wishes)
    {
        if (wishes.color != When::automatic)
            return wishes.color == When::always;
        if (!wishes.noColor.empty())
            return false;
        if (!wishes.colorForce.empty() && wishes.colorForce != "0")
            return true;
        return wishes.isTerminal && wishes.term != "dumb" && !wishes.term.empty();
    }

    bool wantsLinks(const StyleWishes& wishes)
    {
        if (wishes.hyperlink != When::automatic)
            return wishes.hyperlink == When::always;
        return wishes.isTerminal && wantsColor(wishes);
    }

} // namespace

Style::Style(const StyleWishes& wishes)
    : _isTerminal(wishes.isTerminal)
    , _isColored(wantsColor(wishes))
    , _hasLinks(wantsLinks(wishes))
{
}

StyleWishes Style::wishesFor(int descriptor, When color, When hyperlink)
{
    return { color, hyperlink, apps::isTerminal(descriptor), environmentVariable("TERM"),
        environmentVariable("NO_COLOR"), environmentVariable("CLICOLOR_FORCE") };
}

std::string Style::name(std::string_view bytes) const
{
    return _isTerminal ? escapedName(bytes) : std::string(bytes);
}

std::string Style::bold(std::string_view laidOut, std::string_view path) const
{
    return linked(drawn(laidOut, "\x1b[1m"), path);
}

std::string Style::plain(std::string_view laidOut, std::string_view path) const
{
    return linked(drawn(laidOut, {}), path);
}

std::string Style::dim(std::string_view laidOut) const
{
    return drawn(laidOut, dimmed);
}

std::string Style::warning(std::string_view laidOut) const
{
    return drawn(laidOut, "\x1b[33m");
}

std::string Style::failure(std::string_view laidOut) const
{
    return drawn(laidOut, "\x1b[31m");
}

/// `text` as a link to `path`, where links are wanted and `path` is not empty.
std::string Style::linked(std::string text, std::string_view path) const
{
    if (!_hasLinks || path.empty())
        return text;
    static const std::string host = hostName();
    return "\x1b]8;;" + fileLink(host, path) + "\x1b\\" + text + "\x1b]8;;\x1b\\";
}

std::string Style::drawn(std::string_view laidOut, std::string_view sequence) const
{
    // Off a terminal nothing was escaped, and the bytes of the marks may be the name's own.
    if (!_isTerminal && (!_isColored || sequence.empty()))
        return std::string(laidOut);
    if (!_isColored)
        return withoutMarks(laidOut);
    std::string text(sequence);
    bool isOpen = !sequence.empty();
    for (const char letter : laidOut) {
        const bool isMark = _isTerminal && (letter == escapeBegins || letter == escapeEnds);
        if (!isMark) {
            text += letter;
            continue;
        }
        if (isOpen)
            text += normal;
        const std::string_view next = letter == escapeBegins ? dimmed : sequence;
        text += next;
        isOpen = !next.empty();
    }
    if (isOpen)
        text += normal;
    return text;
}

std::string fileLink(std::string_view host, std::string_view path)
{
    return "file://" + std::string(host) + platform::uriEscapedPath(path);
}

} // namespace apps

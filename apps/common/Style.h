#pragma once

#include <string>
#include <string_view>

namespace apps {

/// When to use colours or links.
enum class When { automatic, always, never };

/// What decides whether a stream is coloured; made of the options, the environment and the stream.
struct StyleWishes {
    When color = When::automatic;
    When hyperlink = When::automatic;
    bool isTerminal = false;
    std::string_view term {}; ///< TERM
    std::string_view noColor {}; ///< NO_COLOR; empty counts as not set
    std::string_view colorForce {}; ///< CLICOLOR_FORCE; empty and "0" count as not set
};

/// How texts look on one stream. Uses the sixteen colours of every terminal, and never colour alone. Any thread.
class Style {
public:
    explicit Style(const StyleWishes& wishes);

    /// The wishes of this process for the stream at `descriptor`.
    static StyleWishes wishesFor(int descriptor, When color, When hyperlink);

    bool isColored() const { return _isColored; }
    bool hasLinks() const { return _hasLinks; }
    bool isTerminal() const { return _isTerminal; }

    /// A name from disk as it is to be laid out: escaped on a terminal, byte for byte elsewhere.
    std::string name(std::string_view bytes) const;
    /// A name that was laid out, bold; a link to `path` where links are wanted and `path` is not empty.
    std::string bold(std::string_view laidOut, std::string_view path = {}) const;
    /// A text that was laid out, as it is: marks of escapes drawn or dropped. A link likewise.
    std::string plain(std::string_view laidOut, std::string_view path = {}) const;
    std::string dim(std::string_view laidOut) const;
    std::string warning(std::string_view laidOut) const;
    std::string failure(std::string_view laidOut) const;

private:
    std::string drawn(std::string_view laidOut, std::string_view sequence) const;
    std::string linked(std::string text, std::string_view path) const;

    const bool _isTerminal;
    const bool _isColored;
    const bool _hasLinks;
};

/// `path` as a link for terminals, which open it where `host` is their own machine (RFC 8089).
std::string fileLink(std::string_view host, std::string_view path);

} // namespace apps

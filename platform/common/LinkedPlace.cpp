#include "platform/common/LinkedPlace.h"

#include "platform/PathText.h"
#include "platform/common/LexicalPath.h"

#include <algorithm>
#include <cstddef>
#include <utility>

namespace platform {

namespace {

    constexpr int mostHops = 40; // of Linux, path_resolution(7)
    constexpr std::size_t longestPath = 4095; // without the zero byte

    bool isAbsolute(std::string_view path)
    {
        return !path.empty() && path.front() == '/';
    }

    /// One path on its way to the place where it leads.
    class LinkWalk {
    public:
        LinkWalk(const FileSystem& real, const LinkTable& table, std::string_view path, LastLink last)
            : _real(real)
            , _table(table)
            , _text(lexicallyNormalised(path))
            , _outermost(_text)
            , _outermostTail(_text.size() + 1)
            , _last(last)
        {
        }

        /// Replaces what lies below added links, as the text stands now. False when the walk has ended.
        bool substituteAddedLinks();
        /// Follows the first real link or parent component, if there is one. False when there is none.
        bool followOneRealLink();
        bool isTooLong() const { return _text.size() > longestPath; }
        LinkedPlace place() &&;

    private:
        bool hop(std::size_t start, std::size_t end, const std::string& target);
        bool applyParentComponent(std::size_t start, std::size_t end);

        const FileSystem& _real;
        const LinkTable& _table;
        std::string _text;
        std::size_t _walked = 0; ///< so much of the text is known to hold no link
        /// The text as it stood at the last link that the path itself, and no link's target, names: the answer for
        /// circles.
        std::string _outermost;
        std::size_t _outermostTail;
        std::optional<AddedLink> _lastLink;
        LastLink _last;
        int _hops = 0;
        FileProblem _problem = FileProblem::none;
    };

    /// Goes from the link whose name ends at `end`, in the folder whose path ends at `start`, to its target.
    bool LinkWalk::hop(std::size_t start, std::size_t end, const std::string& target)
    {
        const std::size_t tail = _text.size() - end;
        if (tail < _outermostTail) {
            _outermost = _text;
            _outermostTail = tail;
        }
        if (++_hops > mostHops) {
            _problem = FileProblem::linksInCircles;
            return false;
        }
        const std::string_view text = _text;
        const std::string folder(start == 0 ? "/" : text.substr(0, start));
        const std::string_view rest = text.substr(std::min(end + 1, text.size()));
        _text = lexicallyNormalised(pathJoined(isAbsolute(target) ? target : pathJoined(folder, target), rest));
        _walked = isAbsolute(target) ? 0 : start;
        return true;
    }

    bool LinkWalk::substituteAddedLinks()
    {
        while (_problem == FileProblem::none && _table.mayApplyTo(_text)) {
            const std::optional<AddedLink> link = _table.linkAtOrAbove(_text);
            if (!link)
                break;
            if (_last == LastLink::kept && link->path.size() == _text.size()) {
                _lastLink = link;
                return false;
            }
            if (!hop(0, link->path.size(), link->target))
                return false;
        }
        return _problem == FileProblem::none;
    }

    bool LinkWalk::applyParentComponent(std::size_t start, std::size_t end)
    {
        const std::string_view folder = std::string_view(_text).substr(0, start);
        const std::optional<ItemStatus> status = folder.empty() ? std::nullopt : _real.status(folder);
        if (!folder.empty() && (!status || status->kind != ItemKind::folder)) {
            _problem = status ? FileProblem::notAFolder : FileProblem::missing;
            return false;
        }
        const std::string_view parent = folder.empty() ? folder : folder.substr(0, folder.rfind('/'));
        _text = lexicallyNormalised(std::string(parent) + "/" + _text.substr(end));
        _walked = parent.size();
        return true;
    }

    bool LinkWalk::followOneRealLink()
    {
        while (_walked < _text.size() && _text != "/") {
            const std::size_t start = _walked;
            const std::size_t end = std::min(_text.find('/', start + 1), _text.size());
            const std::string_view prefix = std::string_view(_text).substr(0, end);
            if (prefix.substr(start) == "/..")
                return applyParentComponent(start, end);
            if (end == _text.size() && _last == LastLink::kept)
                return false;
            if (const std::optional<std::string> target = _real.linkTarget(prefix))
                return hop(start, end, *target);
            _walked = end;
        }
        return false;
    }

    LinkedPlace LinkWalk::place() &&
    {
        if (_problem == FileProblem::linksInCircles)
            return { std::move(_outermost), std::nullopt, _problem };
        return { std::move(_text), std::move(_lastLink), _problem };
    }

} // namespace

LinkedPlace placeAfterAllLinks(const FileSystem& real, const LinkTable& table, std::string_view path, LastLink last)
{
    if (!isAbsolute(path))
        return { std::string(path), std::nullopt, FileProblem::none };
    LinkWalk walk(real, table, path, last);
    while (!walk.isTooLong() && walk.substituteAddedLinks() && walk.followOneRealLink())
        continue;
    return std::move(walk).place();
}

LinkedPlace placeAfterAddedLinks(const FileSystem& real, const LinkTable& table, std::string_view path, LastLink last)
{
    if (!isAbsolute(path) || !table.mayApplyTo(path))
        return { std::string(path), std::nullopt, FileProblem::none };
    LinkWalk walk(real, table, path, last);
    if (!walk.isTooLong())
        walk.substituteAddedLinks();
    return std::move(walk).place();
}

} // namespace platform

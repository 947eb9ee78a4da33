#include "platform/linux/PathResolution.h"

#include "platform/linux/Descriptor.h"
#include "platform/linux/SystemPath.h"

#include <algorithm>

#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/syscall.h>

namespace platform {

namespace {

    std::string_view withoutLeadingSlashes(std::string_view text)
    {
        text.remove_prefix(std::min(text.find_first_not_of('/'), text.size()));
        return text;
    }

    // Takes the first component off `text`; empty when none is left.
    std::string_view takeComponent(std::string_view& text)
    {
        text = withoutLeadingSlashes(text);
        const std::string_view component = text.substr(0, text.find('/'));
        text.remove_prefix(component.size());
        return component;
    }

    void removeLastComponent(std::string& path)
    {
        path.resize(std::min(path.rfind('/'), path.size()));
    }

    // Where there is no link on the way, "." and ".." can be worked out in the text.
    std::string pathWithoutDots(std::string_view path)
    {
        std::string result;
        for (auto component = takeComponent(path); !component.empty(); component = takeComponent(path)) {
            if (component == "..")
                removeLastComponent(result);
            else if (component != ".")
                result.append(1, '/').append(component);
        }
        return result.empty() ? "/" : result;
    }

    // One call for what is by far the commonest path: one that exists, and has no link on the way.
    bool existsWithoutLinks(std::string_view path)
    {
        const SystemPath systemPath(path);
        if (!systemPath.isUsable())
            return false;
        open_how how {};
        how.flags = O_PATH | O_CLOEXEC;
        how.resolve = RESOLVE_NO_SYMLINKS;
        const auto open = [&] { return syscall(SYS_openat2, AT_FDCWD, systemPath.bytes(), &how, sizeof(how)); };
        return Descriptor(static_cast<int>(uninterrupted(open))).isOpen();
    }

    // Walks a path component by component with a descriptor of the folder reached, so that no text gets too long.
    class PathWalk {
    public:
        explicit PathWalk(std::string_view path)
            : _rest(path)
        {
        }

        std::string result()
        {
            enterRoot();
            while (_exists && !isAtEnd())
                step();
            appendAsWritten(_linkText.substr(_linkOffset));
            appendAsWritten(_rest);
            return _path.empty() ? "/" : _path;
        }

    private:
        bool isInLink() const
        {
            return !withoutLeadingSlashes(std::string_view(_linkText).substr(_linkOffset)).empty();
        }
        bool isAtEnd() const { return !isInLink() && withoutLeadingSlashes(_rest).empty(); }

        void enterRoot()
        {
            _path.clear();
            enter(Descriptor(uninterrupted([] { return open("/", O_PATH | O_CLOEXEC); })));
        }
        void enter(Descriptor item)
        {
            _exists = item.isOpen();
            _folder = std::move(item);
        }
        Descriptor opened(const std::string& name) const
        {
            const auto open = [&] { return openat(_folder.number(), name.c_str(), O_PATH | O_NOFOLLOW | O_CLOEXEC); };
            return Descriptor(name.find('\0') == std::string::npos ? uninterrupted(open) : -1);
        }
        std::string takeNextComponent()
        {
            if (!isInLink())
                return std::string(takeComponent(_rest));
            std::string_view linkText = std::string_view(_linkText).substr(_linkOffset);
            std::string component(takeComponent(linkText));
            _linkOffset = _linkText.size() - linkText.size();
            return component;
        }

        void step();
        void followLink(const std::string& name, const std::string& target, bool isInLinkText);
        void appendAsWritten(std::string_view text)
        {
            for (auto component = takeComponent(text); !component.empty(); component = takeComponent(text))
                _path.append(1, '/').append(component);
        }

        std::string_view _rest; // of the path as given
        std::string _linkText {}; // of the links being followed, comes before the rest
        std::size_t _linkOffset = 0;
        int _linksFollowed = 0;
        std::string _path {}; // resolved so far
        Descriptor _folder {}; // what is at `_path`
        bool _exists = false;
        std::string _givenLink {}; // the place of the link in the path as given that is being followed
    };

    void PathWalk::step()
    {
        const bool isInLinkText = isInLink();
        const std::string name = takeNextComponent();
        if (name == ".")
            return;
        Descriptor item = opened(name);
        if (name == ".." && item.isOpen()) {
            removeLastComponent(_path);
            enter(std::move(item));
            return;
        }
        const auto target = item.isOpen() ? readLink(item.number(), "") : std::nullopt;
        if (target)
            return followLink(name, *target, isInLinkText);
        _path.append(1, '/').append(name);
        enter(std::move(item));
    }

    void PathWalk::followLink(const std::string& name, const std::string& target, bool isInLinkText)
    {
        constexpr int linksAtMost = 40; // as many as the kernel follows for one path
        if (!isInLinkText)
            _givenLink = _path + '/' + name;
        if (++_linksFollowed > linksAtMost) {
            _path = _givenLink;
            _linkText.clear();
            _linkOffset = 0;
            _exists = false;
            return;
        }
        _linkText = target + '/' + _linkText.substr(_linkOffset);
        _linkOffset = 0;
        if (target.front() == '/')
            enterRoot();
    }

} // namespace

std::optional<std::string> readLink(int folder, const char* path)
{
    constexpr std::size_t lengthAtMost = 1 << 20;
    for (std::string target(PATH_MAX, '\0'); target.size() <= lengthAtMost; target.resize(target.size() * 4)) {
        const auto read = [&] { return readlinkat(folder, path, target.data(), target.size()); };
        const ssize_t length = uninterrupted(read);
        if (length <= 0)
            return std::nullopt;
        if (static_cast<std::size_t>(length) < target.size()) {
            target.resize(static_cast<std::size_t>(length));
            return target;
        }
    }
    return std::nullopt;
}

std::string pathWithLinksResolved(std::string_view path)
{
    if (!path.empty() && path.front() != '/')
        return std::string(path);
    return existsWithoutLinks(path) ? pathWithoutDots(path) : PathWalk(path).result();
}

} // namespace platform

#include "tests/support/simulated/SimulatedDisk.h"

#include "platform/PathText.h"

#include <algorithm>
#include <utility>

namespace tests {

using platform::FileProblem;
using platform::ItemKind;
using platform::PathChange;

namespace {

    constexpr int mostHops = 40;

    /// The top of the volume that holds `item`: nothing is renamed to another one.
    const SimulatedDisk::Item* volumeOf(const SimulatedDisk::Item& item)
    {
        const SimulatedDisk::Item* top = &item;
        while (top->number != 0)
            top = top->parent;
        return top;
    }

    /// One path on its way, component by component.
    class Walk {
    public:
        Walk(SimulatedDisk::Item* top, std::string_view path, SimulatedDisk::Links links)
            : _top(top)
            , _rest(path)
            , _links(links)
        {
            start();
        }

        SimulatedDisk::Place place()
        {
            while (!_rest.empty()) {
                const FileProblem problem = step();
                if (problem != FileProblem::none)
                    return { nullptr, problem, _path + _rest };
            }
            return { _item, FileProblem::none, _path.empty() ? "/" : _path };
        }

    private:
        void start()
        {
            _item = _top;
            _path.clear();
            if (_rest == "/")
                _rest.clear();
        }

        FileProblem step()
        {
            if (_item->kind != ItemKind::folder)
                return FileProblem::notAFolder;
            if (!_item->isOpen)
                return FileProblem::notPermitted;
            const std::size_t end = std::min(_rest.find('/', 1), _rest.size());
            const std::string name = _rest.substr(1, end - 1);
            SimulatedDisk::Item* next = _item->item(name);
            if (!next)
                return FileProblem::missing;
            const bool isKept = end == _rest.size() && _links == SimulatedDisk::Links::lastKept;
            if (next->kind == ItemKind::symbolicLink && !isKept)
                return follow(*next, end);
            _item = next->mounted ? next->mounted : next;
            _path += "/" + name;
            _rest.erase(0, end);
            return FileProblem::none;
        }

        FileProblem follow(const SimulatedDisk::Item& link, std::size_t end)
        {
            if (_links == SimulatedDisk::Links::refused)
                return FileProblem::linkOnTheWay;
            if (++_hops > mostHops)
                return FileProblem::linksInCircles;
            _rest = link.text + _rest.substr(end);
            start();
            return FileProblem::none;
        }

        SimulatedDisk::Item* const _top;
        SimulatedDisk::Item* _item = nullptr;
        std::string _path {};
        std::string _rest;
        const SimulatedDisk::Links _links;
        int _hops = 0;
    };

} // namespace

SimulatedDisk::Item* SimulatedDisk::Item::item(std::string_view itemName) const
{
    const auto found
        = std::find_if(items.begin(), items.end(), [itemName](const auto& each) { return each->name == itemName; });
    return found == items.end() ? nullptr : found->get();
}

std::string SimulatedDisk::Item::path() const
{
    return parent ? (parent->parent ? parent->path() : std::string()) + "/" + name : "/";
}

SimulatedDisk::SimulatedDisk(std::function<platform::Date()> now)
    : _now(std::move(now))
    , _top(std::make_unique<Item>())
{
}

SimulatedDisk::Place SimulatedDisk::placeOf(std::string_view path, Links links) const
{
    return Walk(_top.get(), path, links).place();
}

SimulatedDisk::Item* SimulatedDisk::itemWithNumber(std::uint64_t number) const
{
    const auto known = _byNumber.find(number);
    return known == _byNumber.end() ? nullptr : known->second;
}

/// The folder in which something can be made at `path`; null when there is none, or something stands there already.
SimulatedDisk::Item* SimulatedDisk::folderFor(const std::string& path) const
{
    const Place folder = placeOf(platform::pathByRemovingLastComponent(path));
    const bool canHold = folder.item && folder.item->kind == ItemKind::folder && folder.item->isOpen;
    return canHold && !folder.item->item(platform::lastPathComponent(path)) ? folder.item : nullptr;
}

SimulatedDisk::Item* SimulatedDisk::add(const std::string& path, ItemKind kind)
{
    Item* const folder = folderFor(path);
    if (!folder)
        return nullptr;
    auto item = std::make_unique<Item>();
    item->number = ++_last;
    item->kind = kind;
    item->name = platform::lastPathComponent(path);
    item->parent = folder;
    item->born = item->modified = item->changed = _now();
    Item* const added = item.get();
    _byNumber.emplace(added->number, added);
    folder->items.push_back(std::move(item));
    touch(*folder);
    return added;
}

void SimulatedDisk::touch(Item& folder)
{
    folder.modified = folder.changed = _now();
}

bool SimulatedDisk::makeFolder(const std::string& path)
{
    const Item* const folder = add(path, ItemKind::folder);
    if (folder)
        tell(PathChange::Kind::appeared, *folder->parent, folder->name, true);
    return folder != nullptr;
}

void SimulatedDisk::makeFolders(const std::string& path)
{
    for (std::size_t end = path.find('/', 1); end != std::string::npos; end = path.find('/', end + 1))
        makeFolder(path.substr(0, end));
    makeFolder(path);
}

std::uint64_t SimulatedDisk::beginFile(const std::string& path)
{
    const Item* const file = add(path, ItemKind::file);
    if (!file)
        return 0;
    _written.emplace(file->number, true);
    tell(PathChange::Kind::appeared, *file->parent, file->name);
    return file->number;
}

void SimulatedDisk::endFile(std::uint64_t number, const std::string& text, std::optional<platform::Date> date)
{
    Item* const file = itemWithNumber(number);
    const auto written = _written.extract(number);
    if (!file || written.empty())
        return;
    file->text = text;
    touch(*file);
    file->modified = date.value_or(file->modified);
    tell(written.mapped() ? PathChange::Kind::arrivalEnded : PathChange::Kind::contentChanged, *file->parent,
        file->name);
}

bool SimulatedDisk::writeFile(const std::string& path, const std::string& text)
{
    if (const std::uint64_t number = beginFile(path)) {
        endFile(number, text);
        return true;
    }
    const Item* const file = itemAt(path);
    if (!file || file->kind != ItemKind::file || !file->isOpen || _written.contains(file->number))
        return false;
    _written.emplace(file->number, false);
    endFile(file->number, text);
    return true;
}

bool SimulatedDisk::makeLink(const std::string& path, const std::string& target)
{
    Item* const link = add(path, ItemKind::symbolicLink);
    if (!link)
        return false;
    link->text = target;
    tell(PathChange::Kind::appeared, *link->parent, link->name);
    return true;
}

bool SimulatedDisk::isMountedBelow(const Item& item) const
{
    return item.mounted || item.number == 0
        || std::any_of(
            item.items.begin(), item.items.end(), [this](const auto& each) { return isMountedBelow(*each); });
}

bool SimulatedDisk::rename(const std::string& from, const std::string& to)
{
    Item* const item = itemAt(from);
    Item* const folder = folderFor(to);
    if (!item || !item->parent || !item->parent->isOpen || !folder || isMountedBelow(*item))
        return false;
    const Item* above = folder;
    while (above->number != 0 && above != item)
        above = above->parent;
    if (above == item || above != volumeOf(*item))
        return false;
    Item* const before = item->parent;
    const std::string nameBefore = item->name;
    const auto place = std::find_if(
        before->items.begin(), before->items.end(), [item](const auto& each) { return each.get() == item; });
    std::unique_ptr<Item> moved = std::move(*place);
    before->items.erase(place);
    touch(*before);
    moved->name = platform::lastPathComponent(to);
    moved->parent = folder;
    moved->changed = _now();
    folder->items.push_back(std::move(moved));
    touch(*folder);
    const bool isFolder = item->kind == ItemKind::folder;
    tell(PathChange::Kind::disappeared, *before, nameBefore, isFolder, !item->items.empty());
    tell(PathChange::Kind::appeared, *folder, item->name, isFolder);
    tellFound(*item);
    return true;
}

bool SimulatedDisk::remove(const std::string& path)
{
    Item* const item = itemAt(path);
    if (!item || !item->parent || !item->parent->isOpen || isMountedBelow(*item)
        || (!item->isOpen && !item->items.empty()))
        return false;
    while (!item->items.empty()) {
        if (!remove(platform::pathJoined(item->path(), item->items.front()->name)))
            return false;
    }
    Item* const folder = item->parent;
    const auto place = std::find_if(
        folder->items.begin(), folder->items.end(), [item](const auto& each) { return each.get() == item; });
    const std::unique_ptr<Item> removed = std::move(*place);
    folder->items.erase(place);
    _byNumber.erase(removed->number);
    _written.erase(removed->number);
    touch(*folder);
    tell(PathChange::Kind::disappeared, *folder, removed->name, removed->kind == ItemKind::folder);
    return true;
}

bool SimulatedDisk::setOpen(const std::string& path, bool isOpen)
{
    Item* const item = itemAt(path);
    if (!item || !item->parent || item->kind == ItemKind::symbolicLink)
        return false;
    item->isOpen = isOpen;
    item->changed = _now();
    if (item->kind == ItemKind::folder)
        tell(PathChange::Kind::attributesChanged, *item, {}, true);
    return true;
}

bool SimulatedDisk::setModified(const std::string& path, platform::Date date)
{
    Item* const item = itemAt(path);
    if (!item || !item->parent || item->kind == ItemKind::symbolicLink)
        return false;
    item->modified = date;
    item->changed = _now();
    if (item->kind == ItemKind::folder)
        tell(PathChange::Kind::attributesChanged, *item, {}, true);
    return true;
}

SimulatedDisk::Item* SimulatedDisk::makeVolume()
{
    Item* const volume = _volumes.emplace_back(std::make_unique<Item>()).get();
    volume->born = volume->modified = volume->changed = _now();
    return volume;
}

void SimulatedDisk::mount(Item* volume, const std::string& path)
{
    Item* const folder = itemAt(path);
    folder->mounted = volume;
    volume->parent = folder->parent;
    volume->name = folder->name;
}

void SimulatedDisk::unmount(Item* volume)
{
    volume->parent->item(volume->name)->mounted = nullptr;
    volume->parent = nullptr;
}

void SimulatedDisk::tell(
    PathChange::Kind kind, const Item& folder, const std::string& name, bool isFolder, bool heldMore) const
{
    const Item* top = &folder;
    while (top->parent)
        top = top->parent;
    // Nobody sees what is on a volume that is not mounted.
    if (changed && top == _top.get())
        changed({ kind, folder.path(), name, isFolder, heldMore });
}

void SimulatedDisk::tellFound(const Item& folder) const
{
    for (const auto& item : folder.items) {
        tell(PathChange::Kind::found, folder, item->name, item->kind == ItemKind::folder);
        tellFound(*item);
    }
}

} // namespace tests

#include "host/OBMediaObjectList.h"

#include "host/OBSnapshotList.h"
#include "host/TrailingBlock.h"
#include "platform/PathText.h"

#include <algorithm>
#include <new>
#include <utility>

OBMediaObjectSequence::~OBMediaObjectSequence() = default;

/// One object, or the first objects of a sequence.
struct OBMediaObjectList::Part {
    std::shared_ptr<const void> item;
    std::uint64_t end : 63; // how many objects stand in the list up to and with this part
    bool isObject : 1;

    static Part ofObject(OBMediaObjectRef object, std::size_t before)
    {
        return { std::move(object), before + 1, true };
    }
    static Part ofSequence(std::shared_ptr<const OBMediaObjectSequence> sequence, std::size_t before, std::size_t count)
    {
        return { std::move(sequence), before + count, false };
    }
    OBMediaObject* object() const
    {
        return isObject ? const_cast<OBMediaObject*>(static_cast<const OBMediaObject*>(item.get())) : nullptr;
    }
    const OBMediaObjectSequence& sequence() const { return *static_cast<const OBMediaObjectSequence*>(item.get()); }
};

/// Parts one after the other. Extending the longest list made from it writes behind what that list shows.
class OBMediaObjectList::Concatenation final : public OBMediaObjectSequence {
public:
    explicit Concatenation(OBSnapshotList<Part> parts)
        : _parts(std::move(parts))
    {
    }

    const OBSnapshotList<Part>& parts() const { return _parts; }
    std::size_t size() const { return _parts[_parts.size() - 1].end; }

    OBMediaObjectRef objectAtIndex(std::size_t index) const override
    {
        const Part* part = std::upper_bound(_parts.begin(), _parts.end(), index,
            [](std::size_t wanted, const Part& candidate) { return wanted < candidate.end; });
        if (OBMediaObject* object = part->object())
            return { part->item, object };
        return part->sequence().objectAtIndex(index - (part == _parts.begin() ? 0 : part[-1].end));
    }

    bool visit(std::size_t count, const std::function<bool(OBMediaObject&)>& visitor) const override
    {
        std::size_t visited = 0;
        for (const Part& part : _parts) {
            if (visited >= count)
                break;
            OBMediaObject* object = part.object();
            if (object ? !visitor(*object)
                       : !part.sequence().visit(std::min<std::size_t>(count, part.end) - visited, visitor))
                return false;
            visited = part.end;
        }
        return true;
    }

private:
    const OBSnapshotList<Part> _parts;
};

OBMediaObjectList::OBMediaObjectList(const std::vector<OBMediaObjectRef>& objects)
{
    for (const OBMediaObjectRef& object : objects)
        *this = appending(object);
}

void OBMediaObjectList::visit(const std::function<bool(OBMediaObject&)>& visitor) const
{
    if (_sequence)
        _sequence->visit(_count, visitor);
}

OBMediaObjectList OBMediaObjectList::appendingPart(Part part) const
{
    const std::size_t count = part.end;
    OBSnapshotList<Part> parts;
    const auto* concatenation = dynamic_cast<const Concatenation*>(_sequence.get());
    if (concatenation && concatenation->size() == _count)
        parts = concatenation->parts();
    else if (_count != 0)
        parts = parts.appending(Part::ofSequence(_sequence, 0, _count));
    return { std::make_shared<Concatenation>(parts.appending(std::move(part))), count };
}

OBMediaObjectList OBMediaObjectList::appending(OBMediaObjectRef object) const
{
    return appendingPart(Part::ofObject(std::move(object), _count));
}

OBMediaObjectList OBMediaObjectList::appending(const OBMediaObjectList& others) const
{
    if (others.empty())
        return *this;
    if (empty())
        return others;
    return appendingPart(Part::ofSequence(others._sequence, _count, others._count));
}

OBMediaObjectList OBMediaObjectList::prefix(std::size_t count) const
{
    return count < _count ? OBMediaObjectList(count ? _sequence : nullptr, count) : *this;
}

std::vector<OBMediaObjectRef> OBMediaObjectList::objects() const
{
    std::vector<OBMediaObjectRef> result;
    result.reserve(_count);
    for (std::size_t index = 0; index < _count; ++index)
        result.push_back((*this)[index]);
    return result;
}

OBMediaObjectList OBMediaObjectBatch::objects(
    std::shared_ptr<const OBMediaObjectKind> kind, OBFolderOfFiles folder, std::span<const OBFileOfFolder> files)
{
    if (files.empty())
        return {};
    TrailingBytes trailing { files.size() * sizeof(OBMediaObject) };
    for (const OBFileOfFolder& file : files)
        trailing.size += file.name.size();
    return { std::allocate_shared<OBMediaObjectBatch>(TrailingAllocator<OBMediaObjectBatch>(trailing), MakeKey {},
                 trailing, std::move(kind), std::move(folder), files),
        files.size() };
}

OBMediaObjectBatch::OBMediaObjectBatch(MakeKey, const TrailingBytes& trailing,
    std::shared_ptr<const OBMediaObjectKind> kind, OBFolderOfFiles folder, std::span<const OBFileOfFolder> files)
    : _kind(std::move(kind))
    , _folder(std::move(folder.path))
    , _objects(reinterpret_cast<OBMediaObject*>(trailing.begin), files.size())
{
    std::byte* const names = trailing.begin + _objects.size_bytes();
    std::size_t offset = 0;
    for (std::size_t index = 0; index < files.size(); ++index) {
        const std::string_view name = files[index].name;
        const bool pathIsReal = folder.pathIsReal && files[index].isPlainFile;
        new (&_objects[index]) OBMediaObject(
            *this, static_cast<std::uint32_t>(offset), static_cast<std::uint16_t>(name.size()), pathIsReal);
        std::copy(name.begin(), name.end(), reinterpret_cast<char*>(names + offset));
        offset += name.size();
    }
}

OBMediaObjectBatch::~OBMediaObjectBatch()
{
    for (OBMediaObject& object : _objects)
        object.~OBMediaObject();
}

OBMediaObjectRef OBMediaObjectBatch::objectAtIndex(std::size_t index) const
{
    return { shared_from_this(), &_objects[index] };
}

bool OBMediaObjectBatch::visit(std::size_t count, const std::function<bool(OBMediaObject&)>& visitor) const
{
    for (OBMediaObject& object : _objects.first(count)) {
        if (!visitor(object))
            return false;
    }
    return true;
}

std::string_view OBMediaObjectBatch::fileName(const OBMediaObject& object) const
{
    const auto* names = reinterpret_cast<const char*>(_objects.data() + _objects.size());
    return { names + object._nameOffset, object._nameLength };
}

platform::Text OBMediaObjectBatch::nameOfObject(const OBMediaObject& object) const
{
    return platform::nameWithoutExtension(fileName(object));
}

platform::Text OBMediaObjectBatch::pathOfObject(const OBMediaObject& object) const
{
    return platform::Text::joined(_folder, _kind->beforeFileName, fileName(object));
}

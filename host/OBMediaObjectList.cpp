#include "host/OBMediaObjectList.h"

#include "host/OBSnapshotList.h"
#include "host/TrailingBlock.h"
#include "platform/PathText.h"

#include <algorithm>
#include <new>
#include <utility>

OBMediaObjectRunVisitor::~OBMediaObjectRunVisitor() = default;
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

    void visitRuns(std::size_t count, OBMediaObjectRunVisitor& visitor) const override
    {
        std::size_t visited = 0;
        for (const Part& part : _parts) {
            if (visited >= count)
                break;
            if (OBMediaObject* object = part.object())
                visitor.visitObject({ part.item, object });
            else
                part.sequence().visitRuns(std::min<std::size_t>(count, part.end) - visited, visitor);
            visited = part.end;
        }
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

void OBMediaObjectList::visitRuns(OBMediaObjectRunVisitor& visitor) const
{
    if (_sequence)
        _sequence->visitRuns(_count, visitor);
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
    TrailingBytes trailing { files.size() * sizeof(OBMediaObject) + keptFacts(files) * sizeof(KeptFacts) };
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
    , _facts(reinterpret_cast<KeptFacts*>(trailing.begin + _objects.size_bytes()), keptFacts(files))
    , _names(reinterpret_cast<const char*>(_facts.data() + _facts.size()))
{
    std::byte* const names = trailing.begin + _objects.size_bytes() + _facts.size_bytes();
    std::size_t offset = 0;
    for (std::size_t index = 0; index < files.size(); ++index) {
        const std::string_view name = files[index].name;
        const bool pathIsReal = folder.pathIsReal && files[index].isPlainFile;
        new (&_objects[index]) OBMediaObject(
            *this, static_cast<std::uint32_t>(offset), static_cast<std::uint16_t>(name.size()), pathIsReal);
        std::copy(name.begin(), name.end(), reinterpret_cast<char*>(names + offset));
        offset += name.size();
    }
    for (std::size_t index = 0; index < _facts.size(); ++index) {
        const platform::FileFacts facts = files[index].facts.value_or(platform::FileFacts {});
        new (&_facts[index]) KeptFacts { facts.creationDate.seconds, facts.size, facts.creationDate.nanoseconds,
            files[index].facts.has_value() };
    }
}

std::size_t OBMediaObjectBatch::keptFacts(std::span<const OBFileOfFolder> files)
{
    const auto hasFacts = [](const OBFileOfFolder& file) { return file.facts.has_value(); };
    return std::any_of(files.begin(), files.end(), hasFacts) ? files.size() : 0;
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
    return { _names + object._nameOffset, object._nameLength };
}

platform::Text OBMediaObjectBatch::nameOfObject(const OBMediaObject& object) const
{
    return platform::nameWithoutExtension(fileName(object));
}

platform::Text OBMediaObjectBatch::pathOfObject(const OBMediaObject& object) const
{
    return platform::Text::joined(_folder, _kind->beforeFileName, fileName(object));
}

std::optional<platform::FileFacts> OBMediaObjectBatch::factsOfFile(const OBMediaObject& object) const
{
    if (_facts.empty())
        return std::nullopt;
    const KeptFacts& kept = _facts[static_cast<std::size_t>(&object - _objects.data())];
    if (!kept.areKnown)
        return std::nullopt;
    return platform::FileFacts { { kept.seconds, kept.nanoseconds }, kept.size };
}

void OBMediaObjectBatch::visitRuns(std::size_t count, OBMediaObjectRunVisitor& visitor) const
{
    visitor.visitBatch(*this, count);
}

std::string_view OBMediaObjectBatch::fileNames(std::size_t count) const
{
    if (count == 0)
        return {};
    const OBMediaObject& last = _objects[count - 1];
    return { _names, last._nameOffset + std::size_t { last._nameLength } };
}

std::string_view OBMediaObjectBatch::fileNameAtIndex(std::size_t index) const
{
    return fileName(_objects[index]);
}

std::size_t OBMediaObjectBatch::offsetOfFileName(std::size_t index) const
{
    return _objects[index]._nameOffset;
}

/// Names of one folder are about equally long, so a few steps from a guess are usually enough, and fetch fewer objects
/// than halving does.
std::size_t OBMediaObjectBatch::indexOfFileNameAt(std::size_t offset) const
{
    constexpr int mostSteps = 8;
    const auto endsBefore
        = [&](std::size_t index) { return offsetOfFileName(index) + fileNameAtIndex(index).size() <= offset; };
    std::size_t index = offset * _objects.size() / fileNames(_objects.size()).size();
    for (int step = 0; step < mostSteps; ++step) {
        if (offsetOfFileName(index) > offset)
            --index;
        else if (endsBefore(index))
            ++index;
        else
            return index;
    }
    std::size_t first = 0;
    for (std::size_t left = _objects.size(); left > 0;) {
        const std::size_t half = left / 2;
        if (endsBefore(first + half)) {
            first += half + 1;
            left -= half + 1;
        } else {
            left = half;
        }
    }
    return first;
}

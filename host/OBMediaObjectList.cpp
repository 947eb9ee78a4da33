#include "host/OBMediaObjectList.h"

#include "host/OBSnapshotList.h"

#include <algorithm>
#include <utility>

OBMediaObjectRunVisitor::~OBMediaObjectRunVisitor() = default;
OBMediaObjectSequence::~OBMediaObjectSequence() = default;

/// One object, or the first objects of a sequence.
struct OBMediaObjectList::Part {
    OBMediaObjectRef object; // null where a sequence stands
    std::shared_ptr<const OBMediaObjectSequence> sequence;
    std::size_t count = 1;
    std::size_t end = 0; // how many objects stand in the list up to and with this part
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
        if (part->object)
            return part->object;
        return part->sequence->objectAtIndex(index - (part->end - part->count));
    }

    bool visit(std::size_t count, const std::function<bool(OBMediaObject&)>& visitor) const override
    {
        std::size_t left = count;
        for (const Part& part : _parts) {
            if (left == 0)
                break;
            const std::size_t here = std::min(left, part.count);
            if (part.object ? !visitor(*part.object) : !part.sequence->visit(here, visitor))
                return false;
            left -= here;
        }
        return true;
    }

    void visitRuns(std::size_t count, OBMediaObjectRunVisitor& visitor) const override
    {
        std::size_t left = count;
        for (const Part& part : _parts) {
            if (left == 0)
                break;
            const std::size_t here = std::min(left, part.count);
            if (part.object)
                visitor.visitObject(part.object);
            else
                part.sequence->visitRuns(here, visitor);
            left -= here;
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
    part.end = _count + part.count;
    const std::size_t count = part.end;
    OBSnapshotList<Part> parts;
    const auto* concatenation = dynamic_cast<const Concatenation*>(_sequence.get());
    if (concatenation && concatenation->size() == _count)
        parts = concatenation->parts();
    else if (_count != 0)
        parts = parts.appending(Part { nullptr, _sequence, _count, _count });
    return { std::make_shared<Concatenation>(parts.appending(std::move(part))), count };
}

OBMediaObjectList OBMediaObjectList::appending(OBMediaObjectRef object) const
{
    return appendingPart(Part { std::move(object), nullptr });
}

OBMediaObjectList OBMediaObjectList::appending(const OBMediaObjectList& others) const
{
    if (others.empty())
        return *this;
    if (empty())
        return others;
    return appendingPart(Part { nullptr, others._sequence, others._count });
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

OBMediaObjectBatch::OBMediaObjectBatch(
    MakeKey, std::shared_ptr<const OBMediaFolder> folder, std::span<const OBFileOfFolder> files)
    : _folder(std::move(folder))
    , _count(files.size())
    , _objects(std::make_unique<OBMediaObject[]>(files.size()))
{
    std::uint32_t offset = 0;
    for (std::size_t index = 0; index < files.size(); ++index) {
        OBMediaObject& object = _objects[index];
        const platform::Locked guard(object._lock);
        object._folder = _folder.get();
        object._nameOffset = offset;
        object._nameLength = static_cast<std::uint32_t>(files[index].name.size());
        object._pathIsReal = _folder->pathIsReal && files[index].isPlainFile;
        offset += object._nameLength;
    }
}

OBMediaObjectList OBMediaObjectBatch::objects(
    std::shared_ptr<const OBMediaObjectKind> kind, OBFolderOfFiles folder, std::span<const OBFileOfFolder> files)
{
    if (files.empty())
        return {};
    std::size_t length = 0;
    for (const OBFileOfFolder& file : files)
        length += file.name.size();
    auto shared = std::make_shared<OBMediaFolder>();
    shared->kind = std::move(kind);
    shared->path = std::move(folder.path);
    shared->pathIsReal = folder.pathIsReal;
    shared->fileNames.reserve(length);
    for (const OBFileOfFolder& file : files)
        shared->fileNames.append(file.name);
    return { std::make_shared<OBMediaObjectBatch>(MakeKey {}, std::move(shared), files), files.size() };
}

OBMediaObjectRef OBMediaObjectBatch::objectAtIndex(std::size_t index) const
{
    return { shared_from_this(), &_objects[index] };
}

bool OBMediaObjectBatch::visit(std::size_t count, const std::function<bool(OBMediaObject&)>& visitor) const
{
    for (std::size_t index = 0; index < count; ++index) {
        if (!visitor(_objects[index]))
            return false;
    }
    return true;
}

void OBMediaObjectBatch::visitRuns(std::size_t count, OBMediaObjectRunVisitor& visitor) const
{
    visitor.visitBatch(*this, count);
}

std::string_view OBMediaObjectBatch::fileNames(std::size_t count) const
{
    const std::string_view all = _folder->fileNames;
    return count == _count ? all : all.substr(0, offsetOfFileName(count));
}

std::string_view OBMediaObjectBatch::fileNameAtIndex(std::size_t index) const
{
    return _objects[index].fileName();
}

std::size_t OBMediaObjectBatch::offsetOfFileName(std::size_t index) const
{
    return static_cast<std::size_t>(fileNameAtIndex(index).data() - _folder->fileNames.data());
}

/// Names of one folder are about equally long, so a few steps from a guess are usually enough, and fetch fewer objects
/// than halving does.
std::size_t OBMediaObjectBatch::indexOfFileNameAt(std::size_t offset) const
{
    constexpr int mostSteps = 8;
    const auto endsBefore
        = [&](std::size_t index) { return offsetOfFileName(index) + fileNameAtIndex(index).size() <= offset; };
    std::size_t index = offset * _count / _folder->fileNames.size();
    for (int step = 0; step < mostSteps; ++step) {
        if (offsetOfFileName(index) > offset)
            --index;
        else if (endsBefore(index))
            ++index;
        else
            return index;
    }
    std::size_t first = 0;
    for (std::size_t left = _count; left > 0;) {
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

#include "apps/common/RecordJson.h"

#include "platform/PathText.h"
#include "platform/formats/JsonWriter.h"

#include <string>
#include <vector>

namespace apps {
namespace {

    using platform::JsonWriter;
    using platform::Text;
    using platform::Value;

    /// A writer whose document is complete, and handed over, when it goes.
    class Document {
    public:
        explicit Document(Output& output)
            : writer([&output](std::string_view block) { output.writeThrough(block); })
        {
        }
        ~Document() { writer.endDocument(); }

        JsonWriter writer;
    };

    void writeText(JsonWriter& writer, std::string_view key, const Text& text)
    {
        writer.plainKey(key);
        writer.text(text);
    }

    void writeIcon(JsonWriter& writer, const OBImageRef& icon)
    {
        writeText(writer, "icon", icon ? icon->name() : Text());
    }

    /// `write` writes the texts among the values.
    template <class WriteText>
    void writeAttributes(JsonWriter& writer, const Value::Dictionary& attributes, const WriteText& write)
    {
        writer.plainKey("attributes");
        writer.beginObject();
        for (const auto& [key, value] : attributes) {
            writer.key(key);
            if (const Text* text = value.text())
                write(*text);
            else
                writer.value(value);
        }
        writer.endObject();
    }

    /// `write` writes the texts that may differ between the objects of a folder.
    template <class WriteText>
    void writeObject(
        JsonWriter& writer, const OBMediaObjectRecord& record, const Text& realPath, const WriteText& write)
    {
        writer.beginObject();
        writer.plainKey("mediaType");
        writer.integer(record.mediaType);
        writer.plainKey("name");
        write(record.name);
        writer.plainKey("mediaSourceType");
        writer.integer(record.mediaSourceType);
        writeText(writer, "sourcePluginIdentifier", record.sourcePluginIdentifier);
        writer.plainKey("path");
        write(record.path);
        writer.plainKey("aliasResolvedPath");
        write(realPath);
        writeIcon(writer, record.icon);
        writeAttributes(writer, record.attributes, write);
        writer.endObject();
    }

    void writeObject(JsonWriter& writer, const OBMediaObject& object, const OBMediaObjectRecord& record)
    {
        writeObject(writer, record, record.pathIsReal ? record.path : object.aliasResolvedPath(),
            [&writer](const Text& text) { writer.text(text); });
    }

    /// An object's JSON with gaps for its name and its file's name. The files of a folder mostly differ by these alone,
    /// and a library holds a million of them, so all else is looked up, quoted and put together once a folder.
    class ObjectStencil {
    public:
        /// Cuts it anew after an object that is as its batch made it.
        void cut(const OBMediaObjectRecord& record, std::string_view fileName)
        {
            _json.clear();
            _gaps.clear();
            JsonWriter writer([this](std::string_view block) { _json.append(block); });
            const auto writeGap = [&](std::string_view before, bool isOfName) {
                writer.string(before);
                writer.flush();
                _gaps.push_back({ _json.size() - 1, isOfName }); // before the closing quote
            };
            // Known by where the bytes lie: another text may happen to say the same.
            const auto isSame
                = [](const Text& left, const Text& right) { return left.view().data() == right.view().data(); };
            const std::string_view folder = record.path.view().substr(0, record.path.size() - fileName.size());
            writeObject(writer, record, record.path, [&](const Text& text) {
                if (isSame(text, record.name))
                    writeGap({}, true);
                else if (isSame(text, record.path))
                    writeGap(folder, false);
                else
                    writer.text(text);
            });
            writer.flush();
            layOut();
        }

        void write(JsonWriter& writer, std::string_view fileName)
        {
            _fileName.clear();
            JsonWriter::appendString(_fileName, fileName);
            // No full stop is ever escaped, and no escape holds one.
            const std::string_view name = platform::nameWithoutExtension(_fileName);
            for (std::size_t gap = 0; gap < _gaps.size(); ++gap)
                _pieces[2 * gap + 1] = _gaps[gap].isOfName ? name : std::string_view(_fileName);
            writer.json(_pieces);
        }

    private:
        struct Gap {
            std::size_t place;
            bool isOfName; ///< which leaves the extension out
        };

        void layOut()
        {
            const std::string_view json = _json;
            std::size_t start = 0;
            _pieces.clear();
            for (const Gap& gap : _gaps) {
                _pieces.push_back(json.substr(start, gap.place - start));
                _pieces.emplace_back(); // the gap
                start = gap.place;
            }
            _pieces.push_back(json.substr(start));
        }

        std::string _json;
        std::vector<Gap> _gaps;
        std::vector<std::string_view> _pieces; ///< of the JSON, and between each two what fills the gap there
        std::string _fileName; ///< of the object that is written, escaped
    };

    class ObjectsWriter final : public OBMediaObjectRunVisitor {
    public:
        explicit ObjectsWriter(JsonWriter& writer)
            : _writer(writer)
        {
        }

        void visitBatch(const OBMediaObjectBatch& batch, std::size_t count) override
        {
            bool isCut = false;
            std::size_t next = 0;
            batch.visit(count, [&](OBMediaObject& object) {
                const std::string_view fileName = batch.fileNameAtIndex(next++);
                if (isCut && object.isAsMade()) {
                    _stencil.write(_writer, fileName);
                    return true;
                }
                const OBMediaObjectRecord record = object.record();
                writeObject(_writer, object, record);
                if (record.isAsMade && !isCut && next < count) {
                    _stencil.cut(record, fileName);
                    isCut = true;
                }
                return true;
            });
        }
        void visitObject(const OBMediaObjectRef& object) override { writeObject(_writer, *object, object->record()); }

    private:
        JsonWriter& _writer;
        ObjectStencil _stencil {};
    };

    void writeObjects(JsonWriter& writer, const OBMediaObjectList& objects)
    {
        writer.beginList();
        ObjectsWriter visitor(writer);
        objects.visitRuns(visitor);
        writer.endList();
    }

    /// Begins the object of a group and writes all but its children; whoever calls ends it.
    void beginGroup(JsonWriter& writer, const OBMediaGroup& group)
    {
        writer.beginObject();
        const OBTypeIdentifierRef type = group.typeIdentifier();
        writer.plainKey("typeIdentifier");
        if (type)
            writer.string(type->text());
        else
            writer.null();
        writeText(writer, "name", group.name());
        writeText(writer, "ID", group.ID());
        writeText(writer, "parentID", group.parentID());
        writeIcon(writer, group.icon());
        writeText(writer, "path", group.path());
        writer.plainKey("modificationDate");
        if (const std::optional<platform::Date> date = group.modificationDate())
            writer.date(*date);
        else
            writer.null();
        writeAttributes(writer, group.attributes(), [&writer](const Text& text) { writer.text(text); });
        writer.plainKey("mediaObjects");
        writeObjects(writer, group.ownMediaObjects());
    }

    /// A group or object that is named without what is in it.
    struct NamedRecord {
        bool isObject;
        Text name;
        Text path;
        Text holder; ///< ID of the group that it lies in
    };

    void writeRecord(JsonWriter& writer, const NamedRecord& record)
    {
        writer.beginObject();
        writer.plainKey("kind");
        writer.string(record.isObject ? "object" : "group");
        writeText(writer, "name", record.name);
        writeText(writer, "path", record.path);
        writeText(writer, "group", record.holder);
        writer.endObject();
    }

    void writeHit(JsonWriter& writer, const FoundNames& found, const NameHit& hit)
    {
        const FlatGroup& place = found.groups[hit.group];
        const OBMediaGroup& group = *place.group;
        const bool isRoot = !hit.object && hit.group == 0;
        const OBMediaGroup& holder = hit.object ? group : *found.groups[place.parent].group;
        writeRecord(writer,
            { hit.object != nullptr, hit.object ? hit.object->name() : group.name(),
                hit.object ? hit.object->path() : group.path(), isRoot ? Text() : holder.ID() });
    }

    void writeChanges(JsonWriter& writer, std::string_view key, const std::vector<OBTreeChange>& changes)
    {
        writer.plainKey(key);
        writer.beginList();
        for (const OBTreeChange& change : changes)
            writeRecord(writer, { change.object != nullptr, change.name, change.path, change.groupID });
        writer.endList();
    }

    Text textOrNull(std::string_view text)
    {
        return text.empty() ? Text() : Text(text);
    }

    /// A group that was begun, and how many of its children were written.
    struct OpenGroup {
        OBMediaGroupList children;
        std::size_t written = 0;
    };

    OpenGroup beginGroupWithChildren(JsonWriter& writer, const OBMediaGroup& group)
    {
        beginGroup(writer, group);
        writer.plainKey("childGroups");
        writer.beginList();
        return { group.childGroups(), 0 };
    }

} // namespace

void printGroup(Output& output, const OBMediaGroupRef& group)
{
    Document document(output);
    JsonWriter& writer = document.writer;
    if (!group)
        return writer.null();
    // A stack of our own: folders may be nested deeper than the thread's.
    std::vector<OpenGroup> open;
    open.push_back(beginGroupWithChildren(writer, *group));
    while (!open.empty()) {
        OpenGroup& innermost = open.back();
        if (innermost.written < innermost.children.size()) {
            const OBMediaGroupRef child = innermost.children[innermost.written++];
            open.push_back(beginGroupWithChildren(writer, *child));
        } else {
            writer.endList();
            writer.endObject();
            open.pop_back();
        }
    }
}

void printGroups(Output& output, const OBMediaGroupList& groups)
{
    Document document(output);
    document.writer.beginList();
    for (const OBMediaGroupRef& group : groups) {
        beginGroup(document.writer, *group);
        document.writer.endObject();
    }
    document.writer.endList();
}

void printObjects(Output& output, const OBMediaObjectList& objects)
{
    Document document(output);
    writeObjects(document.writer, objects);
}

void printHits(Output& output, const FoundNames& found, std::size_t count)
{
    Document document(output);
    document.writer.beginList();
    for (std::size_t index = 0; index < count; ++index)
        writeHit(document.writer, found, found.hits[index]);
    document.writer.endList();
}

void printChanges(Output& output, const OBTreeChanges& changes, std::string_view half, std::string_view cause)
{
    Document document(output);
    JsonWriter& writer = document.writer;
    writer.beginObject();
    writeText(writer, "half", textOrNull(half));
    writeChanges(writer, "added", changes.added);
    writeChanges(writer, "removed", changes.removed);
    writeChanges(writer, "changed", changes.changed);
    writeText(writer, "cause", textOrNull(cause));
    writer.endObject();
}

void printValue(Output& output, const Value& value)
{
    Document document(output);
    document.writer.value(value);
}

} // namespace apps

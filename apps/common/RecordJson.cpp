#include "apps/common/RecordJson.h"

#include "platform/formats/JsonWriter.h"

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

    void writeAttributes(JsonWriter& writer, const Value::Dictionary& attributes)
    {
        writer.plainKey("attributes");
        writer.beginObject();
        for (const Value::Entry& attribute : attributes) {
            writer.key(attribute.first);
            writer.value(attribute.second);
        }
        writer.endObject();
    }

    void writeObject(JsonWriter& writer, const OBMediaObject& object)
    {
        const OBMediaObjectRecord record = object.record();
        writer.beginObject();
        writer.plainKey("mediaType");
        writer.integer(record.mediaType);
        writeText(writer, "name", record.name);
        writer.plainKey("mediaSourceType");
        writer.integer(record.mediaSourceType);
        writeText(writer, "sourcePluginIdentifier", record.sourcePluginIdentifier);
        writeText(writer, "path", record.path);
        writeText(writer, "aliasResolvedPath", record.pathIsReal ? record.path : object.aliasResolvedPath());
        writeIcon(writer, record.icon);
        writeAttributes(writer, record.attributes);
        writer.endObject();
    }

    void writeObjects(JsonWriter& writer, const OBMediaObjectList& objects)
    {
        writer.beginList();
        objects.visit([&writer](OBMediaObject& object) {
            writeObject(writer, object);
            return true;
        });
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
        writeAttributes(writer, group.attributes());
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

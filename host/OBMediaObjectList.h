#pragma once

#include "host/OBExport.h"
#include "host/OBMediaObjectOrigin.h"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <span>
#include <string_view>
#include <vector>

class OBMediaObjectBatch;

/// Is shown what a list is made of.
class OB_EXPORT OBMediaObjectRunVisitor {
public:
    virtual ~OBMediaObjectRunVisitor();
    /// The first `count` objects of a batch.
    virtual void visitBatch(const OBMediaObjectBatch& batch, std::size_t count) = 0;
    /// An object that was made by itself.
    virtual void visitObject(const OBMediaObjectRef& object) = 0;
};

/// A part of a list of media objects; immutable as far as any list shows it.
class OB_EXPORT OBMediaObjectSequence {
public:
    virtual ~OBMediaObjectSequence();
    /// The object at `index`; the sequence lives at least as long as it.
    virtual OBMediaObjectRef objectAtIndex(std::size_t index) const = 0;
    /// Calls `visit` for the first `count` objects in order until it answers false; answers false then.
    virtual bool visit(std::size_t count, const std::function<bool(OBMediaObject&)>& visitor) const = 0;
    /// Shows `visitor` what the first `count` objects are made of, in order.
    virtual void visitRuns(std::size_t count, OBMediaObjectRunVisitor& visitor) const = 0;
};

/// An immutable ordered list of media objects; 24 bytes, cheap to copy.
///
/// Lists share parts: a list made of other lists refers to them, so the root may repeat a million clips for nothing.
/// A list may be read on any thread while another thread makes a longer one from it.
class OB_EXPORT OBMediaObjectList {
public:
    OBMediaObjectList() = default;
    explicit OBMediaObjectList(const std::vector<OBMediaObjectRef>& objects);

    std::size_t size() const noexcept { return _count; }
    bool empty() const noexcept { return _count == 0; }
    OBMediaObjectRef operator[](std::size_t index) const { return _sequence->objectAtIndex(index); }

    /// Calls `visitor` for each object in order until it answers false.
    void visit(const std::function<bool(OBMediaObject&)>& visitor) const;
    /// Shows `visitor` what the list is made of, in order; batches stay valid while the list lives.
    void visitRuns(OBMediaObjectRunVisitor& visitor) const;

    /// Whether `other` is this very list, or a copy of it; lists made apart are not, whatever they hold.
    bool isSameAs(const OBMediaObjectList& other) const noexcept
    {
        return _count == other._count && (_count == 0 || _sequence == other._sequence);
    }

    /// This list followed by one more object, or by the objects of another list.
    OBMediaObjectList appending(OBMediaObjectRef object) const;
    OBMediaObjectList appending(const OBMediaObjectList& others) const;
    /// The first `count` objects.
    OBMediaObjectList prefix(std::size_t count) const;
    std::vector<OBMediaObjectRef> objects() const;

private:
    friend class OBMediaObjectBatch;
    struct Part;
    class Concatenation;

    OBMediaObjectList(std::shared_ptr<const OBMediaObjectSequence> sequence, std::size_t count)
        : _sequence(std::move(sequence))
        , _count(count)
    {
    }
    OBMediaObjectList appendingPart(Part part) const;

    std::shared_ptr<const OBMediaObjectSequence> _sequence;
    std::size_t _count = 0;
};

/// A folder whose files become media objects, or below which they lie where their kind says so.
struct OBFolderOfFiles {
    platform::Text path {}; ///< without a slash at its end
    bool pathIsReal = false; ///< the path of where the files lie is known to hold no symbolic link
};

/// A file of that folder.
struct OBFileOfFolder {
    std::string_view name {};
    bool isPlainFile = false; ///< it was seen to be a plain file, no link to one
    std::optional<platform::FileFacts> facts {}; ///< kept where they are known
};

struct TrailingBytes;

/// Makes the media objects of the files of one folder, in one block.
class OB_EXPORT OBMediaObjectBatch final : public OBMediaObjectSequence,
                                           private OBMediaObjectOrigin,
                                           public std::enable_shared_from_this<OBMediaObjectBatch> {
public:
    /// One object a file, in order; each is named after its file, without the extension.
    static OBMediaObjectList objects(
        std::shared_ptr<const OBMediaObjectKind> kind, OBFolderOfFiles folder, std::span<const OBFileOfFolder> files);
    ~OBMediaObjectBatch() override;

    OBMediaObjectRef objectAtIndex(std::size_t index) const override;
    bool visit(std::size_t count, const std::function<bool(OBMediaObject&)>& visitor) const override;
    void visitRuns(std::size_t count, OBMediaObjectRunVisitor& visitor) const override;

    /// The file names of the first `count` objects one after the other, with nothing between them: a search reads one
    /// block instead of a million objects. An object's name is its file name without the extension, always.
    std::string_view fileNames(std::size_t count) const;
    /// Where in them the file name of the object at `index` stands.
    std::string_view fileNameAtIndex(std::size_t index) const;
    /// The object whose file name holds the byte at `offset` of them.
    std::size_t indexOfFileNameAt(std::size_t offset) const;

private:
    struct MakeKey { };
    /// The facts of one file, and whether there are any, in as little room as they need.
    struct KeptFacts {
        std::int64_t seconds = 0;
        std::uint64_t size = 0;
        std::uint32_t nanoseconds = 0;
        bool areKnown = false;
    };
    static std::size_t keptFacts(std::span<const OBFileOfFolder> files);

    std::shared_ptr<const void> block() const override { return shared_from_this(); }
    const OBMediaObjectKind& kind() const override { return *_kind; }
    platform::Text nameOfObject(const OBMediaObject& object) const override;
    platform::Text pathOfObject(const OBMediaObject& object) const override;
    std::optional<platform::FileFacts> factsOfFile(const OBMediaObject& object) const override;
    std::string_view fileName(const OBMediaObject& object) const;

public:
    OBMediaObjectBatch(MakeKey key, const TrailingBytes& trailing, std::shared_ptr<const OBMediaObjectKind> kind,
        OBFolderOfFiles folder, std::span<const OBFileOfFolder> files);

private:
    std::size_t offsetOfFileName(std::size_t index) const;

    const std::shared_ptr<const OBMediaObjectKind> _kind;
    const platform::Text _folder;
    const std::span<OBMediaObject> _objects; ///< behind this
    const std::span<KeptFacts> _facts; ///< behind those, one an object; none where no facts are kept
    const char* const _names; ///< behind those: the names of the files, one after the other
};

#pragma once

#include "host/OBExport.h"
#include "host/OBMediaObjectOrigin.h"

#include <cstddef>
#include <functional>
#include <memory>
#include <span>
#include <string_view>
#include <vector>

/// A part of a list of media objects; immutable as far as any list shows it.
class OB_EXPORT OBMediaObjectSequence {
public:
    virtual ~OBMediaObjectSequence();
    /// The object at `index`; the sequence lives at least as long as it.
    virtual OBMediaObjectRef objectAtIndex(std::size_t index) const = 0;
    /// Calls `visit` for the first `count` objects in order until it answers false; answers false then.
    virtual bool visit(std::size_t count, const std::function<bool(OBMediaObject&)>& visitor) const = 0;
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

private:
    struct MakeKey { };

    std::shared_ptr<const void> block() const override { return shared_from_this(); }
    const OBMediaObjectKind& kind() const override { return *_kind; }
    platform::Text nameOfObject(const OBMediaObject& object) const override;
    platform::Text pathOfObject(const OBMediaObject& object) const override;
    std::string_view fileName(const OBMediaObject& object) const;

public:
    OBMediaObjectBatch(MakeKey key, const TrailingBytes& trailing, std::shared_ptr<const OBMediaObjectKind> kind,
        OBFolderOfFiles folder, std::span<const OBFileOfFolder> files);

private:
    const std::shared_ptr<const OBMediaObjectKind> _kind;
    const platform::Text _folder;
    const std::span<OBMediaObject> _objects; ///< behind this; the names of their files follow, one after the other
};

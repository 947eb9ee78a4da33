#pragma once

#include "host/OBMediaObject.h"
#include "platform/FileSystem.h"

#include <memory>
#include <optional>

/// Where a media object has from what nobody has set on it, and the block in which it lies. Constant, any thread.
class OBMediaObjectOrigin {
public:
    /// Keeps the object, and what belongs to it, alive.
    virtual std::shared_ptr<const void> block() const = 0;
    virtual const OBMediaObjectKind& kind() const = 0;
    virtual platform::Text nameOfObject(const OBMediaObject& object) const = 0;
    virtual platform::Text pathOfObject(const OBMediaObject& object) const = 0;

    /// What was seen of the object's file when it was found; absent where nothing was.
    virtual std::optional<platform::FileFacts> factsOfFile(const OBMediaObject&) const { return std::nullopt; }

    /// Of an object that stands for a group: the group's path, and the resolution and thumbnail of the movie by which
    /// it does.
    virtual platform::Text groupPath() const { return {}; }
    virtual std::optional<platform::Size> resolution() const { return std::nullopt; }
    virtual OBImageRef icon() const { return kind().icon; }

protected:
    ~OBMediaObjectOrigin() = default;
};

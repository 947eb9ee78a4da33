#pragma once

#include "host/OBExport.h"
#include "platform/ThreadSafety.h"
#include "platform/Value.h"

#include <memory>

class OBImage;
using OBImageRef = std::shared_ptr<OBImage>;

/// Where the pixels of an image come from. Nothing is read until an application draws it, with a decoder of its own.
struct OBPixelSource {
    enum class Kind {
        pictureFile, ///< a picture, such as SVG or PNG
        movieFile, ///< the poster frame of a movie
    };
    Kind kind = Kind::pictureFile;
    platform::Text file {}; ///< absolute path
};

/// A picture with a name, a size in points and a source of pixels. Shared by everything that shows it; identity counts.
/// Any thread.
class OB_EXPORT OBImage {
public:
    virtual ~OBImage();
    OBImage(const OBImage&) = delete;
    OBImage& operator=(const OBImage&) = delete;

    /// An image of a picture file, called `name` and `size` points large.
    static OBImageRef pictureNamed(platform::Text name, platform::Size size, platform::Text file);

    /// What lists and documents call it, such as "projectIcon".
    virtual platform::Text name() const = 0;
    virtual OBPixelSource pixelSource() const = 0;

    /// Points.
    platform::Size size() const;
    void setSize(platform::Size size);
    /// Whether a change of size scales the picture instead of giving it a larger canvas.
    bool scalesWhenResized() const;
    void setScalesWhenResized(bool scales);

    /// A new image of the same pixels and look, called `name`.
    OBImageRef copyNamed(platform::Text name) const;

protected:
    explicit OBImage(platform::Size size);

private:
    platform::Size _size GUARDED_BY(_lock);
    mutable platform::SmallLock _lock;
    bool _scales GUARDED_BY(_lock) = false;
};

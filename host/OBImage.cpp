#include "host/OBImage.h"

#include <utility>

using platform::Locked;
using platform::Size;
using platform::Text;

namespace {

class NamedImage final : public OBImage {
public:
    NamedImage(Text name, Size size, OBPixelSource source)
        : OBImage(size)
        , _name(std::move(name))
        , _source(std::move(source))
    {
    }
    Text name() const override { return _name; }
    OBPixelSource pixelSource() const override { return _source; }

private:
    const Text _name;
    const OBPixelSource _source;
};

} // namespace

OBImage::OBImage(Size size)
    : _size(size)
{
}

OBImage::~OBImage() = default;

OBImageRef OBImage::pictureNamed(Text name, Size size, Text file)
{
    return std::make_shared<NamedImage>(
        std::move(name), size, OBPixelSource { OBPixelSource::Kind::pictureFile, std::move(file) });
}

Size OBImage::size() const
{
    Locked guard(_lock);
    return _size;
}

void OBImage::setSize(Size size)
{
    Locked guard(_lock);
    _size = size;
}

bool OBImage::scalesWhenResized() const
{
    Locked guard(_lock);
    return _scales;
}

void OBImage::setScalesWhenResized(bool scales)
{
    Locked guard(_lock);
    _scales = scales;
}

OBImageRef OBImage::copyNamed(Text name) const
{
    auto copy = std::make_shared<NamedImage>(std::move(name), size(), pixelSource());
    copy->setScalesWhenResized(scalesWhenResized());
    return copy;
}

#include "host/OBImage.h"

#include <utility>

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
    : _look(Look { size, false })
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
    return _look.load().size;
}

void OBImage::setSize(Size size)
{
    _look.update([size](Look look) { return Look { size, look.scales }; });
}

bool OBImage::scalesWhenResized() const
{
    return _look.load().scales;
}

void OBImage::setScalesWhenResized(bool scales)
{
    _look.update([scales](Look look) { return Look { look.size, scales }; });
}

OBImageRef OBImage::copyNamed(Text name) const
{
    auto copy = std::make_shared<NamedImage>(std::move(name), size(), pixelSource());
    copy->setScalesWhenResized(scalesWhenResized());
    return copy;
}

#include "host/OBMediaBrowserImageManager.h"

#include "host/FrameworkCore.h"

std::shared_ptr<OBMediaBrowserImageManager> OBMediaBrowserImageManager::sharedInstance()
{
    const auto core = FrameworkCore::current();
    return core ? std::shared_ptr<OBMediaBrowserImageManager>(core, &core->imageManager()) : nullptr;
}

OBImageRef OBMediaBrowserImageManager::imageNamed_inBundle(std::string_view name, const OBBundle& bundle)
{
    const platform::Locked guard(_lock);
    std::weak_ptr<OBImage>& known = _images[{ bundle.folder(), std::string(name) }];
    OBImageRef image = known.lock();
    if (!image) {
        image = bundle.imageNamed(name, platform::Text(name));
        known = image;
    }
    return image;
}

#pragma once

#include "host/OBBundle.h"
#include "host/OBExport.h"
#include "host/OBImage.h"
#include "platform/ThreadSafety.h"

#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <utility>

/// Hands out the pictures of bundles, each picture as one image for as long as somebody uses it. Any thread.
class OB_EXPORT OBMediaBrowserImageManager {
public:
    /// The one manager of the host; null while there is no host.
    static std::shared_ptr<OBMediaBrowserImageManager> sharedInstance();

    /// Null when the bundle has no such picture.
    OBImageRef imageNamed_inBundle(std::string_view name, const OBBundle& bundle);

private:
    platform::Mutex _lock;
    std::map<std::pair<std::string, std::string>, std::weak_ptr<OBImage>> _images GUARDED_BY(_lock);
};

#include "host/PasteboardTypes.h"

#include "host/OBMediaObject.h"
#include "platform/FileUri.h"

void PasteboardFiles::add(const OBMediaObject& object)
{
    const platform::Text path = object.aliasResolvedPath();
    if (!path)
        return;
    const std::string uri = platform::fileUri(path);
    uriList += uri + "\r\n";
    copiedFiles += (copiedFiles.empty() ? "copy\n" : "\n") + uri;
    plainText += path.string() + "\n";
}

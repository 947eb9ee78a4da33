#include "platform/formats/PropertyList.h"

#include "platform/formats/PropertyListReaders.h"

namespace platform {

PropertyListResult readPropertyList(std::string_view bytes)
{
    constexpr std::string_view binaryMark = "bplist";
    if (bytes.empty())
        return { {}, "the property list is empty" };
    if (bytes.size() > largestPropertyList)
        return { {}, "the property list is larger than 64 MiB" };
    const bool isBinary = bytes.substr(0, binaryMark.size()) == binaryMark;
    return isBinary ? readBinaryPropertyList(bytes) : readXmlPropertyList(bytes);
}

} // namespace platform

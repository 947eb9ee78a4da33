#include "platform/formats/PropertyList.h"

#include "fuzz/FuzzTarget.h"

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const platform::PropertyListResult result = platform::readPropertyList(fuzz::text(data, size));
    fuzz::expectOneLine(result.problem);
    if (!result.problem.empty() || result.value.isNull())
        return 0;
    // Keys that differ only in what XML cannot hold become equal, so the copy may be refused, but for nothing else.
    const std::string xml = platform::writeXmlPropertyList(result.value);
    const platform::PropertyListResult copy = platform::readPropertyList(xml);
    if (!copy.problem.empty())
        fuzz::expect(copy.problem.find("occurs twice") != std::string::npos);
    else
        fuzz::expect(platform::writeXmlPropertyList(copy.value) == xml);
    return 0;
}

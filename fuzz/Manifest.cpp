#include "platform/formats/Manifest.h"

#include "fuzz/FuzzTarget.h"

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const platform::ManifestAnswer answer = platform::readManifest(fuzz::text(data, size));
    fuzz::expectOneLine(answer.problem);
    fuzz::expect(answer.problem.empty() != answer.manifest.library.empty());
    return 0;
}

#include "platform/formats/DesktopEntry.h"

#include "fuzz/FuzzTarget.h"
#include "platform/formats/DesktopFile.h"

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string_view bytes = fuzz::text(data, size);
    const platform::DesktopEntryResult result = platform::readDesktopEntry(bytes);
    for (std::string_view exec : { std::string_view(result.entry.exec), bytes }) {
        const platform::ExecArguments arguments = platform::splitExec(exec);
        fuzz::expect(arguments.arguments.empty() != arguments.problem.empty());
    }
    for (const std::string& part : platform::DesktopFile(bytes).list("Desktop Entry", "MimeType", ';'))
        fuzz::expect(!part.empty());
    return 0;
}

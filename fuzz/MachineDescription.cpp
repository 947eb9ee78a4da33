#include "platform/described/MachineDescription.h"

#include "fuzz/FuzzTarget.h"

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    fuzz::expectOneLine(platform::readMachineDescription(fuzz::text(data, size), "/folder").problem);
    return 0;
}

#include "platform/linux/PictureSize.h"

#include "fuzz/FuzzTarget.h"

#include <cmath>

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const platform::Size picture = platform::sizeOfVectorPicture(fuzz::text(data, size));
    fuzz::expect(std::isfinite(picture.width) && std::isfinite(picture.height));
    fuzz::expect((picture.width > 0 && picture.height > 0) || (picture.width == 0 && picture.height == 0));
    return 0;
}

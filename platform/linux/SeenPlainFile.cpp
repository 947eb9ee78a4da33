#include "platform/linux/SeenPlainFile.h"

#include "platform/linux/ItemReading.h"
#include "platform/linux/OpenWithoutLinks.h"

#include <fcntl.h>

namespace platform {

OpenedFile openSeenPlainFile(const char* path)
{
    OpenedFile file;
    file.descriptor = Descriptor(openWithoutLinks(AT_FDCWD, path, O_RDONLY | O_CLOEXEC | O_NOCTTY | O_NONBLOCK));
    if (file.descriptor.isOpen()) {
        const auto status = readItemStatus(file.descriptor.number(), "", AT_EMPTY_PATH);
        if (status && status->kind == ItemKind::file) {
            file.status = *status;
            return file;
        }
    }
    return openPlainFileAt(AT_FDCWD, path);
}

} // namespace platform

#include "platform/linux/SeenPlainFile.h"

#include "platform/linux/ItemReading.h"
#include "platform/linux/OpenWithoutLinks.h"

#include <cerrno>

#include <fcntl.h>

namespace platform {

OpenedFile openSeenPlainFile(const char* path)
{
    OpenedFile file;
    file.descriptor = Descriptor(openWithoutLinks(AT_FDCWD, path, O_RDONLY | O_CLOEXEC | O_NOCTTY | O_NONBLOCK));
    if (!file.descriptor.isOpen()) {
        const bool isUntold = errno == ELOOP || errno == ENOSYS || errno == EPERM;
        file.problem = isUntold ? FileProblem::linkOnTheWay : problemOfError(errno);
        return file;
    }
    const auto status = readItemStatus(file.descriptor.number(), "", AT_EMPTY_PATH);
    if (status && status->kind == ItemKind::file)
        file.status = *status;
    else
        file.problem = status ? FileProblem::notAPlainFile : FileProblem::readError;
    return file;
}

} // namespace platform

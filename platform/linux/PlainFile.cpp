#include "platform/linux/PlainFile.h"

#include "platform/linux/ItemReading.h"

#include <cerrno>
#include <limits>

#include <fcntl.h>
#include <sys/stat.h>

namespace platform {

namespace {

    OpenedFile failed(FileProblem problem)
    {
        OpenedFile file;
        file.problem = problem;
        return file;
    }

    // Without waiting, in case something else has taken the file's place since it was looked at. Only a plain file
    // answers that this would block: somebody holds a lease on it (fcntl(2), as file servers do), who has to be waited
    // for.
    int openForReading(int folder, const char* path)
    {
        constexpr int flags = O_RDONLY | O_CLOEXEC | O_NOCTTY;
        const int number = uninterrupted([&] { return openat(folder, path, flags | O_NONBLOCK); });
        if (number == -1 && errno == EWOULDBLOCK)
            return uninterrupted([&] { return openat(folder, path, flags); });
        return number;
    }

} // namespace

OpenedFile openPlainFileAt(int folder, const char* path)
{
    struct stat facts;
    if (uninterrupted([&] { return fstatat(folder, path, &facts, 0); }) == -1)
        return failed(problemOfError(errno));
    if (!S_ISREG(facts.st_mode))
        return failed(FileProblem::notAPlainFile);
    OpenedFile file;
    file.descriptor = Descriptor(openForReading(folder, path));
    if (!file.descriptor.isOpen())
        return failed(problemOfError(errno));
    const auto status = readItemStatus(file.descriptor.number(), "", AT_EMPTY_PATH);
    if (!status)
        return failed(FileProblem::readError);
    if (status->kind != ItemKind::file)
        return failed(FileProblem::notAPlainFile);
    file.status = *status;
    return file;
}

std::size_t readFully(int file, std::uint64_t offset, std::span<std::byte> buffer)
{
    constexpr std::uint64_t lastOffset = std::numeric_limits<off_t>::max();
    std::size_t done = 0;
    while (done < buffer.size() && offset <= lastOffset - done) {
        const auto position = static_cast<off_t>(offset + done);
        const auto rest = buffer.subspan(done);
        const ssize_t count = uninterrupted([&] { return pread(file, rest.data(), rest.size(), position); });
        if (count <= 0)
            break;
        done += static_cast<std::size_t>(count);
    }
    return done;
}

} // namespace platform

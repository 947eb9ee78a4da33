#pragma once

namespace platform {

/// openat2(2) of an absolute `path` with `flags`, in which no component may be a symbolic link. A descriptor, or -1 with
/// errno: ELOOP at a link, ENOSYS or EPERM on kernels before 5.6 and in sandboxes that refuse the call.
int openWithoutLinks(const char* path, int flags);

} // namespace platform

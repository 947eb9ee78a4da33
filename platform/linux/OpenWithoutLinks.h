#pragma once

namespace platform {

/// openat2(2) of `path`, relative to the open folder `parent` (or AT_FDCWD), with `flags`; in the path no component may
/// be a symbolic link. A descriptor, or -1 with errno: ELOOP at a link, ENOSYS or EPERM on kernels before 5.6 and in
/// sandboxes that refuse the call.
int openWithoutLinks(int parent, const char* path, int flags);

} // namespace platform

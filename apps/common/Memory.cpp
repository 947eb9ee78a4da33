#include "apps/common/Memory.h"

#include <cstdlib> // tells whose C library this is

#if defined(__GLIBC__)
#include <malloc.h>
#endif

namespace apps {

void takeMemoryInLargeSteps()
{
#if defined(__GLIBC__)
    constexpr int step = 1 << 20;
    mallopt(M_ARENA_MAX, 1);
    mallopt(M_TOP_PAD, step);
#endif
}

} // namespace apps

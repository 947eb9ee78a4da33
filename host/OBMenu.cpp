#include "host/OBMenu.h"

#include "host/OBMediaManager.h"

void OBMenuItem::choose() const
{
    const auto manager = target.lock();
    if (manager && action)
        action->perform(*manager, *this);
}

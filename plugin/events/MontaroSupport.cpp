#include "plugin/events/MontaroSupport.h"

#include "host/OBConstants.h"
#include "host/OBTextComparison.h"

int MontaroSupport::_MontaroRootGroupComparison(const OBMediaGroup& receiver, const OBMediaGroup& other)
{
    if (receiver.typeIdentifier() == OBMontaroEventLibraryGroupTypeIdentifier)
        return 1;
    if (other.typeIdentifier() == OBMontaroEventLibraryGroupTypeIdentifier)
        return -1;
    const platform::Text name = receiver.name();
    const platform::Text otherName = other.name();
    if (!name || !otherName)
        return 0;
    return OBCaseInsensitiveCompare(name, otherName);
}

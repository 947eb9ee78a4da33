// The editor's choice of order.
//
// The one surprise: the first reading comes from construction, before the lock exists, and runs without it.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"
#include "plugin/PreferenceValues.h"

namespace {

constexpr const char* mostRecentFirstKey = "ZREventLibraryModule.arrangeEventsByMostRecent";

} // namespace

void OBMontaroPlugin::_checkMontaroPreferences() NO_THREAD_SAFETY_ANALYSIS
{
    if (_updatePreferencesLock)
        _updatePreferencesLock->lock();
    _mostRecentEventFirst = true;
    // The file is read afresh here, so what the editor has written meanwhile is seen.
    const platform::Value stored = preferencesOfDomain(MontaroBundleIdentifier).valueForKey(mostRecentFirstKey);
    if (const std::optional<bool> mostRecentFirst = booleanOfPreference(stored))
        _mostRecentEventFirst = *mostRecentFirst;
    if (_updatePreferencesLock)
        _updatePreferencesLock->unlock();
}

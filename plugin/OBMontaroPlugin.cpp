// Construction, teardown and identity.
//
// The one surprise: the order of both is part of what the class promises. The icons need their lock, the first reading
// of the preferences runs before its lock exists, and teardown empties what the class shares, so that a later instance
// makes it again.

#include "plugin/OBMontaroPlugin.h"

#include "plugin/MontaroConstants.h"
#include "plugin/PreferenceValues.h"
#include "plugin/SharedValues.h"

#include "host/OBMediaManagerClass.h"
#include "platform/Immortal.h"

using platform::Text;
using platform::Value;

const double OBMBMontaroPluginVersionNumber = 288.2;
const unsigned char OBMBMontaroPluginVersionString[]
    = "@(#)PROGRAM:OBMBMontaroPlugin  PROJECT:OBMBMontaroPlugin-288.2.12\n";

namespace {

constexpr double defaultLoadThreadPriority = 0.5;
constexpr const char* threadPriorityKey = "MediaBrowserThreadPriorityFolderMediaManager";

} // namespace

SharedValues& sharedValues()
{
    static platform::Immortal<SharedValues> values;
    return *values;
}

OBMontaroPlugin::OBMontaroPlugin(const OBManagerContext& context)
    : OBMediaManager(context)
{
}

OBMontaroPlugin::~OBMontaroPlugin() = default;

bool OBMontaroPlugin::init()
{
    if (!OBMediaManager::init())
        return false;

    _appIconLock = std::make_unique<platform::RecursiveMutex>();
    {
        platform::Locked guard(*_appIconLock);
        _appIcon = nullptr;
    }

    _mostRecentEventFirst = true;
    _poolingProjectsReload = false;
    _poolingEventsReload = false;

    setNeedsReload(true);
    setAutoReloadEnabled(true);

    _grabMontaroIcons();
    _checkMontaroPreferences();

    _updatePreferencesLock = std::make_unique<platform::Mutex>();
    _MontaroSearchPaths.store(nullptr);
    _MontaroEventsSearchPaths.store(nullptr);
    _MontaroSearchPathsLock = std::make_unique<platform::Mutex>();
    _MontaroEventsSearchPathsLock = std::make_unique<platform::Mutex>();
    _flatEventGroupsList.store(nullptr);
    _flatProjectGroupsList.store(nullptr);

    setLoadThreadPriority(defaultLoadThreadPriority);
    const Value stored = preferencesOfDomain(OBHostPreferencesDomain).valueForKey(threadPriorityKey);
    if (const std::optional<double> priority = doubleOfPreference(stored);
        priority && *priority >= 0.0 && *priority <= 1.0)
        setLoadThreadPriority(*priority);
    return true;
}

void OBMontaroPlugin::dealloc()
{
    {
        // The lock goes first, so nothing is guarded any more: no other thread may be inside a manager being torn down.
        const std::unique_ptr<platform::RecursiveMutex> last = std::move(_appIconLock);
        dropAppIcon();
    }

    SharedValues& shared = sharedValues();
    shared.smallAppIcon.store(nullptr);
    shared.projectIcon.store(nullptr);
    shared.emptyProjectIcon.store(nullptr);
    shared.calendarIcon.store(nullptr);
    shared.eventIcon.store(nullptr);

    _flatEventGroupsList.store(nullptr);
    _flatProjectGroupsList.store(nullptr);
    _MontaroSearchPaths.store(nullptr);
    _MontaroEventsSearchPaths.store(nullptr);
    _MontaroSearchPathsLock = nullptr;
    _MontaroEventsSearchPathsLock = nullptr;
    shared.defaultProjectsPath.store({});
    shared.defaultEventsPath.store({});
    _updatePreferencesLock = nullptr;

    OBMediaManager::dealloc();
}

/// Only teardown calls this, when the icon's lock is gone.
void OBMontaroPlugin::dropAppIcon()
{
    _appIcon = nullptr;
}

bool OBMontaroPlugin::isManagedMediaSource()
{
    return false;
}

Text OBMontaroPlugin::displayName()
{
    return rootMediaGroupTitle();
}

OBImageRef OBMontaroPlugin::displayImage()
{
    return rootMediaGroupIcon();
}

Text OBMontaroPlugin::uniqueID()
{
    return rootMediaGroupTitle();
}

Text OBMontaroPlugin::rootMediaGroupTitle()
{
    return OBMontaro;
}

int OBMontaroPlugin::mediaTypesSupported()
{
    return OBMediaTypesMovies;
}

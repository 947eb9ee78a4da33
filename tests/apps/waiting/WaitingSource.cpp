// A source whose disk never answers: its load ends when somebody cancels it. It offers no inspection.

#include "host/OBConstants.h"
#include "host/OBMediaManager.h"
#include "host/OBMediaManagerClass.h"
#include "platform/Clock.h"

#include <chrono>
#include <memory>

namespace {

class WaitingSource final : public OBMediaManager, public OBMediaManagerPlugin_MustImplement {
public:
    explicit WaitingSource(const OBManagerContext& context)
        : OBMediaManager(context)
    {
    }

    bool canLoadData() override { return true; }
    platform::Text displayName() override { return "Waiting"; }

    OBMediaGroupRef performLoadData() override
    {
        using namespace std::chrono_literals;
        noteFoldersDone(1204);
        noteItemsFound(38110);
        notePathAtWork("/Volumes/Stick/Montaro Projects");
        platform::WakeSignal never;
        while (!isCancelLoadRequestPending())
            platform().clock.sleep(10ms, never);
        return OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    }
};

class WaitingClass final : public OBMediaManagerClass {
public:
    std::unique_ptr<OBMediaManager> alloc(const OBManagerContext& context) const override
    {
        return std::make_unique<WaitingSource>(context);
    }
};

} // namespace

extern "C" OB_EXPORT const OBMediaManagerClass* OBPluginMediaManagerClass()
{
    static const WaitingClass waitingClass;
    return &waitingClass;
}

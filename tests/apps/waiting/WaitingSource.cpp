// A source whose disk never answers: its load ends when somebody cancels it. It offers no inspection.
//
// OMBRIX_WAITING changes that: with "unable" it cannot load, with "throw" its load throws an error, with "nameless"
// its name does. With "deaf" it shows the folder that
// OMBRIX_WAITING_FOLDER names while that is there, and watches nothing.

#include "host/OBConstants.h"
#include "host/OBMediaManager.h"
#include "host/OBMediaManagerClass.h"
#include "platform/Clock.h"
#include "platform/FileSystem.h"

#include <chrono>
#include <cstdlib>
#include <memory>
#include <stdexcept>
#include <string_view>

namespace {

bool isTold(std::string_view what)
{
    const char* const told = std::getenv("OMBRIX_WAITING");
    return told && told == what;
}

class WaitingSource final : public OBMediaManager, public OBMediaManagerPlugin_MustImplement {
public:
    explicit WaitingSource(const OBManagerContext& context)
        : OBMediaManager(context)
    {
    }

    bool canLoadData() override { return !isTold("unable"); }
    platform::Text displayName() override
    {
        if (isTold("nameless"))
            throw std::runtime_error("it has no name");
        return "Waiting";
    }

    OBMediaGroupRef performLoadData() override
    {
        if (isTold("deaf"))
            return treeOfFolder(std::getenv("OMBRIX_WAITING_FOLDER"));
        using namespace std::chrono_literals;
        if (isTold("throw"))
            throw std::runtime_error("the disk is made of cheese");
        noteFoldersDone(1204);
        noteItemsFound(38110);
        notePathAtWork("/Volumes/Stick/Montaro Projects");
        platform::WakeSignal never;
        while (!isCancelLoadRequestPending())
            platform().clock.sleep(10ms, never);
        return OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    }

private:
    OBMediaGroupRef treeOfFolder(const char* folder)
    {
        OBMediaGroupRef root = OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
        if (folder && platform().fileSystem.exists(folder)) {
            OBMediaGroupRef child = OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
            child->setPath(folder);
            child->setID(folder);
            root->addChildGroup(child);
        }
        return root;
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

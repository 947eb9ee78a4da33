#include "tests/host/TestHost.h"

#include "host/OBConstants.h"
#include "host/OBMediaObject.h"

#include <doctest/doctest.h>

#include <utility>

namespace tests {

TestHost::TestHost()
{
    machine.addBundle("plugins/Source.obplugin", identifier);
    options.pluginFolders = { machine.folder.path("plugins") };
    options.logSink = [log = log](std::string_view message, int level, const OBMediaManager* sender) {
        log->write(std::to_string(level) + (sender ? " manager " : " - ") + std::string(message));
    };
    setScript(script);
}

TestHost::~TestHost()
{
    script->gate.open();
    if (_host)
        CHECK(_host->waitForThreads(longestWait));
    _host = nullptr;
    setScript(nullptr);
}

OBMediaHost& TestHost::host()
{
    if (!_host)
        _host = std::make_unique<OBMediaHost>(machine.platform(), options);
    return *_host;
}

std::shared_ptr<OBMediaManager> TestHost::manager()
{
    OBManagerResult result = host().createManager(identifier);
    REQUIRE_MESSAGE(result.manager, result.problem);
    return std::move(result.manager);
}

MadeUpBundle& TestHost::bundle()
{
    return machine.bundles.bundles.find(bundleFolder())->second;
}

std::string TestHost::bundleFolder() const
{
    return machine.folder.path("plugins/Source.obplugin");
}

void TestHost::endHost()
{
    script->gate.open();
    if (_host)
        CHECK(_host->waitForThreads(longestWait));
    _host = nullptr;
}

std::shared_ptr<OBMediaObjectKind> movieKind()
{
    auto kind = std::make_shared<OBMediaObjectKind>();
    kind->mediaType = OBMediaTypeMovie;
    kind->mediaSourceType = OBMediaSourceTypePlugin;
    kind->sourcePluginIdentifier = TestHost::identifier;
    return kind;
}

} // namespace tests

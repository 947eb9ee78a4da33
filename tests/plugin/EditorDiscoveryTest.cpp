#include "tests/plugin/support/SourceMachine.h"

#include <doctest/doctest.h>

using namespace tests;
using Log = std::vector<SourceMachine::LogLine>;

namespace {

constexpr const char* notFound = "OBMBMontaroPlugin -- getAppPath -- could not find Montaro Application";

/// How the log shows a look-up that failed, `times` times.
Log failures(std::size_t times, const OBMediaManager& source)
{
    return Log(times, { notFound, 2, &source });
}

} // namespace

TEST_CASE("the editor is sought under its application identifier, afresh at every call")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.trace.take();
    const std::string first = machine.disk.path("opt/montaro");
    CHECK(source->getAppPath().string() == first);
    machine.workspace.editor.store("/elsewhere/montaro");
    CHECK(source->getAppPath() == "/elsewhere/montaro");
    machine.workspace.editor.store(std::nullopt);
    CHECK(source->getAppPath().isAbsent());
    CHECK(machine.trace.take() == std::vector<std::string>(3, "application org.ombrix.Montaro"));
}

TEST_CASE("each answer that the editor is installed writes one line with its path")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.takeLog();
    CHECK(source->appInstalled());
    CHECK(source->appInstalled());
    const std::string line = "appInstalled: OS told me: " + machine.disk.path("opt/montaro");
    CHECK(machine.takeLog() == Log(2, { line, 2, source.get() }));
}

TEST_CASE("finding the editor, asking whether it can load and showing its icon write nothing")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    source->getAppPath();
    source->canLoadData();
    source->rootMediaGroupIcon();
    CHECK(machine.takeLog().empty());
}

TEST_CASE("without the editor each question about it writes one line")
{
    SourceMachine machine;
    machine.workspace.editor.store(std::nullopt);
    const auto source = machine.makeSource();
    machine.takeLog();
    CHECK_FALSE(source->appInstalled());
    CHECK(machine.takeLog() == failures(1, *source));
    CHECK_FALSE(source->canLoadData());
    CHECK(machine.takeLog() == failures(1, *source));
    CHECK(source->getAppPath().isAbsent());
    CHECK(machine.takeLog() == failures(1, *source));
}

TEST_CASE("without the editor construction writes one line, for the root icon, and later uses of the icon none")
{
    SourceMachine machine;
    machine.workspace.editor.store(std::nullopt);
    const auto source = machine.makeSource();
    CHECK(machine.takeLog() == failures(1, *source));
    source->rootMediaGroupIcon();
    source->displayImage();
    CHECK(machine.takeLog().empty());
}

TEST_CASE("without the editor and without a picture each look-up of the root icon writes one line")
{
    SourceMachine machine;
    machine.workspace.editor.store(std::nullopt);
    machine.bundles.hasPictures.store(false);
    const auto source = machine.makeSource();
    machine.takeLog();
    source->rootMediaGroupIcon();
    source->displayImage();
    CHECK(machine.takeLog() == failures(2, *source));
}

TEST_CASE("an editor that is registered but whose files are gone is installed and cannot load")
{
    SourceMachine machine;
    machine.workspace.editor.store("/nowhere/montaro");
    const auto source = machine.makeSource();
    machine.takeLog();
    CHECK(source->appInstalled());
    CHECK(machine.takeLog() == Log(1, { "appInstalled: OS told me: /nowhere/montaro", 2, source.get() }));
    CHECK_FALSE(source->canLoadData());
    CHECK(machine.takeLog().empty());
}

TEST_CASE("a folder at the editor's path is enough to load")
{
    SourceMachine machine;
    machine.workspace.editor.store(machine.disk.folder("opt/Montaro.app"));
    CHECK(machine.makeSource()->canLoadData());
}

TEST_CASE("the editor's version is a fixed text, whether or not it is installed")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(source->applicationVersion() == "10.0");
    machine.workspace.editor.store(std::nullopt);
    CHECK(source->applicationVersion() == "10.0");
    CHECK(machine.takeLog().empty());
}

TEST_CASE("without the editor nothing is loaded")
{
    SourceMachine machine;
    machine.projects().project("Trip").movie("a.mov");
    machine.workspace.editor.store(std::nullopt);
    const auto source = machine.makeSource();
    const OBLoadResult result = machine.load(*source);
    CHECK(result.outcome == OBLoadOutcome::unavailable);
    CHECK(result.rootMediaGroup == nullptr);
    CHECK(source->firstTimeCallingLoadData());
}

#include "tests/platform/contract/Machines.h"

#include "platform/Preferences.h"
#include "platform/common/FilePreferences.h"

#include <doctest/doctest.h>

#include <cstdlib>

using namespace tests;

namespace {

constexpr std::string_view head = "<?xml version=\"1.0\" encoding=\"UTF-8\"?><plist version=\"1.0\">";

std::string propertyList(const std::string& content)
{
    return std::string(head) + content + "</plist>";
}

/// Preferences over each kind of file system, the home being the folder `home` on its disk.
template <class Machine> struct MachineWithHome {
    class Files : public platform::LinkedFileSystem {
    public:
        explicit Files(const MachineWithHome& machine)
            : LinkedFileSystem(machine.machine.files, machine.table)
            , _machine(machine)
        {
        }
        std::optional<std::string> homeFolder() const override { return _machine.machine.root + "/home"; }

    private:
        const MachineWithHome& _machine;
    };

    Machine machine {};
    ListedVolumes volumes {};
    platform::LinkTable table { {}, volumes, machine.files };
    Files files { *this };
    platform::FilePreferences preferences { files };

    void store(const std::string& domain, const std::string& bytes) const
    {
        machine.disk.file("home/Library/Preferences/" + domain + ".plist", bytes);
    }
};

} // namespace

TEST_CASE_TEMPLATE(
    "a stored domain is read from its property list each time it is asked for", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const MachineWithHome<Machine> machine;
    machine.store("org.ombrix.Test", propertyList("<dict><key>a</key><integer>1</integer></dict>"));
    const auto first = machine.preferences.valuesOfDomain("org.ombrix.Test");
    CHECK(first.values.valueForKey("a") == platform::Value(1));
    CHECK(first.problem.empty());
    machine.store("org.ombrix.Test", propertyList("<dict><key>a</key><true/></dict>"));
    CHECK(machine.preferences.valuesOfDomain("org.ombrix.Test").values.valueForKey("a") == platform::Value(true));
}

TEST_CASE_TEMPLATE("a domain that was never stored is absent without a problem", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const MachineWithHome<Machine> machine;
    for (const char* domain : { "org.ombrix.Test", "", "a/b", "../x" }) {
        const auto answer = machine.preferences.valuesOfDomain(domain);
        CHECK(answer.values.isNull());
        CHECK(answer.problem.empty());
    }
}

TEST_CASE_TEMPLATE(
    "a stored domain that cannot be read is absent, and one line says why", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const MachineWithHome<Machine> machine;
    const std::string whole = propertyList("<dict><key>a</key><integer>1</integer></dict>");
    std::string content;
    SUBCASE("cut short")
    {
        content = whole.substr(0, whole.size() / 2);
    }
    SUBCASE("empty")
    {
        content = "";
    }
    SUBCASE("no property list")
    {
        content = "hello";
    }
    SUBCASE("no dictionary")
    {
        content = propertyList("<array/>");
    }
    SUBCASE("damaged binary")
    {
        content = "bplist00 and nothing";
    }
    SUBCASE("too large")
    {
        content = whole + std::string(std::size_t { 17 } << 20, ' ');
    }
    machine.store("bad", content);
    const auto answer = machine.preferences.valuesOfDomain("bad");
    CHECK(answer.values.isNull());
    CHECK(answer.problem.find(machine.machine.root + "/home/Library/Preferences/bad.plist: ") == 0);
    CHECK(answer.problem.find('\n') == std::string::npos);
}

TEST_CASE_TEMPLATE("what is stored as no plain file is not waited for", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const MachineWithHome<Machine> machine;
    machine.machine.disk.pipe("home/Library/Preferences/pipe.plist");
    machine.machine.disk.folder("home/Library/Preferences/folder.plist");
    machine.machine.disk.link("home/Library/Preferences/circle.plist", "circle.plist");
    CHECK(machine.preferences.valuesOfDomain("pipe").problem.find("no plain file") != std::string::npos);
    CHECK(machine.preferences.valuesOfDomain("folder").problem.find("no plain file") != std::string::npos);
    CHECK(machine.preferences.valuesOfDomain("circle").problem.find("circles") != std::string::npos);
}

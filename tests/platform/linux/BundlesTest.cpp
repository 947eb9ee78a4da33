#include "platform/linux/LinuxBundles.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include <dlfcn.h>

using platform::LinuxBundles;
using platform::LinuxFileSystem;
using tests::TemporaryFolder;

namespace {

using Paths = std::vector<std::string>;

/// The bytes of a shared library that surely is there: the one that this program's streams come from.
std::string bytesOfSharedLibrary()
{
    Dl_info information {};
    REQUIRE(dladdr(dlsym(RTLD_DEFAULT, "_ZTVSt9exception"), &information) != 0);
    std::stringstream bytes;
    bytes << std::ifstream(information.dli_fname, std::ios::binary).rdbuf();
    return bytes.str();
}

bool isAbout(const std::string& problem, const std::string& path)
{
    return problem.substr(0, path.size() + 1) == path + ':' && problem.find('\n') == std::string::npos;
}

struct Bundle {
    LinuxFileSystem files;
    LinuxBundles bundles { files };
    TemporaryFolder folder;
};

} // namespace

TEST_CASE("a manifest is read, and what is wrong with it is told with file and line")
{
    const Bundle bundle;
    const std::string path = bundle.folder.file("manifest.json",
        "{\"identifier\": \"org.example.A\", \"version\": \"1.2\",\n\"hostInterface\": {\"minimum\": 1, \"maximum\": "
        "2},\n"
        "\"library\": \"A.so\", \"class\": \"A\", \"languages\": [\"en\", \"de\"]}");
    const auto answer = bundle.bundles.readManifest(bundle.folder.path());
    CHECK(answer.problem.empty());
    CHECK(answer.manifest.identifier == "org.example.A");
    CHECK(answer.manifest.languages == Paths { "en", "de" });
    bundle.folder.file("manifest.json", "{\n\"identifier\": 3}");
    CHECK(isAbout(bundle.bundles.readManifest(bundle.folder.path()).problem, path + ":2"));
}

TEST_CASE("a manifest that is missing, no plain file, or enormous is refused")
{
    const Bundle bundle;
    const std::string path = bundle.folder.path("manifest.json");
    CHECK(isAbout(bundle.bundles.readManifest(bundle.folder.path()).problem, path));
    bundle.folder.pipe("manifest.json");
    CHECK(isAbout(bundle.bundles.readManifest(bundle.folder.path()).problem, path));
    tests::removeItem(path);
    tests::writeFile(path, std::string((1 << 20) + 1, ' '));
    CHECK(isAbout(bundle.bundles.readManifest(bundle.folder.path()).problem, path));
}

TEST_CASE("a string table is a dictionary of texts and of nothing else")
{
    const Bundle bundle;
    const auto read = [&](const std::string& content) {
        bundle.folder.file("resources/de.strings.plist", "<plist version=\"1.0\">" + content + "</plist>");
        return bundle.bundles.readStringTable(bundle.folder.path(), "de");
    };
    const std::string path = bundle.folder.path("resources/de.strings.plist");
    const auto good = read("<dict><key>Events</key><string>Ereignisse</string></dict>");
    CHECK(good.problem.empty());
    CHECK(*good.table.valueForKey("Events").text() == "Ereignisse");
    for (const char* content :
        { "<dict><key>a</key><integer>1</integer></dict>", "<array/>", "<string>x</string>", "" }) {
        const auto bad = read(content);
        CAPTURE(content);
        CHECK(isAbout(bad.problem, path));
        CHECK(bad.table.isNull());
    }
    for (const char* language : { "fr", "", "../resources/de", "a/b" })
        CHECK(!bundle.bundles.readStringTable(bundle.folder.path(), language).problem.empty());
}

TEST_CASE("a picture is told by its file and its size")
{
    const Bundle bundle;
    const std::string path = bundle.folder.file("resources/Icon.svg", "<svg width='16' height='8'/>");
    const auto picture = bundle.bundles.imageResource(bundle.folder.path(), "Icon");
    REQUIRE(picture);
    CHECK(picture->file == path);
    CHECK(picture->size == platform::Size { 16, 8 });
    for (const char* name : { "Other", "", "../resources/Icon" })
        CHECK(!bundle.bundles.imageResource(bundle.folder.path(), name));
}

TEST_CASE("a library is loaded and its symbol found")
{
    Bundle bundle;
    const std::string path = bundle.folder.file("A.so", bytesOfSharedLibrary());
    const auto answer = bundle.bundles.loadLibrary(path, "_ZTVSt9exception");
    CHECK(answer.problem == "");
    CHECK(answer.entryPoint);
    const auto missing = bundle.bundles.loadLibrary(path, "noSuchSymbol");
    CHECK(!missing.entryPoint);
    CHECK(isAbout(missing.problem, path));
}

TEST_CASE("a library that is cut short anywhere is refused")
{
    Bundle bundle;
    const std::string whole = bytesOfSharedLibrary();
    for (const std::size_t length : { std::size_t { 0 }, std::size_t { 3 }, std::size_t { 17 }, std::size_t { 63 },
             std::size_t { 64 }, std::size_t { 200 }, std::size_t { 4096 }, whole.size() / 4, whole.size() / 2 }) {
        const std::string path = bundle.folder.file(std::to_string(length) + ".so", whole.substr(0, length));
        const auto answer = bundle.bundles.loadLibrary(path, "_ZTVSt9exception");
        CAPTURE(length);
        CHECK(!answer.entryPoint);
        CHECK(isAbout(answer.problem, path));
    }
}

TEST_CASE("what is no library for this machine is refused")
{
    Bundle bundle;
    std::string otherMachine = bytesOfSharedLibrary();
    otherMachine[18] = '\x7e';
    std::string otherWordSize = bytesOfSharedLibrary();
    otherWordSize[4] = '\x07';
    std::string noLibrary = bytesOfSharedLibrary();
    noLibrary[16] = '\x01';
    std::string lyingTable = bytesOfSharedLibrary();
    lyingTable.replace(32, 8, std::string(8, '\xff'));
    const std::string text = "#!/bin/sh\nexit 1\n";
    for (const std::string& bytes : { otherMachine, otherWordSize, noLibrary, lyingTable, text }) {
        const std::string path = bundle.folder.file("A.so", bytes);
        const auto answer = bundle.bundles.loadLibrary(path, "x");
        CHECK(!answer.entryPoint);
        CHECK(isAbout(answer.problem, path));
    }
    for (const std::string& path :
        { bundle.folder.path("missing.so"), bundle.folder.pipe("pipe.so"), bundle.folder.path() })
        CHECK(isAbout(bundle.bundles.loadLibrary(path, "x").problem, path));
}

TEST_CASE("bundles are installed beside the framework's library, else below the program's lib")
{
    const Paths none;
    CHECK(platform::possiblePluginsFolders("/opt/x/bin/ombrix", none).front() == "/opt/x/lib/ombrix/plugins");
    const Paths libraries { "/usr/lib/libc.so.6", "/opt/y/lib/libombrix.so.1" };
    CHECK(platform::possiblePluginsFolders("/opt/x/bin/ombrix", libraries).front() == "/opt/y/lib/ombrix/plugins");
    CHECK(platform::possiblePluginsFolders("/bin/ombrix", none).front() == "/lib/ombrix/plugins");
    CHECK(platform::possiblePluginsFolders("", none).front() == "/usr/lib/ombrix/plugins");
    const Bundle bundle;
    const std::string folder = bundle.bundles.installedPluginsFolder();
    CHECK(folder.front() == '/');
    CHECK(folder.find("ombrix/plugins") != std::string::npos);
}

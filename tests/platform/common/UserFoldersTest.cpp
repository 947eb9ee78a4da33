#include "platform/common/UserFolders.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

using namespace tests;

namespace {

class FilesWithHome : public platform::LinuxFileSystem {
public:
    std::optional<std::string> homeFolder() const override { return "/home/ann"; }
};

std::optional<std::string> videosIn(std::string_view text)
{
    const TemporaryFolder folder;
    folder.file("user-dirs.dirs", text);
    return platform::userFolder(FilesWithHome(), folder.path(), "XDG_VIDEOS_DIR");
}

} // namespace

TEST_CASE("the folder for videos is read from the desktop's list of folders")
{
    CHECK(videosIn("XDG_VIDEOS_DIR=\"$HOME/Videos\"\n") == "/home/ann/Videos");
    CHECK(videosIn("# a list\nXDG_MUSIC_DIR=\"$HOME/M\"\n  XDG_VIDEOS_DIR=\"/big/Films/\"") == "/big/Films");
    CHECK(videosIn("XDG_VIDEOS_DIR=\"$HOME/A \\\"B\\\" \\\\ C\"\n") == "/home/ann/A \"B\" \\ C");
    CHECK(videosIn("XDG_VIDEOS_DIR=\"/a\"\nXDG_VIDEOS_DIR=\"/b\"\n") == "/b");
}

TEST_CASE("the home folder, a relative folder and a damaged line stand for no folder of videos")
{
    CHECK_FALSE(videosIn("XDG_VIDEOS_DIR=\"$HOME/\"\n"));
    CHECK_FALSE(videosIn("XDG_VIDEOS_DIR=\"Videos\"\n"));
    CHECK_FALSE(videosIn("XDG_VIDEOS_DIR=\"$HOME/Videos\n"));
    CHECK_FALSE(videosIn("XDG_VIDEOS_DIR=$HOME/Videos\n"));
    CHECK_FALSE(videosIn("XDG_VIDEOS_DIRECTORY=\"/a\"\n"));
    CHECK_FALSE(videosIn(""));
    CHECK_FALSE(platform::userFolder(FilesWithHome(), "/nowhere", "XDG_VIDEOS_DIR"));
}

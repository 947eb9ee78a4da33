#include "apps/ombrix/Checkup.h"

#include <doctest/doctest.h>

#include <algorithm>

using namespace ombrix;
using platform::FileProblem;
using platform::FollowingMeans;

namespace {

FolderState folderAt(const std::string& path, FileProblem problem = FileProblem::none)
{
    FolderState state;
    state.path = path;
    state.realPath = path;
    state.problem = problem;
    state.fileSystem = "ext4";
    state.isFit = true;
    state.means = FollowingMeans::reports;
    state.folders = 10;
    return state;
}

FolderState silentFolder(const std::string& path)
{
    FolderState state;
    state.path = path;
    state.isSilent = true;
    return state;
}

/// A machine with which nothing is wrong.
CheckupFacts soundFacts()
{
    CheckupFacts facts;
    facts.volumesAnswered = facts.sourceAnswered = facts.editorAnswered = facts.canLoad = true;
    facts.home = "/home/ann";
    facts.editorPath = "/opt/montaro";
    facts.volumes = { folderAt("/") };
    facts.projects = { folderAt("/home/ann/Movies/P"), folderAt("/P", FileProblem::missing) };
    facts.events = { folderAt("/home/ann/Movies/E"), folderAt("/E", FileProblem::missing) };
    facts.preferencesAsked = 2;
    facts.limits = platform::WatchingLimits { { 5, 1000, "more watches" }, { 1, 100, "more instances" } };
    return facts;
}

/// Those that are no "ok", as "severity subject: text [remedy]".
std::vector<std::string> told(const CheckupFacts& facts)
{
    std::vector<std::string> lines;
    for (const Finding& finding : findingsOf(facts)) {
        if (finding.severity != Severity::ok)
            lines.push_back(std::string(textOfSeverity(finding.severity)) + " " + finding.subject + ": " + finding.text
                + (finding.remedy.empty() ? "" : " [" + finding.remedy + "]"));
    }
    return lines;
}

using Lines = std::vector<std::string>;
using Facts = std::vector<std::pair<std::string, std::string>>;

} // namespace

TEST_CASE("a sound machine has a line of each subject and no finding")
{
    CHECK(told(soundFacts()).empty());
    std::vector<std::string> subjects;
    for (const Finding& finding : findingsOf(soundFacts()))
        subjects.push_back(finding.subject + ": " + finding.text);
    CHECK(subjects
        == Lines { "editor: /opt/montaro", "libraries: 2 search folders exist; 2 do not, which is normal",
            "watching: 20 folders to follow; 5 of 1,000 watches and 1 of 100 inotify instances are in use",
            "volumes: 1 volume, fit for libraries", "preferences: none is damaged" });
}

TEST_CASE("without an editor there is no tree, which is a failure")
{
    CheckupFacts facts = soundFacts();
    facts.canLoad = false;
    CHECK(told(facts)
        == Lines { "fail editor: nothing exists at /opt/montaro, where it is said to be, so its libraries are not "
                   "shown" });
    facts.editorPath.reset();
    CHECK(told(facts) == Lines { "fail editor: it is not installed, so its libraries are not shown" });
    facts.editorAnswered = false;
    CHECK(told(facts) == Lines { "fail editor: where the editor is, the disk that would tell does not answer" });
}

TEST_CASE("a search folder that may not be read is a failure, mended where it is forbidden")
{
    CheckupFacts facts = soundFacts();
    facts.projects[0] = folderAt("/home/ann/Movies/P", FileProblem::notPermitted);
    facts.projects[0].blockedAt = "/home/ann/Movies";
    facts.events[0] = folderAt("/home/ann/Movies/it's", FileProblem::notPermitted);
    facts.events[0].blockedAt = facts.events[0].path;
    facts.events[1] = folderAt("/E", FileProblem::notAFolder);
    CHECK(told(facts)
        == Lines { "fail libraries: /home/ann/Movies/P: permission denied (/home/ann/Movies) [chmod u+rx "
                   "/home/ann/Movies]",
            "fail libraries: /home/ann/Movies/it's: permission denied [chmod u+rx "
            "'/home/ann/Movies/it'\\''s']",
            "note libraries: /E is no folder, so nothing is searched there" });
}

TEST_CASE("a silent volume is named once, and a silent folder by itself where its volume is not known")
{
    CheckupFacts facts = soundFacts();
    facts.volumes.push_back(silentFolder("/mnt/stick"));
    facts.volumes.back().name = "Stick";
    facts.projects.push_back(silentFolder("/Volumes/Stick/P"));
    facts.events.push_back(silentFolder("/mnt/stick/E"));
    facts.events.push_back(silentFolder("/net/E"));
    CHECK(told(facts)
        == Lines { "fail libraries: /net/E does not answer within 2 seconds",
            "fail volumes: /mnt/stick does not answer within 2 seconds [sudo umount --lazy /mnt/stick]" });
}

TEST_CASE("a silent home folder and a silent system are failures of their own")
{
    CheckupFacts facts = soundFacts();
    facts.sourceAnswered = false;
    facts.projects.clear();
    facts.events.clear();
    facts.volumes.push_back(silentFolder("/home"));
    CHECK(told(facts)[0]
        == "fail libraries: which folders are searched cannot be told: /home/ann does not answer within 2 seconds "
           "[sudo umount --lazy /home]");
    facts.volumesAnswered = false;
    CHECK(told(facts).back() == "fail volumes: what is mounted cannot be told: the system does not answer");
}

TEST_CASE("folders that are one, or one in the other, are noted in each half")
{
    CheckupFacts facts = soundFacts();
    facts.events.push_back(folderAt("/Volumes/S/E"));
    facts.events.push_back(folderAt("/mnt/s/E"));
    facts.events[2].realPath = facts.events[3].realPath = "/real/E";
    facts.projects.push_back(folderAt("/home/ann/Movies/P/inner"));
    CHECK(told(facts)
        == Lines { "note libraries: /home/ann/Movies/P and /home/ann/Movies/P/inner lie one in the other, so some "
                   "content is shown twice",
            "note libraries: /Volumes/S/E and /mnt/s/E are one folder, whose content is shown twice" });
    CHECK(distinctSearchFolders(facts).size() == 3);
    CHECK(foldersToWatch(facts) == 30);
}

TEST_CASE("folders below a search folder that may not be read are warned of, each with the command that permits it")
{
    CheckupFacts facts = soundFacts();
    facts.projects[0].closed = { "/home/ann/Movies/P/a", "/home/ann/Movies/P/b c" };
    facts.projects[0].hasMoreClosed = true;
    CHECK(told(facts)
        == Lines { "warn libraries: /home/ann/Movies/P/a: permission denied, so nothing below it is shown "
                   "[chmod u+rx /home/ann/Movies/P/a]",
            "warn libraries: /home/ann/Movies/P/b c: permission denied, so nothing below it is shown "
            "[chmod u+rx '/home/ann/Movies/P/b c']",
            "warn libraries: /home/ann/Movies/P holds more folders that may not be read" });
}

TEST_CASE("volumes of one name, and folders that are searched twice, are told")
{
    CheckupFacts facts = soundFacts();
    facts.volumes.push_back(folderAt("/media/ann/a"));
    facts.volumes.push_back(folderAt("/media/ann/b"));
    facts.volumes[1].name = facts.volumes[2].name = "Stick";
    facts.projects.push_back(folderAt("/Volumes/Stick/P"));
    facts.projects[2].timesSearched = 2;
    CHECK(told(facts)
        == Lines { "note libraries: /Volumes/Stick/P is searched 2 times, and what it holds is shown as often",
            "warn volumes: /media/ann/a and /media/ann/b are both called \"Stick\", so only one of them is searched, "
            "and twice: rename the other" });
}

TEST_CASE("a machine on which nothing is mounted says so")
{
    CheckupFacts facts = soundFacts();
    facts.volumes.clear();
    const std::vector<Finding> findings = findingsOf(facts);
    CHECK(std::count(findings.begin(), findings.end(), Finding { Severity::ok, "volumes", "none is mounted" }) == 1);
}

TEST_CASE("libraries among the desktop's videos are brought home by a link, or moved")
{
    CheckupFacts facts = soundFacts();
    StrayLibrary library;
    library.videos = "/home/ann/Videos";
    library.stray = folderAt("/home/ann/Videos/P");
    library.sought = folderAt("/home/ann/Movies/P", FileProblem::missing);
    library.movies = folderAt("/home/ann/Movies", FileProblem::missing);
    const std::string text = "warn libraries: /home/ann/Videos/P is not searched; /home/ann/Movies/P is ";
    const auto remedied = [&] {
        facts.strays = { library };
        return told(facts);
    };
    CHECK(remedied() == Lines { text + "[ln -s /home/ann/Videos /home/ann/Movies]" });
    library.movies.problem = FileProblem::none;
    CHECK(remedied() == Lines { text + "[mv -n /home/ann/Videos/P /home/ann/Movies/P]" });
    library.sought.problem = FileProblem::none;
    CHECK(remedied() == Lines { text + "[mv -n /home/ann/Videos/P/* /home/ann/Movies/P/]" });
}

TEST_CASE("limits of the kernel that are used up are warned of with the command that raises them")
{
    CheckupFacts facts = soundFacts();
    facts.limits->watches.inUse = 985;
    CHECK(told(facts)
        == Lines { "warn watching: 5 of 20 folders would be looked at every 10 s: 985 of 1,000 watches that the kernel "
                   "allows are in use [more watches]" });
    facts.limits->instances.inUse = 100;
    CHECK(told(facts)
        == Lines { "warn watching: 20 folders would be looked at every 10 s: all inotify instances that the kernel "
                   "allows (100) are in use [more instances]" });
    facts.limits.reset();
    CHECK(told(facts) == Lines { "note watching: what the kernel allows to be watched cannot be told" });
}

TEST_CASE("folders that are looked at, or not followed at all, and disks that are not fit are noted")
{
    CheckupFacts facts = soundFacts();
    facts.projects[0].means = FollowingMeans::looking;
    facts.projects[0].fileSystem = "nfs";
    facts.events[0].means = FollowingMeans::nothing;
    facts.volumes.push_back(folderAt("/mnt/stick"));
    facts.volumes.back().isFit = false;
    facts.volumes.back().fileSystem = "msdos";
    facts.volumes.push_back(folderAt("/mnt/gone", FileProblem::missing));
    CHECK(told(facts)
        == Lines { "note watching: /home/ann/Movies/P is looked at every 10 s: the kernel does not report what others "
                   "change on a file system of type nfs",
            "note watching: /home/ann/Movies/E is not followed",
            "note volumes: /mnt/stick is of type msdos: shown, but the editor keeps no libraries there",
            "note volumes: /mnt/gone: it does not exist" });
}

TEST_CASE("preferences that cannot be read are warned of, and set aside or permitted by the remedy")
{
    CheckupFacts facts = soundFacts();
    facts.preferences = { { "a.b", false, "/p/a.b.plist: line 1: bad", "/p/a.b.plist", false },
        { "c", false, "/p/c.plist: cannot be read: permission denied", "/p/c.plist", true }, { "d", true } };
    CHECK(told(facts)
        == Lines { "warn preferences: /p/a.b.plist: line 1: bad; the defaults are used [mv -n /p/a.b.plist "
                   "/p/a.b.plist.damaged]",
            "warn preferences: /p/c.plist: cannot be read: permission denied; the defaults are used [chmod u+r "
            "/p/c.plist]",
            "fail preferences: the disk that holds those of d does not answer" });
}

TEST_CASE("disks are asked in rounds, and one that is silent keeps no other from being asked")
{
    std::vector<std::size_t> rounds;
    const AskDisks ask = [&](const std::vector<std::vector<std::string>>& questions) {
        rounds.push_back(questions.size());
        std::vector<DiskAnswer> answers;
        for (const std::vector<std::string>& words : questions) {
            const auto question = questionOfWords(words);
            REQUIRE(question);
            DiskAnswer answer(std::in_place);
            if (question->first == DiskQuestion::volumes)
                answer = Facts { { "volume", "/" }, { "name", "Boot" }, { "volume", "/hung" }, { "name", "Hung" },
                    { "home", "/home/ann" } };
            else if (question->first == DiskQuestion::source)
                answer = Facts { { "project", "/home/ann/Movies/P" }, { "project", "/hung/P" },
                    { "project", "/hung/P" }, { "domain", "a.b" } };
            else if (question->first == DiskQuestion::folder && question->second.starts_with("/hung"))
                answer = std::nullopt;
            else if (question->first == DiskQuestion::folder)
                answer = answerOfState(folderAt(question->second));
            else if (question->first == DiskQuestion::count)
                answer = Facts { { "folders", "7" }, { "hasMore", "" }, { "closed", "/home/ann/Movies/P/a" },
                    { "hasMoreClosed", "" } };
            else if (question->first == DiskQuestion::videos)
                answer = Facts { { "folder", "/home/ann/Videos" } };
            answers.push_back(answer ? answerOfBytes(bytesOfAnswer(*answer)) : answer);
        }
        return answers;
    };
    const CheckupFacts facts = askForFacts(ask);
    CHECK(rounds == std::vector<std::size_t> { 4, 8, 1 });
    CHECK(facts.home == "/home/ann");
    CHECK(facts.volumes[1].name == "Hung");
    CHECK(facts.volumes[1].isSilent);
    CHECK(facts.projects[1].isSilent);
    CHECK(facts.projects[0].folders == 7);
    CHECK(facts.projects[0].hasMore);
    CHECK(facts.projects[0].closed == Lines { "/home/ann/Movies/P/a" });
    CHECK(facts.projects[0].hasMoreClosed);
    CHECK(facts.projects[0].timesSearched == 1);
    CHECK(facts.projects[1].timesSearched == 2);
    REQUIRE(facts.strays.size() == 1);
    CHECK(facts.strays[0].stray.path == "/home/ann/Videos/P");
    CHECK(facts.preferences.empty());
    CHECK(facts.preferencesAsked == 1);
}

TEST_CASE("an answer that was cut short is none")
{
    const std::string bytes = bytesOfAnswer(Facts { { "folder", "/a\nb" }, { "folder", "" } });
    const DiskAnswer whole = answerOfBytes(bytes);
    REQUIRE(whole);
    CHECK(textsIn(whole, "folder") == std::vector<std::string> { "/a\nb", "" });
    for (std::size_t length = 0; length < bytes.size(); ++length)
        CHECK_FALSE(answerOfBytes(std::string_view(bytes).substr(0, length)));
}

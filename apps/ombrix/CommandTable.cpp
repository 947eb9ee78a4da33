#include "apps/ombrix/CommandTable.h"

#include "apps/ombrix/Commands.h"

namespace ombrix {
namespace {

    constexpr std::size_t anyNumber = static_cast<std::size_t>(-1);

    constexpr OptionInfo json { "--json", "", "", "print one JSON document, every key always there" };
    constexpr OptionInfo zero { "-0", "", "", "end every path with a zero byte instead of a line feed", false, false,
        "--json" };
    constexpr OptionInfo group { "--group", "", "ID", "the group; the first with that ID counts", true };

    constexpr OptionInfo global[] {
        { "--machine", "", "FILE", "use the machine that FILE describes, not this one" },
        { "--source", "", "IDENTIFIER", "the plug-in meant; not with plugins, query or help" },
        { "--color", "", "WHEN", "auto, always or never", false, true },
        { "--hyperlink", "", "WHEN", "names as links to their folders: auto, always, never", false, true },
        { "--help", "-h", "", "this text, or that of a command" },
        { "--version", "", "", "the versions of the program and of its host interface" },
    };

    constexpr OptionInfo treeOptions[] {
        { "--all", "", "", "everything, also where it is longer than the terminal" },
        { "--skipped", "", "", "list below the tree, or beside JSON, what was left out" },
        json,
    };
    constexpr Example treeExamples[] {
        { "ombrix tree Events", "one part of the tree, unfolded" },
        { "ombrix tree --json | jq '.childGroups[].name'", "the names at the top" },
    };

    constexpr OptionInfo findOptions[] {
        { "--kind", "", "KIND", "only these: group or object" },
        { "--newest", "", "", "of equally good hits the newest first" },
        { "--limit", "", "N", "at most the N best hits" },
        zero,
        json,
    };
    constexpr Example findExamples[] {
        { "ombrix find \"sun beach\"", "\"Beach sunset\", and where it lies" },
        { "ombrix find sunset --kind object -0 | xargs -0 ls -l", "safe for every name" },
    };

    constexpr OptionInfo groupsOptions[] { json };
    constexpr Example groupsExamples[] {
        { "ombrix groups", "a table" },
        { "ombrix groups --json | jq -r '.[].ID'", "the ID of every group" },
    };

    constexpr OptionInfo objectsOptions[] { group, zero, json };
    constexpr Example objectsExamples[] {
        { "ombrix objects --group Events", "the clips of all events" },
        { "ombrix objects --group Montaro -0 | xargs -0 ls -l", "safe for every name" },
    };

    constexpr OptionInfo menuOptions[] {
        { "--object", "", "PATH", "the movie; the first with that path counts", false, false, "--group" },
        { "--group", "", "ID", "the group; the first with that ID counts" },
        json,
    };
    constexpr Example menuExamples[] {
        { "ombrix menu --group Montaro", "what the source offers as a whole" },
        { "ombrix menu --object final.mov --json", "the same for a program" },
    };
    constexpr Example openExamples[] {
        { "ombrix open", "the editor comes up" },
        { "ombrix open final.mov", "the same: the editor itself is opened" },
    };
    constexpr Example revealExamples[] {
        { "ombrix reveal final.mov", "the file manager shows where it lies" },
        { "ombrix find -0 --limit 1 sunset | xargs -0 ombrix reveal", "the best hit" },
    };
    constexpr OptionInfo exportOptions[] {
        { "--object", "", "PATH", "a movie; the first with that path counts", false, true },
        { "--in", "", "ID", "of those set on the group ID itself", false, true },
        { "--group", "", "ID", "a group; the first with that ID counts", false, true },
        { "--clipboard", "", "", "offer it and the files on the clipboard too" },
    };
    constexpr Example exportExamples[] {
        { "ombrix export --group ~/\"Movies/Montaro Projects/Trip\"", "one project, all that was rendered" },
        { "ombrix export --clipboard --object a.mov --in Montaro --object b.mov",
            "two movies, one of them of the root, to paste elsewhere" },
    };

    constexpr OptionInfo pathsOptions[] { zero, json };
    constexpr Example pathsExamples[] {
        { "ombrix paths", "which folders are searched, and which of them exist" },
        { "ombrix paths --json | jq -r '.events[]'", "those for events" },
    };

    constexpr OptionInfo infoOptions[] { json };
    constexpr Example infoExamples[] {
        { "ombrix info", "is the editor found, and where" },
        { "ombrix info --json | jq .canLoadData", "whether a tree can be loaded" },
    };

    constexpr OptionInfo watchOptions[] {
        { "--json", "", "", "print the tree each time, a JSON document a line" },
        { "--changes", "", "", "print the tree, then a JSON document a publication" },
        { "--for", "", "SECONDS", "end when so long has passed since the tree was printed" },
    };
    constexpr Example watchExamples[] {
        { "ombrix watch", "a line whenever something comes or goes" },
        { "ombrix watch --changes | jq -c '.added[]?.path'", "what comes, for a program" },
    };

    constexpr OptionInfo explainOptions[] {
        { "-0", "", "", "read paths ended by zero bytes from standard input" },
        { "--json", "", "", "print one JSON document a path, one a line" },
    };
    constexpr Example explainExamples[] {
        { "ombrix explain final.MOV", "why a file is, or is not, listed" },
        { "find ~/Movies -print0 | ombrix explain -0 - --json", "every file there is" },
    };

    constexpr OptionInfo messageOptions[] { group };
    constexpr Example messageExamples[] {
        { "ombrix message --group ID --source org.example.Source", "what another source says of one of its groups" },
        { "ombrix message --group \"$HOME/Movies/Montaro Projects/Trip\"", "why a project is" },
    };

    constexpr OptionInfo queryOptions[] {
        { "--live", "", "", "then +path and -path as files come and go", false, false, "--json" },
        zero,
        json,
    };
    constexpr Example queryExamples[] {
        { "ombrix query \"kMDItemFSName = '*trip*'cd\" ~/Movies", "names with \"trip\", or \"Tríp\"" },
        { "ombrix query 'kMDItemPixelWidth >= 3840' ~ -0 | xargs -0 ls -l", "wide movies" },
    };

    constexpr Example diskFormatExamples[] {
        { "ombrix disk-format /media/stick", "whether libraries may lie on a stick" },
        { "ombrix disk-format ~/Movies", "false for a folder that does not exist, too" },
    };

    constexpr OptionInfo verifyOptions[] {
        { "--for", "", "SECONDS", "compare after so long; else when interrupted" },
        json,
    };
    constexpr Example verifyExamples[] {
        { "ombrix verify --for 3600", "follow changes for an hour, then compare" },
        { "ombrix verify --for 0 --json | jq .equal", "whether two loads agree" },
    };

    constexpr OptionInfo doctorOptions[] { json };
    constexpr Example doctorExamples[] {
        { "ombrix doctor", "what is wrong, and the command that mends it" },
        { "ombrix doctor --json | jq -r '.findings[].remedy // empty'", "only those commands" },
    };

    constexpr OptionInfo pluginsOptions[] { json };
    constexpr Example pluginsExamples[] {
        { "ombrix plugins", "what was found, and what was refused and why" },
        { "OMBRIX_PLUGIN_PATH=build/plugins ombrix plugins", "with your own folder first" },
    };

    constexpr Example helpExamples[] {
        { "ombrix help tree", "what \"tree\" can do" },
        { "ombrix --help", "all commands" },
    };

    constexpr CommandInfo table[] {
        { "tree", Intent::look, "[ID|NAME]", 1, "show the media tree, or one part of it",
            "Loads once and prints the tree, or the first group that has this ID, else this\n"
            "name. On a terminal the whole tree is folded to its height; each folded place\n"
            "names the command that unfolds it.",
            treeOptions, true, treeExamples, runTree },
        { "find", Intent::look, "TEXT", 1, "find groups and movies by words of their names",
            "Loads once and prints what has every word of TEXT in its name, in any order,\n"
            "whatever the case and the accents. Whole names come first, then names in which\n"
            "words begin so. Shows the 20 best; with --json or -0 all.",
            findOptions, true, findExamples, runFind },
        { "groups", Intent::look, "", 0, "list all groups that hold media",
            "Loads once and prints the groups as a flat list, events first.", groupsOptions, true, groupsExamples,
            runGroups },
        { "objects", Intent::look, "", 0, "list the movies of one group",
            "Loads once and prints the path of every movie to be shown for the group, one a\n"
            "line, depth first.",
            objectsOptions, true, objectsExamples, runObjects },
        { "paths", Intent::look, "", 0, "list the folders that are searched",
            "Prints the folders for projects and those for events, in the order in which\n"
            "they are searched. Loads nothing.",
            pathsOptions, true, pathsExamples, runPaths },
        { "info", Intent::look, "", 0, "show the source, its editor and its preferences",
            "Prints what is known of the source without loading its tree.", infoOptions, true, infoExamples, runInfo },
        { "watch", Intent::follow, "", 0, "print the tree's changes as they happen",
            "Loads, then tells what comes, goes and changes, about 5 seconds after it did,\n"
            "and why, until it is interrupted. Every disk can be unmounted meanwhile.\n"
            "A document of --changes is {\"half\", \"added\", \"removed\", \"changed\", \"cause\"}.",
            watchOptions, true, watchExamples, runWatch },
        { "menu", Intent::act, "", 0, "show what is offered for a movie or a group",
            "Loads once and prints the context menu: its title, then an item a line with its\n"
            "action. Prints \"null\" where there is no such movie or group.",
            menuOptions, true, menuExamples, runMenu },
        { "open", Intent::act, "[PATH]", 1, "open the editor",
            "Opens what a movie's menu opens: the editor. Loads nothing, and waits 4 seconds\n"
            "at most until the desktop has taken over.",
            {}, true, openExamples, runOpen },
        { "reveal", Intent::act, "PATH", 1, "show a file in the file manager",
            "Shows any file or folder as a movie's menu does. Loads nothing, and waits 4\n"
            "seconds at most until the desktop has taken over.",
            {}, true, revealExamples, runReveal },
        { "export", Intent::act, "", 0, "print what copying gives the editor",
            "Loads once and prints the property list that copying or dragging the movies or\n"
            "groups would hand to the editor, as XML: the projects that they belong to, each\n"
            "with all that was rendered of it. Prints nothing where none is written.\n"
            "With --clipboard the files can be pasted in other programs as well, until\n"
            "something else is copied; waits 2 seconds at most for the desktop.",
            exportOptions, true, exportExamples, runExport },
        { "explain", Intent::ask, "PATH...", anyNumber, "say why files and folders are or are not in the tree",
            "Loads once and prints, for each path, every rule that it met on its way, the\n"
            "verdict, and what would make it appear. The path need not exist. With \"-0 -\" the\n"
            "paths come from standard input.",
            explainOptions, true, explainExamples, runExplain },
        { "message", Intent::ask, "", 0, "say what an empty group tells the user",
            "Loads once and prints the text that is shown for the group while it is empty;\n"
            "nothing when there is none.",
            messageOptions, true, messageExamples, runMessage },
        { "query", Intent::ask, "EXPRESSION SCOPE...", anyNumber, "find files by their attributes",
            "Prints every plain file at or below a SCOPE that EXPRESSION matches, hidden ones\n"
            "too; links below it are not followed. With --live goes on until interrupted.\n"
            "EXPRESSION is made of comparisons with\n"
            "&& || ! and parentheses. A comparison is an attribute, then = == != < > <= or\n"
            ">=, then a value.\n\n"
            "Texts       kMDItemFSName kMDItemPath kMDItemContentType, only = == !=\n"
            "            '...' or \"...\": * any characters, ? one, \\ before either for itself;\n"
            "            behind it c case aside, d accents aside, w as whole words\n"
            "Numbers     kMDItemFSSize kMDItemDurationSeconds kMDItemPixelWidth\n"
            "            kMDItemPixelHeight\n"
            "Dates       kMDItemFSCreationDate kMDItemFSContentChangeDate, with\n"
            "            $time.iso(\"2011-03-03T10:00:00Z\") or $time.iso(\"2011-03-03\")",
            queryOptions, false, queryExamples, runQuery },
        { "disk-format", Intent::ask, "PATH", 1, "say whether a disk is fit to hold libraries",
            "Prints \"true\" or \"false\", by the file system of the disk that PATH lies on.", {}, true,
            diskFormatExamples, runDiskFormat },
        { "verify", Intent::follow, "", 0, "check that the followed tree equals one loaded afresh",
            "Loads, follows changes for as long as told, waits until what was heard has been\n"
            "taken in, and compares the tree with that of a process of its own. Exit status\n"
            "0 when they are equal, else 1. What a followed tree cannot know is a note.",
            verifyOptions, true, verifyExamples, runVerify },
        { "doctor", Intent::ask, "", 0, "find what keeps the tree from being right",
            "Looks at the editor, the folders and disks that are searched, how they can be\n"
            "followed, and the preferences. Changes nothing. A disk gets 2 seconds to answer.\n"
            "Exit status 1 when a finding is a failure.",
            doctorOptions, true, doctorExamples, runDoctor },
        { "plugins", Intent::ask, "", 0, "list the plug-ins, and why one is refused",
            "Loads every bundle that is found to see whether it works.", pluginsOptions, false, pluginsExamples,
            runPlugins },
        { "help", Intent::ask, "[COMMAND]", 1, "explain a command", "The same as \"ombrix COMMAND --help\".", {}, false,
            helpExamples, runHelp },
    };

    /// Typed by the program alone.
    constexpr CommandInfo answer { "answer", Intent::ask, "QUESTION...", anyNumber, "", "", {}, true, {}, runAnswer };

} // namespace

std::span<const CommandInfo> commands()
{
    return table;
}

const CommandInfo* commandNamed(std::string_view name)
{
    for (const CommandInfo& command : table) {
        if (command.name == name)
            return &command;
    }
    return name == answer.name ? &answer : nullptr;
}

std::span<const OptionInfo> globalOptions()
{
    return global;
}

} // namespace ombrix

"""Fills folders with projects and events of every shape, hostile ones included."""

import os

ODD_NAMES = [
    b"Trip", b"Trip.mtrproject", b"v1.2 final", b"ends.", b"two..dots", b"stops...", b"\xc3\x89mile",
    b"\xe6\x97\xa5\xe6\x9c\xac",
    b"emoji \xf0\x9f\x98\x80", b"rtl \xe2\x80\xae abc", b"line\nfeed", b"tab\there", b"quote\"back\\slash",
    b"esc\x1b[31mred",
    b"sep\xe2\x80\xa8arator", b"x" * 200, b" lead and trail ", b"-dash", b"del\x7f", b"e\xcc\x81 combining", b"null",
    b"#1", b"a&b<c>",
    b"\xc2\x85", b"100%", b"Events", b"Montaro", b"2011", b"x.localized", b"CASE", b"case", b"stra\xc3\x9fe",
    b"\xef\xbb\xbfmark"]
BROKEN_NAMES = [b"\xff\xfe", b"caf\xe9", b"\xe2\x82", b"\xed\xa0\x80", b"\xc0\xaf", b"ok\xf4\x90\x80\x80",
                b"\xf0\x9f\x98x", b"\x80"]
PACKAGE_NAMES = [b"Some.app", b"Some.APP", b"x.bundle", b"y.framework", b"z.plugin", b"w.ObPlugin"]
NO_PACKAGE_NAMES = [b"app", b".app.", b"x.application", b"x.app.d", b"x.app."]
MOVIE_NAMES = [b"a.mov", b"b.m4v", b"c.mp4", b"d.3gp", b"clip.final.mov", b".hid.mov", b"..mov", b"a.mp4",
               b"\xe6\x98\xa0.mov", b"caf\xe9.mp4"]
NO_MOVIE_NAMES = [b"clip.MOV", b"notes.txt", b"mov", b".mov", b"x.mov.", b"x.avi", b"y.Mp4", b"z.mov~", b"x.mkv"]
MOMENTS = [-2100000000, -10**7, 0, 4 * 10**7, 1262304000, 1293840000, 1299146400, 1325376000, 1700000000]


class Store:
    """Things that links of the libraries lead to, outside of every library."""

    def __init__(self, machine):
        self.machine = machine
        self.count = 0
        self.dated = set()

    def path(self, name):
        self.count += 1
        return os.path.join(self.machine.make_folder(b"store", b"%d" % self.count), name)

    def project(self):
        path = self.path(b"Stored.project")
        os.mkdir(path)
        ProjectLibrary(self.machine, self.machine.random).fill_project(path)
        return path

    def folder(self):
        path = self.path(b"stored folder")
        os.mkdir(path)
        return path

    def movie(self):
        path = self.path(b"stored.mov")
        self.machine.write_movie(path)
        return path


class Filler:
    def __init__(self, machine, random):
        self.machine = machine
        self.random = random
        self.store = machine.store

    def chance(self, probability):
        return self.random.random() < probability

    def free_path(self, folder, names=None):
        """A path in the folder that nothing stands at."""
        if names is None:
            names = BROKEN_NAMES if self.chance(0.08) else ODD_NAMES
        name = self.random.choice(names)
        path, number = os.path.join(folder, name), 1
        while os.path.lexists(path):
            number += 1
            path = os.path.join(folder, b"%d %s" % (number, name))
        return path

    def link_to(self, target, path):
        """A link by its full path, by a relative one, or by the name of the volume of everything."""
        boot = [each for each in self.machine.local_volumes if each["path"] == "/"
                and each.get("displayName") == "Boot"]
        form = self.random.choice(["full", "relative", "volume" if boot and "/Volumes/Boot" not in self.machine.links
                                   else "full"])
        if form == "relative":
            target = os.path.relpath(target, os.path.realpath(os.path.dirname(path)))
        elif form == "volume":
            target = b"/Volumes/Boot" + target
        os.symlink(target, path)

    def touch(self, path, content=b""):
        with open(path, "wb") as stream:
            stream.write(content)

    def mark(self, folder, marker):
        """Makes the folder a project or an event; sometimes with a marker that only looks like one."""
        path = os.path.join(folder, marker)
        form = self.random.choice(["file"] * 8 + ["folder", "link", "links", "pipe", "dangling", "circle",
                                                  "wrong case"])
        if form == "file":
            self.touch(path)
        elif form == "folder":
            os.mkdir(path)
        elif form == "link":
            self.link_to(self.store.folder(), path)
        elif form == "links":
            between = self.store.path(b"between")
            os.symlink(self.store.folder(), between)
            self.link_to(between, path)
        elif form == "pipe":
            os.mkfifo(path)
        elif form == "dangling":
            os.symlink(b"gone", path)
        elif form == "circle":
            os.symlink(marker, path)
        else:
            self.touch(os.path.join(folder, marker.lower()))

    def hide_some(self, folder):
        """A list of names to hide, which may be a link, a folder, or lack its last line feed."""
        names = [name for name in os.listdir(folder) if self.chance(0.3)]
        lines = b"\n".join(names + [b"not here", b"CASE ", b"trip"])
        if self.chance(0.5):
            lines += b"\n"
        if self.chance(0.15):
            lines = lines.replace(b"\n", b"\r\n")
        path = os.path.join(folder, b".hidden")
        form = self.random.choice(["file", "file", "file", "link", "folder", "pipe", "dangling"])
        if form == "file":
            self.touch(path, lines)
        elif form == "link":
            target = self.store.path(b"list")
            self.touch(target, lines)
            self.link_to(target, path)
        elif form == "folder":
            os.mkdir(path)
        elif form == "pipe":
            os.mkfifo(path)
        else:
            os.symlink(b"gone", path)


class ProjectLibrary(Filler):
    MARKER = b"CurrentVersion.mtrproject"

    def fill(self, folder, depth):
        kinds = (["project"] * 8 + ["folder"] * 4 + ["localized"] * 2
                 + ["empty", "package", "package project", "no package", "hidden project", "file", "link to project",
                    "link to folder", "dangling", "circle", "parent", "locked", "file marker", "chain"])
        for _ in range(self.random.choice([0, 1, 2, 3, 4, 6, 9] if depth < 3 else [0, 1, 2])):
            self.add(self.random.choice(kinds), folder, depth)
        if self.chance(0.2):
            self.hide_some(folder)

    def add(self, kind, folder, depth):
        path = self.free_path(folder)
        if kind == "project":
            os.mkdir(path)
            self.fill_project(path)
        elif kind == "folder":
            os.mkdir(path)
            self.fill(path, depth + 1)
        elif kind == "empty":
            os.mkdir(path)
        elif kind in ("package", "package project"):
            path = self.free_path(folder, PACKAGE_NAMES)
            os.mkdir(path)
            if kind == "package":
                self.fill(path, depth + 2)
            else:
                self.fill_project(path)
        elif kind == "no package":
            path = self.free_path(folder, NO_PACKAGE_NAMES)
            os.mkdir(path)
            self.fill(path, depth + 2)
        elif kind == "hidden project":
            path = self.free_path(folder, [b".hid", b"..hid", b"..."])
            os.mkdir(path)
            self.fill_project(path)
        elif kind == "file":
            self.touch(path, b"text")
        elif kind == "link to project":
            self.link_to(self.store.project(), path)
        elif kind == "link to folder":
            target = self.store.folder()
            self.fill(target, depth + 2)
            self.link_to(target, path)
        elif kind == "dangling":
            os.symlink(b"gone", path)
        elif kind == "circle":
            os.symlink(os.path.basename(path), path)
        elif kind == "parent":
            os.symlink(b"..", path)
        elif kind in ("locked", "localized"):
            self.add_locked(kind, folder, depth)
        elif kind == "file marker":
            self.touch(self.free_path(folder, [b"currentversion.mtrproject", b"CurrentVersion.mtrevent"]))
        elif kind == "chain":
            for _ in range(self.random.choice([5, 40])):
                path = os.path.join(path, b"d")
            os.makedirs(path)
            self.fill_project(path)

    def add_locked(self, kind, folder, depth):
        """A folder that only root may list, and beside it the one that stands in for it."""
        path = self.free_path(folder, [b"Area.localized", b"Area.localized.localized", b"Area.Localized"]
                              if kind == "localized" else None)
        os.mkdir(path)
        self.fill(path, depth + 2)
        if kind == "localized" and self.chance(0.7) and not os.path.lexists(path.rpartition(b".")[0]):
            os.mkdir(path.rpartition(b".")[0])
            self.fill(path.rpartition(b".")[0], depth + 2)
        os.chmod(path, self.random.choice([0, 0o300, 0o311]))

    def fill_project(self, path):
        self.mark(path, self.MARKER)
        if self.chance(0.1):
            nested = os.path.join(path, b"Nested")
            os.mkdir(nested)
            self.touch(os.path.join(nested, self.MARKER))
        shared = os.path.join(path, b"Shared Items")
        form = self.random.choice(["folder"] * 8 + ["absent", "file", "empty", "link", "dangling"])
        if form == "folder":
            os.mkdir(shared)
            self.fill_movies(shared)
        elif form == "file":
            self.touch(shared)
        elif form == "empty":
            os.mkdir(shared)
        elif form == "link":
            target = self.store.folder()
            self.fill_movies(target)
            self.link_to(target, shared)
        elif form == "dangling":
            os.symlink(b"gone", shared)

    def fill_movies(self, folder):
        kinds = ["movie"] * 10 + ["other", "other", "folder", "link", "link", "dangling", "circle", "pipe", "locked"]
        for _ in range(self.random.choice([0, 1, 1, 2, 3, 5, 8])):
            kind = self.random.choice(kinds)
            path = self.free_path(folder, NO_MOVIE_NAMES if kind == "other" else MOVIE_NAMES)
            if kind in ("movie", "other", "locked"):
                self.machine.write_movie(path)
                if kind == "locked":
                    os.chmod(path, 0)
            elif kind == "folder":
                os.mkdir(path)
                self.touch(os.path.join(path, b"inner.mov"))
            elif kind == "link":
                self.link_to(self.store.movie(), path)
            elif kind == "dangling":
                os.symlink(self.random.choice([b"gone.mov", b"/nowhere/gone.mov", b"../gone/x.mov"]), path)
            elif kind == "circle":
                os.symlink(os.path.basename(path), path)
            elif kind == "pipe":
                os.mkfifo(path)


class EventLibrary(Filler):
    MARKER = b"CurrentVersion.mtrevent"

    def fill(self, folder, depth):
        kinds = (["event"] * 9 + ["undated", "alike"] * 2
                 + ["unmarked", "package", "hidden", "file", "link", "dangling", "locked"])
        for _ in range(self.random.choice([0, 1, 2, 4, 7, 12])):
            kind = self.random.choice(kinds)
            path = self.free_path(folder, PACKAGE_NAMES if kind == "package" else [b".hid"] if kind == "hidden"
                                  else None)
            if kind == "undated":
                os.makedirs(os.path.join(path, b"Original Media"))
                self.touch(os.path.join(path, self.MARKER))
                os.symlink(b"gone.mov", os.path.join(path, b"Original Media", b"x.mov"))
            elif kind in ("event", "unmarked", "package", "hidden", "locked"):
                os.mkdir(path)
                self.fill_event(path, kind != "unmarked")
                if kind == "locked":
                    os.chmod(path, self.random.choice([0, 0o300]))
            elif kind == "file":
                self.touch(path)
            elif kind == "link":
                target = self.store.folder()
                self.fill_event(target, True)
                self.link_to(target, path)
            elif kind == "dangling":
                os.symlink(b"gone", path)
            else:
                self.add_alike(folder)
        if self.chance(0.15):
            self.hide_some(folder)

    def add_alike(self, folder):
        """Events of the very same dates: only their names tell them apart."""
        moment = self.random.choice(MOMENTS) * 10**9
        for name in self.random.sample([b"beta", b"Alpha", b"ALPHA2", b"\xc3\xa9t\xc3\xa9", b"\xc3\x89T\xc3\x892",
                                        b"zeta", b"Stra\xc3\x9fe", b"strasse"], 4):
            path = self.free_path(folder, [name])
            os.makedirs(os.path.join(path, b"Original Media"))
            self.touch(os.path.join(path, self.MARKER))
            self.clip(os.path.join(path, b"Original Media", b"a.mov"), moment)

    def clip(self, path, moment=None):
        self.touch(path, b"clip")
        if moment is None:
            moment = self.own_moment(self.random.choice(MOMENTS))
        os.utime(path, ns=(moment, moment))
        self.store.dated.add(path)

    def own_moment(self, seconds):
        """Near the given one, in nanoseconds, and unlike that of any other clip."""
        self.store.count += 1
        return (seconds + self.random.choice([0, 0, 86400, -1, 43200, -43200])) * 10**9 + self.store.count

    def fill_event(self, path, marked):
        if marked:
            self.mark(path, self.MARKER)
        clips = os.path.join(path, b"Original Media")
        form = self.random.choice(["folder"] * 10 + ["absent", "file", "empty", "link"])
        if form == "folder":
            os.mkdir(clips)
            self.fill_clips(clips)
        elif form == "file":
            self.touch(clips)
        elif form == "empty":
            os.mkdir(clips)
        elif form == "link":
            target = self.store.folder()
            self.fill_clips(target)
            self.link_to(target, clips)

    def fill_clips(self, folder):
        kinds = ["clip"] * 8 + ["fresh", "future", "hidden", "folder", "link", "link to folder", "dangling", "circle",
                                "pipe"]
        for _ in range(self.random.choice([1, 1, 1, 2, 3, 5, 8])):
            kind = self.random.choice(kinds)
            path = self.free_path(folder, MOVIE_NAMES[:5] + NO_MOVIE_NAMES[:2] + ODD_NAMES[:20])
            if kind == "clip":
                self.clip(path)
            elif kind in ("fresh", "future"):
                self.clip(path, self.own_moment(2100000000)) if kind == "future" else self.touch(path)
            elif kind == "hidden":
                self.clip(self.free_path(folder, [b".clip.mov"]))
            elif kind == "folder":
                os.mkdir(path)
            elif kind == "link":
                target = self.store.path(b"linked clip.mov")
                self.clip(target)
                self.link_to(target, path)
            elif kind == "link to folder":
                self.link_to(self.store.folder(), path)
            elif kind == "dangling":
                os.symlink(self.random.choice([b"gone.mov", b"/nowhere/.gone.mov", b"../gone/x.mov"]), path)
            elif kind == "circle":
                os.symlink(os.path.basename(path), path)
            elif kind == "pipe":
                os.mkfifo(path)
        if self.chance(0.1):
            self.hide_some(folder)

"""Makes a described machine out of a seed: folders, movies, preferences and the description itself."""

import datetime
import json
import os
import plistlib
import struct

import movie
from library import EventLibrary, ProjectLibrary, Store


def is_utf8(path):
    try:
        return bool(path.decode("utf-8"))
    except UnicodeDecodeError:
        return False


class Machine:
    """`file` is the description; `movies` maps real paths to (resolution, duration)."""

    def __init__(self, random, folder):
        self.random = random
        self.folder = os.fsencode(folder)
        self.file = os.path.join(folder, random.choice(["machine.json", "my machine.json"]))
        self.movies = {}
        self.links = {}
        self.local_volumes = []
        self.removable_media = []
        self.libraries = 0
        self.store = Store(self)
        self.make_volumes()
        self.make_boot()
        self.make_home()
        if random.random() < 0.5:
            self.add_links_at_entries()
        self.set_dates()
        self.describe()

    def chance(self, probability):
        return self.random.random() < probability

    def make_folder(self, *parts):
        path = os.path.join(self.folder, *parts)
        os.makedirs(path, exist_ok=True)
        return path

    def spelled(self, path):
        """A path of the description: absolute, or relative to its folder."""
        if path.startswith(self.folder + b"/") and self.chance(0.4):
            return os.fsdecode(path[len(self.folder) + 1:])
        return os.fsdecode(path)

    def add_link(self, key, value):
        self.links[self.spelled(key)] = self.spelled(value)

    def make_libraries(self, folder):
        """Libraries of both kinds at the top of a folder, each of them present, absent or something else."""
        for name, kind in ((b"Montaro Projects", ProjectLibrary), (b"Montaro Events", EventLibrary)):
            place = os.path.join(folder, name)
            form = self.random.choice(["full"] * 7 + ["absent", "file", "empty", "link", "dangling"])
            self.libraries += 1
            if form == "full":
                os.makedirs(place, exist_ok=True)
                kind(self, self.random).fill(place, 0)
            elif form == "file":
                with open(place, "wb"):
                    pass
            elif form == "empty":
                os.makedirs(place, exist_ok=True)
            elif form == "link":
                target = self.make_folder(b"elsewhere", b"library %d" % self.libraries)
                kind(self, self.random).fill(target, 1)
                os.symlink(target, place)
            elif form == "dangling":
                os.symlink(b"nowhere at all", place)

    # Volumes.

    def make_volumes(self):
        names = ["Stick", "Data", "Ton & Bild", "Video 2", "Größe", "映像", "My.Disk.app", "a\u202eb"]
        self.random.shuffle(names)
        entries = []
        for number in range(self.random.choice([0, 1, 1, 2, 3, 4])):
            entries.append(self.make_volume(os.fsencode(names[number]), number))
        for path, probability in (("/", 0.6), ("/Network", 0.4), ("/Network/Servers", 0.3), ("/private/Network", 0.2)):
            if self.chance(probability):
                entry = {"path": path}
                if self.chance(0.5):
                    entry["displayName"] = {"/": "Boot"}.get(path, "Shared")
                entries.insert(self.random.randint(0, len(entries)), entry)
        for entry in entries:
            where = self.random.choice(["local", "local", "removable", "both"])
            copy = dict(entry)
            if self.chance(0.3):
                copy["fileSystem"] = self.random.choice(["ext4", "msdos", "fuse.sshfs", "fuseblk", "nfs4"])
            if where != "removable":
                self.local_volumes.append(copy)
            if where != "local":
                self.removable_media.insert(self.random.randint(0, len(self.removable_media)), dict(entry))
        if self.local_volumes and self.chance(0.1):
            self.local_volumes.append(dict(self.local_volumes[0]))

    def make_volume(self, name, number):
        """One volume's entry: mounted at a real folder, at a key, or nowhere."""
        real = self.make_folder(b"vol", b"disk%d" % number)
        form = self.random.choice(["real", "real", "key", "key", "numbered", "chain", "ghost", "other", "layered"])
        if form != "ghost":
            self.make_libraries(real)
        entry = {"path": os.fsdecode(b"/Volumes/" + name)}
        if form == "real":
            entry["path"] = self.spelled(real)
            if self.chance(0.8):
                entry["displayName"] = os.fsdecode(name)
            return entry
        if form == "key":
            self.add_link(b"/Volumes/" + name, real)
        elif form == "numbered":
            entry["path"] += " 1"
            self.add_link(b"/Volumes/" + name + b" 1", real)
        elif form == "chain":
            self.add_link(b"/Volumes/" + name, b"/media/chain/" + name)
            self.add_link(b"/media/chain", b"/media/other")
            self.add_link(b"/media/other/" + name, real)
        elif form == "layered":
            self.add_link(b"/Volumes/" + name, real)
            upper = self.make_folder(b"vol", b"upper%d" % number)
            for library in (b"Montaro Projects", b"Montaro Events"):
                self.add_link(b"/Volumes/" + name + b"/" + library, os.path.join(upper, library))
            self.make_libraries(upper)
        elif form == "other":
            self.add_link(b"/Volumes/" + name, self.make_folder(b"vol", b"preferred%d" % number))
            self.make_libraries(os.path.join(self.folder, b"vol", b"preferred%d" % number))
            entry["path"] = self.spelled(real)
        if form != "key" or self.chance(0.6):
            entry["displayName"] = os.fsdecode(name)
        return entry

    def make_boot(self):
        form = self.random.choice(["none", "real", "real", "volume", "circle"])
        boot = self.make_folder(b"boot")
        names = (b"Montaro Projects", b"Montaro Events")
        if form == "real":
            self.make_libraries(boot)
        for name in names:
            if form == "real" and self.chance(0.9):
                self.add_link(b"/" + name, os.path.join(boot, name))
            elif form == "volume" and self.local_volumes:
                self.add_link(b"/" + name, os.fsencode(self.local_volumes[0]["path"]) + b"/" + name
                              if self.local_volumes[0]["path"] not in ("/", "") else os.path.join(boot, name))
            elif form == "circle" and self.chance(0.3):
                self.add_link(b"/" + name, b"/circle")
                self.add_link(b"/circle", b"/" + name)

    # Home folder and preferences.

    def make_home(self):
        form = self.random.choice(["real", "real", "real", "key", "keyed parent", "missing", "null", "absent", "link"])
        self.home = None
        self.preferences = None
        self.home_said = form != "absent"
        if form in ("null", "absent"):
            return
        real = self.make_folder(b"users", b"ann")
        self.home = real
        if form == "key":
            self.home = b"/Users/ann"
            self.add_link(self.home, real)
        elif form == "keyed parent":
            self.home = b"/Users/ann"
            self.add_link(b"/Users", os.path.dirname(real))
        elif form == "link":
            self.home = os.path.join(self.folder, b"to home")
            os.symlink(b"users/ann", self.home)
        elif form == "missing":
            self.home = os.path.join(self.folder, b"users", b"bob")
            return
        self.make_libraries(self.make_folder(b"users", b"ann", b"Movies"))
        self.preferences = self.make_folder(b"users", b"ann", b"Library", b"Preferences")
        self.write_preferences()
        if self.chance(0.08):  # the default folder once more, this time as removable media
            self.removable_media.append({"path": os.fsdecode(self.home + b"/Movies")})

    def write_preferences(self):
        """Both preferences files, in place of those that were there; other kinds and values each time."""
        for domain, key, value in (
                (b"org.ombrix.Montaro.plist", "ZREventLibraryModule.arrangeEventsByMostRecent", self.order_value()),
                (b"org.ombrix.browser.plist", "MediaBrowserThreadPriorityFolderMediaManager", self.priority_value())):
            path = os.path.join(self.preferences, domain)
            if os.path.isdir(path):
                os.rmdir(path)
            elif os.path.lexists(path):
                os.unlink(path)
            self.write_preference(path, key, value)

    def order_value(self):
        return self.random.choice([
            True, False, False, 0, 1, -3, 2**40, 0.0, 0.25, -0.0, float("nan"), "YES", "no", "true", "False", "1", "0",
            "007", "-0", "+0y", " \t9", "", "x1", "0x1", "00", "- 1", "0.5", b"data", [], {}, [True],
            datetime.datetime(2001, 1, 1)])

    def priority_value(self):
        return self.random.choice([
            0.0, 1.0, 0.3, 0.999, 1.0001, -0.1, 0, 1, 2, -1, 2**62, True, False, float("nan"), float("inf"), "0.25",
            " 0.75 x",
            "abc", "", "0x1", "1e-1", ".5", "5.", "1.0001", "-0.1", "inf", "nan", "+.5e0", "0,7", "1e400", "0.5e", "-0",
            b"0.1", [], {"a": 1}, datetime.datetime(2001, 1, 1)])

    def write_preference(self, path, key, value):
        """A property list with the value, or something that is none."""
        form = self.random.choice(["xml", "xml", "binary", "binary", "absent", "no key", "damaged", "link", "folder"])
        if form == "absent":
            return
        if form == "folder":
            os.mkdir(path)
            return
        values = {"another key": 7, "zz": ["text", {"deep": 1.5}]}
        if form != "no key":
            values[key] = value
        written = plistlib.dumps(values, fmt=self.random.choice([plistlib.FMT_XML, plistlib.FMT_BINARY])
                                 if form in ("link", "damaged") else
                                 plistlib.FMT_BINARY if form == "binary" else plistlib.FMT_XML)
        if form == "damaged":
            written = self.random.choice([
                b"", b"not a property list", written[:len(written) // 2], written[:40], b"bplist00",
                b"bplist00" + bytes(40), plistlib.dumps([True, key]), plistlib.dumps("text"),
                b"<?xml version='1.0'?><plist><dict><key>a</plist>", struct.pack(">Q", 1 << 63) * 9])
        if form == "link":
            target = self.store.path(b"preference")
            os.symlink(target, path)
            path = target
        with open(path, "wb") as stream:
            stream.write(written)

    # The description.

    def add_links_at_entries(self):
        """Keys at places inside the libraries: over a real folder, or where nothing stands."""
        places = []
        for base, folders, _ in os.walk(self.folder):
            places += [os.path.join(base, name) for name in folders if b"Montaro " in base]
        places = [place for place in places if is_utf8(place)]
        for place in self.random.sample(places, min(4, len(places))):
            target = self.random.choice([self.store.project(), self.make_folder(b"elsewhere", b"plain")])
            form = self.random.choice([place, os.path.join(place, b"CurrentVersion.mtrproject"),
                                       os.path.join(place, b"Shared Items")])
            nested = any(form.startswith(other) or other.startswith(form) for other in map(os.fsencode, self.links))
            if not os.path.islink(form) and not nested:
                self.links[os.fsdecode(form)] = os.fsdecode(target)

    def set_dates(self):
        """Gives every file and folder that has none of its own a date, links included, deepest first."""
        for base, folders, files in os.walk(self.folder, topdown=False):
            for name in folders + files:
                path = os.path.join(base, name)
                if self.chance(0.5) and path not in self.store.dated:
                    moment = self.random.choice([self.random.randint(0, 1800000000),
                                                 self.random.randint(-2000000000, 2100000000)])
                    moment = moment * 10**9 + self.random.choice([0, 1, 123456789, 999999999])
                    os.utime(path, ns=(moment, moment), follow_symlinks=False)

    def describe(self):
        said = {"localVolumes": self.local_volumes, "removableMedia": self.removable_media, "links": self.links}
        for key in list(said):
            if not said[key] and self.chance(0.5):
                del said[key]
        if self.home is not None:
            said["home"] = self.spelled(self.home)
        elif self.home_said:
            said["home"] = None
        editor = self.random.choice(["present"] * 12 + ["missing", "absent", "null", "dangling"])
        program = os.path.join(self.make_folder(b"opt"), b"montaro")
        if editor == "present":
            with open(program, "wb"):
                pass
        elif editor == "dangling":
            os.symlink(b"gone", program)
        if editor == "null":
            said["editor"] = None
        elif editor != "absent":
            said["editor"] = {"path": self.spelled(program)}
        keys = list(said)
        self.random.shuffle(keys)
        self.said = {key: said[key] for key in keys}
        with open(self.file, "w", encoding="utf-8") as stream:
            json.dump(self.said, stream, indent=self.random.choice([None, 2, "\t"]), ensure_ascii=self.chance(0.5))

    def write_movie(self, path):
        """A movie that is whole, or one in which nothing can be found."""
        if self.chance(0.2):
            content, size, seconds = movie.damaged_movie(self.random), None, None
        else:
            content, size, seconds = movie.good_movie(self.random)
        with open(path, "wb") as stream:
            stream.write(content)
        self.movies[os.path.realpath(path)] = (size, seconds)

"""The files of a described machine as a source sees them.

Every path is bytes. A description lays links over the real files: a path at or below a key is served from the
key's value, and /Volumes/NAME stands for the volume that is shown as NAME.
"""

import ctypes
import json
import os
import stat

MOST_LINKS = 40
PACKAGE_EXTENSIONS = (b"app", b"bundle", b"framework", b"plugin", b"obplugin")


def last_component(path):
    return path.rstrip(b"/").rsplit(b"/", 1)[-1] or path[:1]


def without_last_component(path):
    return path.rstrip(b"/").rsplit(b"/", 1)[0] or b"/"


def join(folder, name):
    return (folder if folder.endswith(b"/") else folder + b"/") + name


def split_extension(name):
    """The name without its extension, and the extension or None.

    A name whose only full stop stands first or last has no extension; with more of them, the last one counts,
    even where nothing follows it.
    """
    stops = name.count(b".")
    if stops == 0 or (stops == 1 and (name.startswith(b".") or name.endswith(b"."))):
        return name, None
    stem, _, extension = name.rpartition(b".")
    return stem, extension


def components(path):
    return [part for part in path.split(b"/") if part not in (b"", b".")]


class Statx(ctypes.Structure):
    class Time(ctypes.Structure):
        _fields_ = [("sec", ctypes.c_int64), ("nsec", ctypes.c_uint32), ("pad", ctypes.c_int32)]

    _fields_ = [("mask", ctypes.c_uint32), ("blksize", ctypes.c_uint32), ("attributes", ctypes.c_uint64),
                ("nlink", ctypes.c_uint32), ("uid", ctypes.c_uint32), ("gid", ctypes.c_uint32),
                ("mode", ctypes.c_uint16), ("pad", ctypes.c_uint16), ("ino", ctypes.c_uint64),
                ("size", ctypes.c_uint64), ("blocks", ctypes.c_uint64), ("attributes_mask", ctypes.c_uint64),
                ("atime", Time), ("btime", Time), ("ctime", Time), ("mtime", Time),
                ("rest", ctypes.c_uint8 * 128)]


STATX_BTIME = 0x800
AT_FDCWD = -100
libc = ctypes.CDLL(None, use_errno=True)


def birth_time(path):
    """When the file came into being, in nanoseconds, or None where the file system does not keep it."""
    answer = Statx()
    if libc.statx(AT_FDCWD, path, 0, 0xFFF, ctypes.byref(answer)) != 0 or not answer.mask & STATX_BTIME:
        return None
    return answer.btime.sec * 10**9 + answer.btime.nsec


class Volume:
    def __init__(self, path, display_name):
        self.path = path
        self.display_name = display_name


class Description:
    """What a machine file says, with every path made absolute."""

    def __init__(self, file):
        self.folder = os.path.dirname(os.path.abspath(file))
        with open(file, "rb") as stream:
            said = json.loads(stream.read().decode("utf-8"))
        self.home = self.absolute(said.get("home"))
        self.local_volumes = [self.volume(entry) for entry in said.get("localVolumes", [])]
        self.removable_media = [self.volume(entry) for entry in said.get("removableMedia", [])]
        self.links = {self.absolute(key): self.absolute(value) for key, value in said.get("links", {}).items()}
        editor = said.get("editor")
        self.editor = self.absolute(editor["path"]) if editor else None

    def absolute(self, text):
        if text is None:
            return None
        path = os.fsencode(text)
        return path if path.startswith(b"/") else join(os.fsencode(self.folder), path)

    def volume(self, entry):
        path = self.absolute(entry["path"])
        name = entry.get("displayName")
        return Volume(path, last_component(path) if name is None else os.fsencode(name))


class Resolved:
    """Where a path leads: `state` is "there", "gone" (the place it names), or "circle"."""

    def __init__(self, path, state):
        self.path = path
        self.state = state


class Files:
    def __init__(self, description):
        self.links = description.links
        self.volumes = {}
        for volume in description.local_volumes + description.removable_media:
            self.volumes.setdefault(volume.display_name, volume.path)

    def described_target(self, parts):
        """The place that a key or a volume's name puts instead of these components, or None."""
        known = parts[:parts.index(b"..")] if b".." in parts else parts
        for length in range(len(known), 0, -1):
            value = self.links.get(b"/" + b"/".join(known[:length]))
            if value is not None:
                return components(value) + parts[length:]
        if len(known) >= 2 and known[0] == b"Volumes" and known[1] in self.volumes:
            if not os.path.isdir(b"/Volumes/" + known[1]):
                return components(self.volumes[known[1]]) + parts[2:]
        return None

    def resolve(self, path):
        pending = components(path)
        links = 0
        while True:
            target = self.described_target(pending)
            if target is None:
                target, answer = self.walk(pending)
                if answer is not None:
                    return answer
            links += 1
            if links > 4 * MOST_LINKS:
                folder = without_last_component(path)
                if folder == b"/" or folder == path:
                    return Resolved(path, "circle")
                return Resolved(join(self.resolve(folder).path, last_component(path)), "circle")
            pending = target

    @staticmethod
    def walk(parts):
        """Follows the real files up to the first link: the components to go on with, or the answer."""
        done = []
        for index, part in enumerate(parts):
            if part == b"..":
                return done[:-1] + parts[index + 1:], None
            place = b"/" + b"/".join(done + [part])
            try:
                mode = os.lstat(place).st_mode
            except OSError:
                rest = os.path.normpath(b"/" + b"/".join(done + parts[index:]))
                return None, Resolved(rest, "gone")
            if stat.S_ISLNK(mode):
                target = os.readlink(place)
                start = [] if target.startswith(b"/") else done
                return start + components(target) + parts[index + 1:], None
            done.append(part)
        return None, Resolved(b"/" + b"/".join(done), "there")

    def exists(self, path):
        return self.resolve(path).state == "there"

    def real_path(self, path):
        place = self.resolve(path)
        return place.path if place.state == "there" else None

    def listing(self, path):
        """The names in a folder in the order of the file system; None when it cannot be listed."""
        place = self.real_path(path)
        try:
            return None if place is None else os.listdir(place)
        except OSError:
            return None

    def modification_date(self, path):
        place = self.real_path(path)
        return None if place is None else os.stat(place).st_mtime_ns

    def creation_date(self, path):
        place = self.real_path(path)
        if place is None:
            return None
        modified, born = os.stat(place).st_mtime_ns, birth_time(place)
        return modified if born is None else min(born, modified)

    def hidden_names(self, folder):
        """The lines of the folder's own list of names to hide."""
        place = self.real_path(join(folder, b".hidden"))
        try:
            if place is None or not stat.S_ISREG(os.stat(place).st_mode):
                return set()
            with open(place, "rb") as stream:
                return set(stream.read().split(b"\n")) - {b""}
        except OSError:
            return set()

    def is_invisible(self, path):
        name = last_component(path)
        return name.startswith(b".") or name in self.hidden_names(without_last_component(path))

    def is_container(self, path):
        """True for a directory itself; a link is none, and a key of the description is a link."""
        place = join(self.resolve(without_last_component(path)).path, last_component(path))
        if path in self.links or place in self.links:
            return False
        try:
            return stat.S_ISDIR(os.lstat(place).st_mode)
        except OSError:
            return False

    def is_package(self, path):
        extension = split_extension(last_component(path))[1]
        return extension is not None and extension.lower() in PACKAGE_EXTENSIONS and self.is_container(path)

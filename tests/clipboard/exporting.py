"""Runs `ombrix export --clipboard` on a machine with awkward names, and knows what belongs on the clipboard."""

import json
import os
import select
import signal
import socket
import subprocess
import tempfile
import time
import urllib.parse
import uuid

from desktop import LONGEST_WAIT, Failure, check, check_equal, run, wait_for_end, wait_until

PRIVATE = "application/x-ombrix-OBMontaroProjectsPboardType"
TYPES = ["text/uri-list", "x-special/gnome-copied-files", "text/plain", PRIVATE]
HELPER = "ombrix-clipboard"
AWKWARD = [b"a b.mov", b"it's \"so\".mov", b"100%25.mov", b"two\nlines.mov", b"no\xff\xfeutf.mov", "\u00fc\u2603.mov".encode()]
LATE = b" within 2 seconds\n"


def uri(path):
    return b"file://" + urllib.parse.quote(path, safe="/-._~").encode()


def representations(paths):
    """What every desktop program takes files as: RFC 2483, the file manager's own, and plain paths."""
    return {
        "text/uri-list": b"".join(uri(path) + b"\r\n" for path in paths),
        "x-special/gnome-copied-files": b"\n".join([b"copy"] + [uri(path) for path in paths]),
        "text/plain": b"".join(path + b"\n" for path in paths),
    }


def status_of(process):
    """The fields of /proc/PID/stat behind the program's name."""
    try:
        with open(f"/proc/{process}/stat", encoding="utf-8", errors="replace") as file:
            return file.read().rpartition(")")[2].split()
    except FileNotFoundError:
        return ["X"] + ["0"] * 50


class Exporter:
    """The command on a machine of its own; `folder` is removed with it."""

    def __init__(self, ombrix, folder):
        self.ombrix = os.path.realpath(ombrix)
        self.folder = os.path.realpath(folder)
        # Programs that outlive the command are found by it.
        self.mark = "OMBRIX_TEST_MARK=" + uuid.uuid4().hex
        self.environment = {name: value for name, value in os.environ.items()
                            if name not in ("DISPLAY", "WAYLAND_DISPLAY", "WAYLAND_SOCKET", "XAUTHORITY")}
        name, value = self.mark.split("=")
        self.environment.update({"LC_ALL": "C", "HOME": "/nonexistent", name: value})
        self.reports = os.path.join(self.folder, "report")
        for checks in ("ASAN_OPTIONS", "UBSAN_OPTIONS", "TSAN_OPTIONS"):
            given = self.environment.get(checks, "")
            # A program that prints nowhere is to be heard all the same.
            self.environment[checks] = f"{given}:log_path={self.reports}"
        # A library that the toolkit loads copies texts of known length, which the strict check takes for ended by a zero.
        self.environment["ASAN_OPTIONS"] += ":strict_string_checks=0"
        known = os.path.join(os.path.dirname(os.path.realpath(__file__)), "thread-sanitizer.txt")
        self.environment["TSAN_OPTIONS"] += ":suppressions=" + known
        self.make_machine()

    def make_machine(self):
        library = os.path.join(self.folder, "home/Movies/Montaro Projects")
        self.project = os.path.join(library, "Trip")
        movies = os.path.join(self.project, "Shared Items")
        self.awkward = [os.path.join(os.fsencode(movies), name) for name in AWKWARD]
        event = os.path.join(self.folder, "home/Movies/Montaro Events/Coast")
        clips = os.path.join(event, "Original Media")
        self.many = [os.path.join(os.fsencode(clips), b"%03d %s.mov" % (number, b"very long name " * 14))
                     for number in range(400)]
        for place in (movies, clips, os.path.join(self.folder, "bin")):
            os.makedirs(place)
        markers = [os.path.join(self.project, "CurrentVersion.mtrproject"), os.path.join(event, "CurrentVersion.mtrevent")]
        for file in markers + self.awkward + self.many:
            with open(file, "wb"):
                pass
        editor = os.path.join(self.folder, "bin/montaro")
        with open(editor, "w", encoding="utf-8") as script:
            script.write("#!/bin/sh\n")
        os.chmod(editor, 0o700)
        self.machine = os.path.join(self.folder, "machine.json")
        with open(self.machine, "w", encoding="utf-8") as description:
            json.dump({"home": os.path.join(self.folder, "home"), "editor": {"path": editor}}, description)

    def words(self, *selection, program=None):
        return [program or self.ombrix, "--machine", self.machine, "export", "--clipboard", *selection]

    @staticmethod
    def objects(paths):
        return [word for path in paths for word in (b"--object", path)]

    def export(self, environment, *selection, **more):
        """What the command prints once it has been given the clipboard. A busy machine may need longer than it waits."""
        end = time.monotonic() + LONGEST_WAIT
        while True:
            done = run(self.words(*selection), environment, **more)
            if done.returncode == 0:
                check_equal(done.stderr, b"", "standard error")
                return done.stdout
            check(done.returncode == 1 and done.stderr.endswith(LATE), "export:", done.returncode, done.stderr)
            check(time.monotonic() < end, "export:", done.stderr)

    def refusal(self, environment, *selection, program=None):
        """The one line of a run that cannot do it, and how long it took."""
        began = time.monotonic()
        done = run(self.words(*(selection or ("--group", self.project)), program=program), environment)
        took = time.monotonic() - began
        check_equal((done.returncode, done.stdout), (1, b""), f"status and output beside {done.stderr!r}")
        check(done.stderr.startswith(b"ombrix: ") and done.stderr.count(b"\n") == 1, "no one line:", done.stderr)
        return done.stderr.decode().rstrip("\n"), took

    def helpers(self):
        """The processes that offer what this machine's runs exported."""
        found = []
        for process in filter(str.isdigit, os.listdir("/proc")):
            try:
                program = os.readlink(f"/proc/{process}/exe")
                with open(f"/proc/{process}/environ", "rb") as file:
                    is_ours = self.mark.encode() in file.read().split(b"\0")
            except OSError:
                continue
            if is_ours and os.path.basename(program) == HELPER:
                found.append(int(process))
        return found

    def helper(self):
        """The one that is left when those from whom it took the clipboard have ended."""
        found = sorted(self.helpers(), key=lambda process: int(status_of(process)[19]))
        for process in found[:-1]:
            wait_for_end(process, "a program that lost the clipboard")
        check(found, "no program offers anything")
        return found[-1]

    def no_helper_stays(self, but=()):
        for process in set(self.helpers()).difference(but):
            wait_for_end(process, "a program that offers nothing")

    def check_reports(self):
        for name in sorted(os.listdir(self.folder)):
            if name.startswith("report"):
                with open(os.path.join(self.folder, name), encoding="utf-8", errors="replace") as file:
                    raise Failure(file.read())


def check_everything(exporter, display):
    """All types of three selections, byte for byte."""
    for paths in (exporter.awkward, exporter.many, exporter.awkward[:1]):
        printed = exporter.export(display.environment, *exporter.objects(paths))
        check_clipboard(display, {**representations(paths), PRIVATE: printed})
    printed = exporter.export(display.environment, "--group", exporter.project)
    check(exporter.project.encode() in printed, "the project is not in", printed)
    check_equal(display.bytes_of(PRIVATE), printed, PRIVATE)


def check_clipboard(display, expected):
    for kind, data in expected.items():
        check_equal(display.bytes_of(kind), data, kind)


def check_detached(exporter, display):
    """What goes on offering hangs on nothing of the command's: no session, no terminal, no folder, no pipe."""
    reading, writing = os.pipe()
    exporter.export(display.environment, *exporter.objects(exporter.awkward), pass_fds=[writing])
    os.close(writing)
    helper = exporter.helper()
    parent, _, session, terminal = map(int, status_of(helper)[1:5])
    check(session != os.getsid(0) and terminal == 0, "session", session, "terminal", terminal)
    check(parent != os.getpid(), "it is a child of this process")
    check_equal(os.readlink(f"/proc/{helper}/cwd"), "/", "working directory")
    check_equal([os.readlink(f"/proc/{helper}/fd/{number}") for number in (0, 1, 2)], ["/dev/null"] * 3, "descriptors")
    try:
        check(select.select([reading], [], [], LONGEST_WAIT)[0], "what was handed down is held open")
    finally:
        os.close(reading)
    check_equal(exporter.helper(), helper, "the program that offers")


def check_taken_over(exporter, display):
    exporter.export(display.environment, *exporter.objects(exporter.awkward))
    helper = exporter.helper()
    display.copy(b"something else")
    wait_for_end(helper, "the program that lost the clipboard")
    check_equal(display.bytes_of("text/plain" if "text/plain" in display.types() else "UTF8_STRING"), b"something else",
                "the clipboard")
    exporter.export(display.environment, *exporter.objects(exporter.awkward))
    check_equal(display.bytes_of("text/plain"), representations(exporter.awkward)["text/plain"], "the clipboard")


def check_left_alone(exporter, display):
    """Nothing is copied where nothing was written or found."""
    display.copy(b"what was there before")
    kind = "text/plain" if "text/plain" in display.types() else "UTF8_STRING"
    done = run(exporter.words("--group", "Nothing here"), display.environment)
    check_equal((done.returncode, done.stdout), (1, b""), "an absent group")
    for path in exporter.many:
        os.unlink(path)
    done = run(exporter.words("--group", "Events"), display.environment)
    check_equal((done.returncode, done.stdout), (0, b""), f"a group without files, beside {done.stderr!r}")
    exporter.no_helper_stays()
    check_equal(display.bytes_of(kind), b"what was there before", "the clipboard")


def check_display_goes(exporter, display):
    exporter.export(display.environment, *exporter.objects(exporter.awkward))
    helper = exporter.helper()
    display.signal(signal.SIGKILL)
    wait_for_end(helper, "the program whose display is gone")
    line, _ = exporter.refusal(display.environment)
    check(line.endswith(" cannot be opened"), line)


def check_silent(exporter, environment):
    """A display that takes the connection and never answers costs two seconds; an interrupted command costs nothing."""
    before = exporter.helpers()
    line, took = exporter.refusal(environment)
    check(line.endswith(" did not answer within 2 seconds"), line)
    check(took >= 2, "given up after", took)
    exporter.no_helper_stays(but=before)
    with subprocess.Popen(exporter.words("--group", exporter.project), env=environment, stdin=subprocess.DEVNULL,
                          stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL) as command:
        wait_until(lambda: set(exporter.helpers()).difference(before), command, "a program that opens the display")
        command.send_signal(signal.SIGINT)
        command.wait(LONGEST_WAIT)
    exporter.no_helper_stays(but=before)


def silent_socket(folder):
    """A server's socket that nobody ever serves."""
    listener = socket.socket(socket.AF_UNIX)
    listener.bind(os.path.join(folder, "silent"))
    listener.listen(8)
    return listener


def machine_folder():
    return tempfile.TemporaryDirectory(prefix="ombrix-clipboard-")

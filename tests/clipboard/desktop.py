"""Displays to copy and paste on, and the programs that own their clipboards."""

import os
import select
import shutil
import signal
import subprocess
import sys
import time

LONGEST_WAIT = 60  # seconds; only a failure reaches it
SKIPPED = 77
NEXT_LOOK = 0.02


class Failure(Exception):
    pass


def need(*programs):
    """Ends the test as skipped where one of the programs is not installed."""
    absent = [program for program in programs if not shutil.which(program)]
    if absent:
        print("skipped: not installed:", " ".join(absent))
        sys.exit(SKIPPED)


def check(holds, *told):
    if not holds:
        raise Failure(" ".join(map(str, told)))


def check_equal(got, expected, what):
    check(got == expected, f"{what}:\n  expected {expected!r}\n  got      {got!r}")


def run(words, environment, given=b"", **more):
    return subprocess.run(words, env=environment, input=given, stdout=subprocess.PIPE, stderr=subprocess.PIPE,
                          timeout=LONGEST_WAIT, check=False, **more)


def wait_until(holds, process, what):
    """Looks again and again, for as long as the process lives."""
    end = time.monotonic() + LONGEST_WAIT
    while not holds():
        try:
            process.wait(NEXT_LOOK)
            raise Failure(f"{what}: {process.args[0]} ended with {process.returncode}")
        except subprocess.TimeoutExpired:
            check(time.monotonic() < end, what, "did not come true")


def wait_for_end(process, what):
    """Of any process, also one that nobody has taken the exit status of."""
    try:
        watched = os.pidfd_open(process)
    except ProcessLookupError:
        return
    try:
        poll = select.poll()
        poll.register(watched, select.POLLIN)
        check(poll.poll(LONGEST_WAIT * 1000), what, "is still there")
    finally:
        os.close(watched)


class Server:
    """A display server for as long as the block lasts."""

    process = None

    def __enter__(self):
        return self

    def __exit__(self, *failure):
        self.signal(signal.SIGCONT)
        self.signal(signal.SIGKILL)

    def signal(self, number):
        if self.process.poll() is None:
            self.process.send_signal(number)
        if number == signal.SIGKILL:
            self.process.wait(LONGEST_WAIT)


class XServer(Server):
    def __init__(self, environment, log):
        reading, writing = os.pipe()
        with open(log, "ab") as errors:
            self.process = subprocess.Popen(
                ["Xvfb", "-displayfd", str(writing), "-screen", "0", "640x480x24", "-noreset", "-nolisten", "tcp"],
                env=environment, stdin=subprocess.DEVNULL, stdout=errors, stderr=errors, pass_fds=[writing])
        os.close(writing)
        number = b""
        # It says its number once it can be reached.
        while not number.endswith(b"\n"):
            check(select.select([reading], [], [], LONGEST_WAIT)[0], "Xvfb says nothing")
            part = os.read(reading, 64)
            check(part, "Xvfb ended:", open(log, encoding="utf-8", errors="replace").read()[-2000:])
            number += part
        os.close(reading)
        self.environment = {**environment, "DISPLAY": ":" + number.decode().strip()}
        self.environment.pop("WAYLAND_DISPLAY", None)

    def types(self):
        return self.bytes_of("TARGETS").decode().split()

    def bytes_of(self, kind):
        done = run(["xclip", "-selection", "clipboard", "-o", "-t", kind], self.environment)
        check(done.returncode == 0, "xclip:", kind, done.stderr)
        return done.stdout

    def copy(self, data):
        # It goes on in the background, and holds on to what it was given to print to.
        subprocess.run(["xclip", "-selection", "clipboard", "-i"], env=self.environment, input=data, check=True,
                       stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL, timeout=LONGEST_WAIT)


class Compositor(Server):
    """One that covers a whole X display, whose pointer is in its middle: that is where a keyboard's focus goes."""

    def __init__(self, x_server, folder, log):
        runtime = os.path.join(folder, "runtime")
        os.makedirs(runtime, mode=0o700, exist_ok=True)
        self.environment = {**x_server.environment, "XDG_RUNTIME_DIR": runtime}
        with open(log, "ab") as output:
            self.process = subprocess.Popen(
                ["weston", "--backend=x11-backend.so", "--use-pixman", "--socket=wayland-test", "--width=640",
                 "--height=480", "--idle-time=0"],
                env=self.environment, stdin=subprocess.DEVNULL, stdout=output, stderr=output)
        self.environment["WAYLAND_DISPLAY"] = "wayland-test"
        del self.environment["DISPLAY"]
        wait_until(lambda: os.path.exists(os.path.join(runtime, "wayland-test")), self.process, "the compositor's socket")

    def types(self):
        return self.paste("--list-types").decode().split()

    def bytes_of(self, kind):
        return self.paste("--no-newline", "--type", kind)

    def paste(self, *words):
        done = run(["wl-paste", *words], self.environment)
        check(done.returncode == 0, "wl-paste", *words, done.stderr)
        return done.stdout

    def copy(self, data):
        subprocess.run(["wl-copy"], env=self.environment, input=data, check=True, stdout=subprocess.DEVNULL,
                       stderr=subprocess.DEVNULL, timeout=LONGEST_WAIT)

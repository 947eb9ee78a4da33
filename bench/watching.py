"""Following changes, against a floor of one watch and one listing a folder, and a bare reader that hands events on."""

import json
import os
import signal
import subprocess
import threading
import time
from pathlib import Path

import measuring
from measuring import Failure, Row, in_turn, median_ratio

NAME = "watching"
SMALL, LARGE = 1_000, 100_000
WORDS = {SMALL: "1 thousand folders", LARGE: "100 thousand folders"}
CHANGES = 400
IDLE_SECONDS = 60
HOLDERS = 100
STORM, SHORT_STORM = 1_000_000, 100_000
RELOAD_DELAY = 5
PATIENCE = 60
LIMIT = Path("/proc/sys/fs/inotify/max_user_watches")


class Bench:
    def __init__(self, build, libraries):
        self.build = build
        self.libraries = libraries / "folders"
        self.home = libraries / "storm"

    def folder(self, size):
        return self.libraries / str(size)

    def make(self):
        for size in (SMALL, LARGE):
            groups = size // 100
            if not (self.folder(size) / str(groups - 1)).exists():
                for group in range(groups):
                    for number in range(99):
                        (self.folder(size) / str(group) / str(number)).mkdir(parents=True, exist_ok=True)

        self.make_home()

    def make_home(self):
        """A home with a hundred projects and a hundred events of one movie each."""
        for holder in self.holders():
            holder.mkdir(parents=True, exist_ok=True)
            marker = "CurrentVersion.mtr" + ("project" if holder.name == "Shared Items" else "event")
            (holder.parent / marker).touch()
            for left in holder.iterdir():
                left.unlink()
            (holder / "a.mov").touch()
        (self.home / "editor").touch()
        machine = {"home": str(self.home), "editor": {"path": str(self.home / "editor")}}
        (self.home / "machine.json").write_text(json.dumps(machine), encoding="utf-8")

    def holders(self):
        for number in range(HOLDERS):
            yield self.home / "Movies" / "Montaro Projects" / str(number) / "Shared Items"
            yield self.home / "Movies" / "Montaro Events" / str(number) / "Original Media"

    def floor(self, size):
        return measuring.answer([self.build.program("watch_floor"), self.folder(size), str(CHANGES)])

    def probe(self, size, idle=0):
        expect_watches(size)
        return measuring.answer([self.build.program("watch_probe"), self.folder(size), str(CHANGES), str(idle)])


def expect_watches(size):
    """Both sides run one after the other, so one tree's watches are enough."""
    allowed = int(LIMIT.read_text(encoding="ascii"))
    if allowed < size * 5 // 4:
        raise Failure(f"{LIMIT}: {allowed} watches where {size * 5 // 4} are needed")


def set_up_rows(bench, rounds):
    pairs = in_turn(rounds, lambda: bench.probe(LARGE), lambda: bench.floor(LARGE))
    yield Row(f"set-up over {WORDS[LARGE]}: wall clock, to the floor", median_ratio(pairs, "setUpSeconds"), 1.5)
    title = f"from a file's close to the observer's call, {WORDS[LARGE]}: to a bare reader"
    yield Row(title, median_ratio(pairs, "arrivalSeconds"), 2)
    yield Row("memory a watched folder, bytes, names of two letters included",
              pairs[0][0]["keptBytes"] / pairs[0][0]["folders"], 150)


def small_rows(bench, rounds):
    pairs = in_turn(rounds, lambda: bench.probe(SMALL), lambda: bench.floor(SMALL))
    title = f"from a file's close to the observer's call, {WORDS[SMALL]}: to a bare reader"
    yield Row(title, median_ratio(pairs, "arrivalSeconds"), 2)


class Watch:
    """The program as it follows a home; reads what it prints."""

    def __init__(self, bench):
        if not bench.build.ombrix.exists():
            raise Failure(f"{bench.build.ombrix}: not built")
        command = [bench.build.ombrix, "--machine", bench.home / "machine.json", "watch", "--json", "--changes"]
        self.program = subprocess.Popen([str(part) for part in command], stdout=subprocess.PIPE,
                                        stderr=subprocess.DEVNULL)
        self.reloads = {"projects": 0, "events": 0}
        self.last_line = time.monotonic()
        self.lines = 0
        threading.Thread(target=self.read, daemon=True).start()

    def read(self):
        for line in self.program.stdout:
            half = json.loads(line).get("half")
            if half in self.reloads:
                self.reloads[half] += 1
            self.last_line = time.monotonic()
            self.lines += 1

    def settle(self):
        """Waits until nothing has been published for longer than a reload is put off."""
        began = time.monotonic()
        while self.lines == 0 or time.monotonic() - max(self.last_line, began) < RELOAD_DELAY + 2:
            if self.program.poll() is not None or time.monotonic() - began > PATIENCE:
                raise Failure("ombrix: a watch does not come to rest")
            time.sleep(0.1)

    def memory(self, name):
        """A line of what the kernel says of the process, in bytes."""
        status = Path(f"/proc/{self.program.pid}/status").read_text(encoding="ascii")
        return int(next(line.split()[1] for line in status.splitlines() if line.startswith(name + ":"))) * 1024

    def end(self):
        self.program.send_signal(signal.SIGTERM)
        self.program.wait()


def change_files(bench, changes):
    """Renames movies of projects and events in turn, as fast as one process can."""
    pairs = [(str(holder / "a.mov"), str(holder / "b.mov")) for holder in bench.holders()]
    for number in range(changes):
        turn, pair = divmod(number, len(pairs))
        before, after = pairs[pair] if turn % 2 == 0 else reversed(pairs[pair])
        os.rename(before, after)


def storm(bench, changes):
    """How long it took, the memory before and at most, and how often each half was scanned."""
    bench.make_home()
    watch = Watch(bench)
    try:
        watch.settle()
        watch.reloads = dict.fromkeys(watch.reloads, 0)
        before = watch.memory("VmRSS")
        began = time.monotonic()
        change_files(bench, changes)
        seconds = time.monotonic() - began
        watch.settle()
        return {"seconds": seconds, "before": before, "peak": watch.memory("VmHWM"), "reloads": watch.reloads}
    finally:
        watch.end()


def storm_rows(bench, _rounds):
    short, long = storm(bench, SHORT_STORM), storm(bench, STORM)
    yield Row("peak memory in a storm of a million changes: to one of 100 thousand", long["peak"] / short["peak"], 1.5)
    yield Row("peak memory in a storm of a million changes: to the memory before", long["peak"] / long["before"], None)
    allowed = int(long["seconds"] / RELOAD_DELAY) + 2
    for half, count in long["reloads"].items():
        yield Row(f"reloads of {half} in a storm of a million changes, {long['seconds']:.0f} seconds long", count,
                  allowed, "{:.0f}")


def idle_rows(bench, _rounds):
    wake_ups = bench.probe(SMALL, IDLE_SECONDS)["wakeUps"]
    yield Row(f"wake-ups in {IDLE_SECONDS} seconds in which nothing changes", wake_ups, 0)


PARTS = (set_up_rows, small_rows, storm_rows, idle_rows)

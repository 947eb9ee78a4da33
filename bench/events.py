"""The events half against a floor of one listing an event and one status a clip, and beside what others offer."""

import os
import shutil
import stat
import statistics
import subprocess
from pathlib import Path

import measuring
from measuring import Failure, Row, UnmeasuredRow, in_turn, median_ratio

NAME = "events"
EMPTY, SMALL, LARGE = SIZES = (0, 100_000, 1_000_000)
WORDS = {SMALL: "100 thousand clips", LARGE: "1 million clips"}
BYTES_A_CLIP = 100
CANCEL_AFTER_MILLISECONDS = 100
COLD_ROUNDS = 3
DROP_CACHES = Path("/proc/sys/vm/drop_caches")


class Bench:
    def __init__(self, build, libraries):
        self.build = build
        self.libraries = libraries / "clips"
        self.cold = False

    def machine(self, size):
        return self.libraries / str(size) / "machine.json"

    def library(self, size):
        return self.libraries / str(size) / "home" / "Movies" / "Montaro Events"

    def make(self):
        for size in SIZES:
            folder = self.libraries / str(size)
            if not folder.exists():
                expect_room(self.libraries, size)
            measuring.make([self.build.program("make_clips"), folder, size], folder)
            found = self.floor(size)["clips"]
            if found != size:
                raise Failure(f"{folder}: holds {found} clips")

    def floor(self, size, *options):
        self.prepare()
        return measuring.answer([self.build.program("events_floor"), self.library(size), *options])

    def scan(self, size, *options):
        self.prepare()
        return self.build.scan(self.machine(size), *options)

    def command(self, size, *arguments):
        return self.build.command(self.machine(size), *arguments)

    def expect_same(self, size):
        measuring.expect_same(self.floor(size), self.scan(size), "events", "clips")

    def prepare(self):
        """Where runs are to be cold, leaves nothing of any file in memory."""
        if self.cold:
            os.sync()
            DROP_CACHES.write_text("3\n", encoding="ascii")


def expect_room(folder, size):
    """A file system without room for so many files is better left alone than filled up."""
    folder.mkdir(parents=True, exist_ok=True)
    system = os.statvfs(folder)
    wanted = size + size // 25
    # Some make room for inodes as they go, and count none.
    if system.f_files and system.f_favail < wanted:
        raise Failure(f"{folder}: room for {system.f_favail} files where {wanted} are needed")


def comparison_rows(bench, rounds, size):
    """What others offer for the same question, and what a second thread could bring at best."""
    library = bench.library(size)
    others = {"`find -printf '%B@ %p'`": [shutil.which("find"), library, "-printf", "%B@ %p\\n"],
              "`std::filesystem` with a time per file": [bench.build.program("filesystem_list"), library]}
    gio = "GIO's enumeration"
    if bench.build.has("gio_list"):
        others[gio] = [bench.build.program("gio_list"), library]
    sides = [lambda command=command: bench.build.cost(*command) for command in others.values()]
    results = in_turn(rounds, lambda: bench.floor(size), lambda: bench.floor(size, "--threads", "2"), *sides)
    pairs = [(result[1], result[0]) for result in results]
    yield Row(f"the floor on two threads, {WORDS[size]}: wall clock, to one", median_ratio(pairs, "wallSeconds"), None)
    for index, name in enumerate(others, 2):
        pairs = [(result[index], result[0]) for result in results]
        yield Row(f"{name}, {WORDS[size]}: processor, to the floor", median_ratio(pairs, "cpuSeconds"), None)
    if gio not in others:
        title = f"{gio}, {WORDS[size]}: processor, to the floor"
        yield UnmeasuredRow(title, None, "gio-2.0 was not there to build with")


def load_rows(bench, rounds, size):
    bench.expect_same(size)
    pairs = in_turn(rounds, lambda: bench.scan(size), lambda: bench.floor(size))
    yield Row(f"load of {WORDS[size]}: processor, to the floor", median_ratio(pairs, "cpuSeconds"), 1.15)
    title, target = f"load of {WORDS[size]}: wall clock, to the floor", 0.65
    if len(os.sched_getaffinity(0)) < 2:
        yield UnmeasuredRow(title, target, "only one processor")
    else:
        yield Row(title, median_ratio(pairs, "wallSeconds"), target)


def small_rows(bench, rounds):
    yield from comparison_rows(bench, rounds, SMALL)
    yield from load_rows(bench, rounds, SMALL)


def large_rows(bench, rounds):
    yield from comparison_rows(bench, rounds, LARGE)
    yield from load_rows(bench, rounds, LARGE)


def floor_growth_rows(bench, rounds):
    pairs = in_turn(rounds, lambda: bench.floor(LARGE), lambda: bench.floor(SMALL))
    title = "the floor itself, 1 million clips: {}, to 100 thousand"
    yield Row(title.format("processor"), median_ratio(pairs, "cpuSeconds"), None)
    yield Row(title.format("wall clock"), median_ratio(pairs, "wallSeconds"), None)


def growth_rows(bench, rounds):
    bench.expect_same(LARGE)
    pairs = in_turn(rounds, lambda: bench.scan(LARGE), lambda: bench.scan(SMALL))
    yield Row("load of 1 million clips: processor, to 100 thousand", median_ratio(pairs, "cpuSeconds"), 11)
    yield Row("load of 1 million clips: wall clock, to 100 thousand", median_ratio(pairs, "wallSeconds"), 11)


def printing_rows(bench, rounds):
    bench.expect_same(LARGE)
    results = in_turn(rounds, lambda: bench.command(LARGE, "tree", "--json"),
                      lambda: bench.command(LARGE, "message", "--group", "Montaro"), lambda: bench.floor(LARGE))
    added = statistics.median((printed["cpuSeconds"] - silent["cpuSeconds"]) / floor["cpuSeconds"]
                              for printed, silent, floor in results)
    yield Row("JSON of 1 million clips to /dev/null: processor beyond the load, to the floor", added, 0.25)


def memory_rows(bench, rounds):
    bench.expect_same(LARGE)
    pairs = in_turn(rounds, lambda: bench.scan(LARGE), lambda: bench.scan(EMPTY))
    used = statistics.median(full["peakBytes"] - empty["peakBytes"] for full, empty in pairs)
    yield Row("peak memory of a load beyond that of an empty library: bytes a clip, names included", used / LARGE,
              BYTES_A_CLIP, "{:.0f}")


def cancel_rows(bench, rounds):
    bench.expect_same(LARGE)
    pairs = in_turn(rounds, lambda: bench.scan(LARGE, "--cancel-after", str(CANCEL_AFTER_MILLISECONDS)),
                    lambda: bench.floor(LARGE))
    yield Row("cancel while 1 million clips load: threads that run on a second later",
              max(cancelled["threads"] for cancelled, _ in pairs), 0, "{:.0f}")
    ended = statistics.median(cancelled["threadsEndedSeconds"] / floor["wallSeconds"] for cancelled, floor in pairs)
    yield Row("cancel while 1 million clips load: wall clock until its threads have ended, to the floor", ended, None)


def reason_against_cold(folder):
    """Why the cache cannot be emptied in front of this folder; empty when it can."""
    if os.geteuid() != 0:
        return "only root may drop caches"
    if not os.access(DROP_CACHES, os.W_OK):
        return f"{DROP_CACHES} cannot be written"
    return "" if is_on_block_device(folder) else "the libraries are not on a block device"


def is_on_block_device(folder):
    number = folder.stat().st_dev
    device = f"{os.major(number)}:{os.minor(number)}"
    if Path("/sys/dev/block", device).exists():
        return True
    # A file system over several devices has a number of its own, but names one of them as its source.
    for line in Path("/proc/self/mountinfo").read_text(encoding="utf-8").splitlines():
        mount, _, system = line.partition(" - ")
        if mount.split()[2] != device:
            continue
        source = Path(system.split()[1])
        if source.is_absolute() and source.exists() and stat.S_ISBLK(source.stat().st_mode):
            return True
    return False


def cold_ratio_rows(bench, rounds, title, target, above):
    """One row a size; what is above the floor runs on nothing cached, and so does the floor."""
    reason = reason_against_cold(bench.libraries)
    if reason:
        yield from (UnmeasuredRow(title.format(WORDS[size]), target, reason) for size in (SMALL, LARGE))
        return
    bench.cold = True
    try:
        for size in (SMALL, LARGE):
            pairs = in_turn(min(rounds, COLD_ROUNDS), lambda size=size: above(size),
                            lambda size=size: bench.floor(size))
            yield Row(title.format(WORDS[size]), median_ratio(pairs, "wallSeconds"), target)
    finally:
        bench.cold = False


def cold_floor_rows(bench, rounds):
    """How much of a cold walk is waiting, which is what more listings at once can take away."""
    title = "the floor on eight threads, {}, nothing cached: wall clock, to one"
    yield from cold_ratio_rows(bench, rounds, title, None, lambda size: bench.floor(size, "--threads", "8"))


def cold_rows(bench, rounds):
    for size in (SMALL, LARGE):
        bench.expect_same(size)
    yield from cold_ratio_rows(bench, rounds, "load of {}, nothing cached: wall clock, to the floor", 0.45, bench.scan)


def find_rows(bench, _rounds):
    if bench.build.has("find_probe"):
        found = measuring.answer([bench.build.program("find_probe")])
        for library in found:
            names = "names one in fifty with accents" if library["withAccents"] else "ASCII names"
            ratio = statistics.median(search["ratio"] for search in library["searches"])
            yield Row(f"search of a million {names}: processor, to one pass over them", ratio, 10)


PARTS = (small_rows, large_rows, floor_growth_rows, growth_rows, printing_rows, memory_rows, cancel_rows,
         cold_floor_rows, cold_rows, find_rows)

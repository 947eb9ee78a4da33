"""Following changes, against a floor of one watch and one listing a folder, and a bare reader that hands events on."""

from pathlib import Path

import measuring
from measuring import Failure, Row, in_turn, median_ratio

NAME = "watching"
SMALL, LARGE = 1_000, 100_000
WORDS = {SMALL: "1 thousand folders", LARGE: "100 thousand folders"}
CHANGES = 400
IDLE_SECONDS = 20
LIMIT = Path("/proc/sys/fs/inotify/max_user_watches")


class Bench:
    def __init__(self, build, libraries):
        self.build = build
        self.libraries = libraries / "folders"

    def folder(self, size):
        return self.libraries / str(size)

    def make(self):
        for size in (SMALL, LARGE):
            groups = size // 100
            if not (self.folder(size) / str(groups - 1)).exists():
                for group in range(groups):
                    for number in range(99):
                        (self.folder(size) / str(group) / str(number)).mkdir(parents=True, exist_ok=True)

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


def idle_rows(bench, _rounds):
    wake_ups = bench.probe(SMALL, IDLE_SECONDS)["wakeUps"]
    yield Row(f"wake-ups in {IDLE_SECONDS} seconds in which nothing changes", wake_ups, 0)


PARTS = (set_up_rows, small_rows, idle_rows)

"""The projects half against its floors. Warm cache, since every library is walked once before anything counts."""

import statistics

import measuring
from measuring import Row, in_turn, median_ratio

NAME = "projects"
SIZES = (0, 10, 1000, 10000)
BYTES_A_PROJECT = 600
BYTES_A_MOVIE = 300


class Bench:
    def __init__(self, build, libraries):
        self.build = build
        self.libraries = libraries

    def machine(self, size):
        return self.libraries / str(size) / "machine.json"

    def library(self, size):
        return self.libraries / str(size) / "home" / "Movies" / "Montaro Projects"

    def make(self):
        for size in SIZES:
            folder = self.libraries / str(size)
            measuring.make([self.build.program("make_projects"), folder, size], folder)
            self.floor(size, "--headers")

    def floor(self, size, *options):
        return measuring.answer([self.build.program("projects_floor"), self.library(size), *options])

    def scan(self, size, *options):
        return self.build.scan(self.machine(size), *options)

    def command(self, size, *arguments):
        return self.build.command(self.machine(size), *arguments)


def scan_rows(bench, rounds):
    largest = SIZES[-1]
    measuring.expect_same(bench.floor(largest), bench.scan(largest), "projects", "movies")
    pairs = in_turn(rounds, lambda: bench.scan(largest, "--without-headers"), lambda: bench.floor(largest))
    yield Row("scan, movie headers aside: processor, to the floor", median_ratio(pairs, "cpuSeconds"), 1.3)
    pairs = in_turn(rounds, lambda: bench.scan(largest), lambda: bench.floor(largest, "--headers"))
    yield Row("scan with movie headers: processor, to the floor with headers", median_ratio(pairs, "cpuSeconds"), 1.3)


def growth_rows(bench, rounds):
    small, large = SIZES[-2:]
    pairs = in_turn(rounds, lambda: bench.scan(large, "--without-headers"),
                    lambda: bench.scan(small, "--without-headers"))
    yield Row("scan of 10,000 projects: processor, to 1,000", median_ratio(pairs, "cpuSeconds"), 11)
    pairs = in_turn(rounds, lambda: bench.scan(large), lambda: bench.scan(small))
    yield Row("scan with movie headers of 10,000 projects: processor, to 1,000", median_ratio(pairs, "cpuSeconds"), 11)


def floor_rows(bench, rounds):
    small, large = SIZES[-2:]
    pairs = in_turn(rounds, lambda: bench.floor(large), lambda: bench.floor(small))
    yield Row("the floor itself, 10,000 projects: processor, to 1,000", median_ratio(pairs, "cpuSeconds"), None)
    pairs = in_turn(rounds, lambda: bench.floor(large, "--headers"), lambda: bench.floor(small, "--headers"))
    yield Row("the floor with headers, 10,000 projects: processor, to 1,000", median_ratio(pairs, "cpuSeconds"), None)


def start_rows(bench, rounds):
    few = 10
    bare = bench.build.program("bare_list")
    pairs = in_turn(rounds * 10, lambda: bench.command(few, "tree"), lambda: bench.build.cost(bare, bench.library(few)))
    yield Row("`ombrix tree` on ten projects: wall clock, to a bare process", median_ratio(pairs, "wallSeconds"), 3)
    yield Row("`ombrix tree` on ten projects: processor, to a bare process", median_ratio(pairs, "cpuSeconds"), 3)


def printing_rows(bench, rounds):
    largest = SIZES[-1]
    # What is asked for is a small difference of two large figures, so it takes more rounds to tell.
    results = in_turn(rounds * 3, lambda: bench.command(largest, "tree", "--json"),
                      lambda: bench.command(largest, "message", "--group", "Montaro"), lambda: bench.scan(largest))
    added = statistics.median((printed["cpuSeconds"] - silent["cpuSeconds"]) / scan["cpuSeconds"]
                              for printed, silent, scan in results)
    yield Row("JSON to /dev/null: processor beyond the load, to the scan", added, 0.1)


def memory_rows(bench, rounds):
    largest = SIZES[-1]
    counted = bench.floor(largest)
    allowed = BYTES_A_PROJECT * counted["projects"] + BYTES_A_MOVIE * counted["movies"]
    pairs = in_turn(rounds, lambda: bench.command(largest, "tree", "--json"),
                    lambda: bench.command(0, "tree", "--json"))
    used = statistics.median(full["peakBytes"] - empty["peakBytes"] for full, empty in pairs) - counted["nameBytes"]
    yield Row("peak memory beyond an empty library and the names: bytes a project with its movies",
              used / counted["projects"], allowed / counted["projects"], "{:.0f}")


PARTS = (scan_rows, growth_rows, floor_rows, start_rows, printing_rows, memory_rows)

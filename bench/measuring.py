"""What every part of the measurement needs: programs that answer in JSON, sides that run in turn, rows of a table."""

import json
import os
import platform
import statistics
import subprocess
from pathlib import Path


class Failure(Exception):
    """What could not be measured, and why."""


def complaint(command, done):
    """What a program that did not end well has to say."""
    said = done.stderr.decode(errors="replace").strip() or f"ended with {done.returncode}"
    return f"{Path(command[0]).name}: {said.splitlines()[-1]}"


def answer(command):
    """Runs a program and takes the one JSON document that it prints."""
    done = subprocess.run([str(part) for part in command], stdout=subprocess.PIPE, stderr=subprocess.PIPE, check=False)
    if done.returncode != 0:
        raise Failure(complaint(command, done))
    return json.loads(done.stdout)


def make(command, folder):
    """Runs a program that makes a library in a folder."""
    folder.mkdir(parents=True, exist_ok=True)
    if subprocess.run([str(part) for part in command], check=False).returncode != 0:
        raise Failure(f"{folder}: no library to measure on")


class Build:
    """The programs of one build, and what is asked of the product on any machine."""

    def __init__(self, folder):
        self.programs = folder / "bench"
        self.ombrix = folder / "bin" / "ombrix"

    def has(self, name):
        return (self.programs / name).exists()

    def program(self, name):
        if not self.has(name):
            raise Failure(f"{self.programs / name}: not built")
        return self.programs / name

    def scan(self, machine, *options):
        return answer([self.program("scan_probe"), "--machine", machine, *options])

    def cost(self, *command):
        return answer([self.program("process_cost"), *command])

    def command(self, machine, *arguments):
        if not self.ombrix.exists():
            raise Failure(f"{self.ombrix}: not built")
        return self.cost(self.ombrix, "--machine", machine, *arguments)


def expect_same(floor, scan, *kinds):
    """The two sides of a ratio must have met the same things."""
    for kind in kinds:
        if floor[kind] != scan[kind]:
            raise Failure(f"scan_probe: {scan[kind]} {kind} where the floor meets {floor[kind]}")


def in_turn(rounds, *sides):
    """Runs the sides one after the other, rounds times; the order alternates. Answers one tuple a round."""
    results = []
    for number in range(rounds):
        order = range(len(sides)) if number % 2 == 0 else reversed(range(len(sides)))
        taken = {index: sides[index]() for index in order}
        results.append(tuple(taken[index] for index in range(len(sides))))
    return results


def median_ratio(pairs, key):
    return statistics.median(above[key] / below[key] for above, below in pairs)


class Row:
    def __init__(self, title, value, target, shown="{:.2f}"):
        self.title = title
        self.value = shown.format(value)
        self.target = "" if target is None else "at most " + shown.format(target)
        self.met = target is None or value <= target
        self.verdict = "" if target is None else "met" if self.met else "MISSED"

    def cells(self):
        return self.title, self.value, self.target, self.verdict


class UnmeasuredRow(Row):
    """What this machine cannot show, and why."""

    def __init__(self, title, target, reason, shown="{:.2f}"):
        super().__init__(title, 0, target, shown)
        self.value = "not measured"
        self.verdict = reason


def machine_line(rounds):
    return (f"{os.cpu_count()} processors ({platform.machine()}), {platform.system()} {platform.release()}, "
            f"medians of {rounds} rounds.")


def text_table(rows):
    cells = [("ratio", "measured", "target", "verdict")] + [row.cells() for row in rows]
    widths = [max(len(line[column]) for line in cells) for column in range(4)]
    for title, value, target, verdict in cells:
        yield f"{title:<{widths[0]}}  {value:>{widths[1]}}  {target:<{widths[2]}}  {verdict}".rstrip()


def markdown_table(rows):
    yield "| ratio | measured | target | verdict |"
    yield "|---|---:|---|---|"
    for row in rows:
        yield "| " + " | ".join(row.cells()) + " |"


def write_markdown(readme, name, rows, rounds):
    """Puts a table between the two marks that README.md holds for it."""
    begin, end = f"<!-- {name} begin -->", f"<!-- {name} end -->"
    before, found, rest = readme.read_text(encoding="utf-8").partition(begin)
    if not found:
        raise Failure(f"{readme.name}: no place for the table of {name}")
    table = "\n".join([machine_line(rounds), "", *markdown_table(rows)])
    readme.write_text(f"{before}{begin}\n{table}\n{end}{rest.partition(end)[2]}", encoding="utf-8")

#!/usr/bin/env python3
"""Compares what `ombrix` prints on generated machines with what the model works out.

check.py --ombrix PROGRAM --seeds 1..60

A difference is printed with its seed; `--keep` leaves that machine's folder in place.
"""

import argparse
import json
import os
import random
import re
import shutil
import stat
import subprocess
import sys
import tempfile
import time

sys.dont_write_bytecode = True  # nothing is left behind in the sources

import explained
import faulty
from files import Description
from machine import Machine
from model import PLUGIN_IDENTIFIER, Model
from records import ROOT, Group

NOBODY = 65534
TIME_ZONES = ["UTC0", "EAST-14", "WEST+12", "HALF-5:30", "SUMMER+8LIGHT,M3.2.0,M11.1.0"]
LONGEST_RUN = 300


class Difference(Exception):
    pass


def kind_of(value):
    if isinstance(value, bool) or value is None:
        return str(value)
    return "number" if isinstance(value, (int, float)) else type(value).__name__


def short(value):
    text = json.dumps(value)
    return text if len(text) < 300 else text[:300] + " ..."


def compare(expected, got, place="$"):
    """Raises at the first place where two documents differ."""
    if kind_of(expected) != kind_of(got):
        raise Difference(f"{place}: expected {short(expected)}, got {short(got)}")
    if isinstance(expected, dict):
        missing, extra = sorted(expected.keys() - got.keys()), sorted(got.keys() - expected.keys())
        if missing or extra:
            raise Difference(f"{place}: missing keys {missing}, unexpected keys {extra}")
        for key in expected:
            compare(expected[key], got[key], f"{place}.{key}")
    elif isinstance(expected, list):
        for index, (one, other) in enumerate(zip(expected, got)):
            compare(one, other, f"{place}[{index}]")
        if len(expected) != len(got):
            rest = (expected if len(expected) > len(got) else got)[min(len(expected), len(got))]
            raise Difference(f"{place}: expected {len(expected)} items, got {len(got)}; "
                             f"the first too few or many: {short(rest)}")
    elif isinstance(expected, float) or isinstance(got, float):
        if abs(expected - got) > 1e-12 * max(abs(expected), 1e-300):
            raise Difference(f"{place}: expected {expected!r}, got {got!r}")
    elif expected != got:
        raise Difference(f"{place}: expected {short(expected)}, got {short(got)}")


def without_doubles(pairs):
    document = dict(pairs)
    if len(document) != len(pairs):
        raise ValueError("a key twice: %s" % [key for key, _ in pairs])
    return document


def no_constant(name):
    raise ValueError("not strict JSON: " + name)


def document(command, printed):
    try:
        return json.loads(printed.decode("utf-8"), object_pairs_hook=without_doubles, parse_constant=no_constant)
    except ValueError as error:
        raise Difference(f"{command}: {error}\n{printed[:400]!r}") from None


class Checker:
    def __init__(self, options, seed):
        self.options = options
        self.random = random.Random(f"check {seed}")
        self.zone = TIME_ZONES[seed % len(TIME_ZONES)]

    def run(self, machine_file, *arguments, given=None, **variables):
        """Exit status, standard output and standard error. `given` is what standard input holds."""
        environment = {key: value for key, value in os.environ.items()
                       if not key.startswith(("LC_", "LANG", "XDG_", "OMBRIX_", "CLICOLOR")) and key != "NO_COLOR"}
        environment.update(LC_ALL="C", TZ=self.zone, HOME="/nonexistent", **variables)
        place = [b"--machine", os.fsencode(machine_file)]
        words = [os.fsencode(word) for word in arguments]
        words = place + words if self.random.random() < 0.5 else words + place
        done = subprocess.run([os.fsencode(self.options.ombrix)] + words, env=environment, input=given or b"",
                              capture_output=True, timeout=LONGEST_RUN, check=False)
        return done.returncode, done.stdout, done.stderr

    def expect(self, status, done, command):
        if done[0] != status:
            raise Difference(f"{command}: exit status {done[0]} instead of {status}\n"
                             f"{done[2][:1000].decode(errors='replace')}")

    def expect_document(self, expected, machine_file, *command):
        done = self.run(machine_file, *command, "--json")
        self.expect(0, done, command)
        try:
            compare(expected, document(command, done[1]))
        except Difference as difference:
            raise Difference(f"{command}: {difference}") from None

    def expect_refusal(self, machine_file, *command):
        """Status 1, nothing printed, and one line that says who could not do what; answers that line."""
        done = self.run(machine_file, *command)
        self.expect(1, done, command)
        lines = done[2].decode("utf-8", "replace").splitlines()
        if done[1] or len(lines) != 1 or not re.match(r"ombrix: .+", lines[0]):
            raise Difference(f"{command}: standard output {done[1][:200]!r}, standard error {done[2][:600]!r}")
        return lines[0]

    # One machine.

    def check_machine(self, machine):
        self.check_preferences(machine)
        model = Model(Description(machine.file), machine.movies)
        self.expect_document(model.paths(), machine.file, "paths")
        self.expect_document(model.info(), machine.file, "info")
        self.check_log(model, machine)
        if not model.can_load():
            self.check_explanations(model, machine, Group(ROOT, "", b"", None, ""))
            for command in (["tree"], ["groups"], ["objects", "--group", "Montaro"], ["message", "--group", "Montaro"]):
                self.expect_refusal(machine.file, *command)
            return
        root = model.load()
        self.expect_document(root.printed(model.files), machine.file, "tree")
        self.expect_document([group.printed(model.files, with_children=False) for group in model.flat_groups()],
                             machine.file, "groups")
        self.check_parts(model, machine, root)
        self.check_explanations(model, machine, root)

    def check_explanations(self, model, machine, root):
        """Every path there is, in one run: one document a line, and none that differs from the tree."""
        places = explained.Places(root)
        paths = explained.interesting_paths(model, machine, places, self.random)
        done = self.run(machine.file, "explain", "-0", "-", "--json", given=b"\0".join(paths))
        self.expect(0, done, "explain")
        lines = done[1].split(b"\n")
        if len(lines) != len(paths) + 1 or lines[-1]:
            raise Difference(f"explain: {len(paths)} paths, {len(lines) - 1} lines")
        for path, line in zip(paths, lines):
            answer = document(("explain", path), line)
            fault = explained.fault_of(answer, path, *places.of(path), model.can_load())
            if fault:
                raise Difference(f"explain {path!r}: {fault}\n{json.dumps(answer, indent=1)}")

    def check_log(self, model, machine):
        _, _, log = self.run(machine.file, "info", OMBRIX_LOG="2")
        editor = model.description.editor
        text = (b"OBMBMontaroPlugin -- getAppPath -- could not find Montaro Application" if editor is None
                else b"appInstalled: OS told me: " + editor)
        if text not in log:
            raise Difference(f"info with logging: {text!r} is not in {log[:600]!r}")

    def check_preferences(self, machine):
        """The same machine with other preferences, a few times over; the last ones stay."""
        if machine.preferences is None or not os.access(machine.preferences, os.W_OK):
            return
        for _ in range(3):
            machine.write_preferences()
            self.expect_document(Model(Description(machine.file), {}).info(), machine.file, "info")

    def check_parts(self, model, machine, root):
        """Single groups: by their IDs, by a name, and one that is not there."""
        groups = list(root.depth_first())
        chosen = self.random.sample(groups, min(4, len(groups)))
        empty = [group for group in groups if model.has_message(group)]
        for wanted in chosen + empty[:1] + [root, root.children[-1]]:
            group = next(each for each in groups if each.identifier == wanted.identifier)
            self.expect_document([each.printed(model.files) for each in group.media_objects()],
                                 machine.file, "objects", "--group", group.identifier)
            done = self.run(machine.file, "message", "--group", group.identifier)
            self.expect(0, done, ("message", group.identifier))
            if bool(done[1].strip()) != model.has_message(group) or b"MTProjectNotReady" in done[1]:
                raise Difference(f"message of {group.identifier!r}: {done[1]!r}")
        for wanted in chosen[:2]:
            word = self.random.choice([wanted.identifier, os.fsencode(wanted.name)])
            if word.startswith(b"-") or not word:
                continue
            group = next((each for each in groups if each.identifier == word), None)
            group = group or next(each for each in groups if os.fsencode(each.name) == word)
            self.expect_document(group.printed(model.files), machine.file, "tree", word)
        for command in (["objects", "--group"], ["message", "--group"], ["tree"]):
            self.expect_refusal(machine.file, *command, "/no such group")

    # Once for all machines.

    def check_usage(self, machine):
        for words in (["no-such-command"], ["tree", "--no-such-option"]):
            done = self.run(machine.file, *words)
            self.expect(2, done, words)
            if done[1] or not done[2]:
                raise Difference(f"{words}: {done!r}")
        done = self.run(machine.file, "plugins", "--json")
        self.expect(0, done, "plugins")
        found = document("plugins", done[1])
        for each in found:
            if set(each) != {"identifier", "version", "path", "loaded", "reason"}:
                raise Difference(f"plugins: {each}")
        if not any(each["identifier"] == PLUGIN_IDENTIFIER and each["loaded"] is True for each in found):
            raise Difference(f"plugins: {found}")

    def check_faulty(self, folder):
        for number, (text, line, key) in enumerate(faulty.descriptions(self.random)):
            file = os.path.join(folder, f"faulty{number}.json")
            with open(file, "wb") as stream:
                stream.write(text)
            try:
                said = self.expect_refusal(file, self.random.choice(["tree", "groups", "paths", "info"]))
            except Difference as difference:
                raise Difference(f"faulty description {text[:1000]!r}: {difference}") from None
            rest = said.replace(file, "").replace(os.path.basename(file), "")
            told = os.path.basename(file) in said and (line is None or re.search(rf"\b{line}\b", rest))
            if not told or (key and key not in rest):
                raise Difference(f"faulty description {text[:1000]!r}: not line {line} and key {key!r} in {said!r}")
        self.expect_refusal(os.path.join(folder, "absent.json"), "tree")


def can_run_as_nobody(program):
    """Whether a user without rights can start the program, so that unreadable folders can be checked."""
    if os.geteuid() != 0:
        return False
    try:
        return subprocess.run([program, "--version"], user=NOBODY, group=NOBODY, extra_groups=[], check=False,
                              capture_output=True, timeout=LONGEST_RUN).returncode == 0
    except OSError:
        return False


def remove(folder):
    """Also what its owner may not list: walking down, each folder is opened before it is entered."""
    for base, folders, _ in os.walk(os.fsencode(folder)):
        for name in folders:
            path = os.path.join(base, name)
            if not os.path.islink(path):
                os.chmod(path, stat.S_IRWXU)
    shutil.rmtree(os.fsencode(folder))


def in_child(as_nobody, work):
    """Runs the work in a process of its own, which may give up its rights; true when nothing differed."""
    sys.stdout.flush()
    child = os.fork()
    if child:
        return os.waitstatus_to_exitcode(os.waitpid(child, 0)[1]) == 0
    status = 1
    try:
        if as_nobody:
            os.setgroups([])
            os.setgid(NOBODY)
            os.setuid(NOBODY)
        work()
        status = 0
    except Difference as difference:
        print(difference)
    except BaseException:  # the child must not return into its parent's code
        import traceback
        traceback.print_exc(file=sys.stdout)
    finally:
        sys.stdout.flush()
        os._exit(status)


def check_seed(options, seed, first, nobody):
    folder = os.path.realpath(tempfile.mkdtemp(prefix=f"ombrix-model-{seed}-"))
    os.chmod(folder, 0o755)
    checker = Checker(options, seed)
    os.environ["TZ"] = checker.zone
    time.tzset()
    try:
        machine = Machine(random.Random(seed), folder)

        def work():
            checker.check_machine(machine)
            if first:
                checker.check_usage(machine)

        good = in_child(nobody and seed % 3 == 0, work)
        if good and (first or seed % 10 == 0):
            good = in_child(False, lambda: checker.check_faulty(folder))
        if not good:
            print(f"seed {seed}, TZ={checker.zone}" + (f", machine {machine.file}" if options.keep else ""))
        return good
    finally:
        if not options.keep:
            remove(folder)


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--ombrix", required=True)
    parser.add_argument("--seeds", default="1..60")
    parser.add_argument("--keep", action="store_true")
    options = parser.parse_args()
    options.ombrix = os.path.abspath(options.ombrix)
    start, _, end = options.seeds.partition("..")
    seeds = range(int(start), int(end or start) + 1)
    nobody = can_run_as_nobody(options.ombrix)
    for seed in seeds:
        if not check_seed(options, seed, seed == seeds[0], nobody):
            print(f"{seed - seeds[0] + 1} machines, 1 difference")
            return 1
    print(f"{len(seeds)} machines, 0 differences")
    return 0


if __name__ == "__main__":
    sys.exit(main())

#!/usr/bin/env python3
"""Copies with `ombrix export --clipboard`, and pastes with programs that know nothing of it.

check.py DISPLAY PROGRAM

DISPLAY is "none", "x" or "wayland". Ends with 77 where what the display needs is not installed.
"""

import os
import shutil
import signal
import sys

sys.dont_write_bytecode = True  # nothing is left behind in the sources

import exporting
from desktop import Compositor, XServer, check, check_equal, need, run
from exporting import Exporter

# On X the toolkit offers a text under its older names as well, and a list of files as one browser likes it.
NAMES_OF_THE_TOOLKIT = {"UTF8_STRING", "STRING", "TEXT", "text/x-moz-url", "TARGETS", "MULTIPLE", "TIMESTAMP",
                        "SAVE_TARGETS"}


def check_x(exporter):
    need("Xvfb", "xclip")
    log = os.path.join(exporter.folder, "xserver.log")
    with XServer(exporter.environment, log) as display:
        exporting.check_everything(exporter, display)
        check_equal(set(display.types()) - NAMES_OF_THE_TOOLKIT, set(exporting.TYPES), "types")
        exporting.check_detached(exporter, display)
        exporting.check_taken_over(exporter, display)
        # A compositor that is gone does not keep anybody from the X display beside it.
        exporter.export({**display.environment, "WAYLAND_DISPLAY": "/nonexistent"}, "--group", exporter.project)
        display.signal(signal.SIGSTOP)
        try:
            exporting.check_silent(exporter, display.environment)
        finally:
            display.signal(signal.SIGCONT)
        exporting.check_left_alone(exporter, display)
        exporting.check_display_goes(exporter, display)


def check_wayland(exporter):
    need("Xvfb", "weston", "wl-copy", "wl-paste")
    log = os.path.join(exporter.folder, "xserver.log")
    with XServer(exporter.environment, log) as x_server, \
            Compositor(x_server, exporter.folder, os.path.join(exporter.folder, "compositor.log")) as display:
        exporting.check_everything(exporter, display)
        check_equal(display.types(), exporting.TYPES, "types")
        exporting.check_detached(exporter, display)
        exporting.check_taken_over(exporter, display)
        exporting.check_left_alone(exporter, display)
        exporting.check_display_goes(exporter, display)


def check_none(exporter):
    line, _ = exporter.refusal(exporter.environment)
    check_equal(line, "ombrix: clipboard: there is no display (neither DISPLAY nor WAYLAND_DISPLAY is set)", "no display")
    line, _ = exporter.refusal({**exporter.environment, "DISPLAY": ":65000"})
    check_equal(line, "ombrix: clipboard: the display :65000 cannot be opened", "an absent display")
    silent = exporting.silent_socket(exporter.folder)
    with silent:
        exporting.check_silent(exporter, {**exporter.environment, "WAYLAND_DISPLAY": silent.getsockname()})
    check_other_helpers(exporter)
    check_toolkit(exporter)


def check_other_helpers(exporter):
    """Beside a program that offers nothing, or is not there, the command fails by itself."""
    programs = os.path.join(exporter.folder, "elsewhere/bin")
    os.makedirs(programs)
    os.symlink(os.path.join(os.path.dirname(exporter.ombrix), "../lib"), os.path.join(exporter.folder, "elsewhere/lib"))
    program = shutil.copy(exporter.ombrix, programs)
    helper = os.path.join(programs, exporting.HELPER)
    environment = {**exporter.environment, "DISPLAY": ":65000"}
    line, _ = exporter.refusal(environment, program=program)
    check(line.startswith(f"ombrix: {helper}: ") and "not installed" in line and "qt6-base-dev" in line, line)
    for script, ending in (("exit 0", "libqt6gui6)"), ("printf o; exec cat >&2", " did not hand it over within 2 seconds")):
        with open(helper, "w", encoding="utf-8") as file:
            file.write("#!/bin/sh\n" + script + "\n")
        os.chmod(helper, 0o700)
        line, _ = exporter.refusal(environment, program=program)
        check(line.endswith(ending), line)


def check_toolkit(exporter):
    """The toolkit costs the one program that offers, and no other."""
    folder = os.path.dirname(exporter.ombrix)
    linking = set()
    for name in os.listdir(folder):
        listed = run(["ldd", os.path.join(folder, name)], exporter.environment)
        if b"libQt" in listed.stdout or b"libwayland" in listed.stdout:
            linking.add(name)
    check_equal(linking, {exporting.HELPER}, "programs that link the toolkit")


def main():
    kind, program = sys.argv[1:]
    with exporting.machine_folder() as folder:
        exporter = Exporter(program, folder)
        try:
            {"none": check_none, "x": check_x, "wayland": check_wayland}[kind](exporter)
            exporter.no_helper_stays()
        finally:
            exporter.check_reports()


if __name__ == "__main__":
    main()

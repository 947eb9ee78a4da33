#!/usr/bin/env python3
"""The model against cases whose answers are written down by hand."""

import functools
import json
import os
import plistlib
import random
import shutil
import sys
import tempfile
import time
import unittest

sys.dont_write_bytecode = True  # nothing is left behind in the sources

import check
import explained
import movie
import preferences
import reader
from files import Description, birth_time, split_extension
from model import Model, compare_names, merge_sort, newest_first, oldest_first
from records import NEWEST, OLDEST, YEAR, Date, Group, MediaObject, printed_date, printed_text


def seconds(year, month=1, day=1):
    return int(time.mktime((year, month, day, 12, 0, 0, 0, 0, -1))) * 10**9


class OnMachine(unittest.TestCase):
    """A machine with a home folder; each test adds what it needs and loads."""

    def setUp(self):
        self.folder = os.path.realpath(tempfile.mkdtemp(prefix="ombrix-selftest-"))
        self.addCleanup(shutil.rmtree, self.folder)
        self.movies = {}
        self.said = {"home": "home", "editor": {"path": self.folder}}
        self.projects = "home/Movies/Montaro Projects"
        self.events = "home/Movies/Montaro Events"

    def path(self, *parts):
        return os.path.join(self.folder, *parts)

    def make(self, *parts):
        os.makedirs(self.path(*parts), exist_ok=True)
        return self.path(*parts)

    def file(self, *parts, date=None):
        self.make(*parts[:-1])
        with open(self.path(*parts), "wb"):
            pass
        if date is not None:
            os.utime(self.path(*parts), ns=(date, date))

    def project(self, *parts, movies=()):
        self.file(*parts, "CurrentVersion.mtrproject")
        for name, size in movies:
            self.file(*parts, "Shared Items", name)
            self.movies[os.fsencode(self.path(*parts, "Shared Items", name))] = (size, 2.0)

    def event(self, name, clips, folder=None):
        self.file(folder or self.events, name, "CurrentVersion.mtrevent")
        for clip, date in clips:
            self.file(folder or self.events, name, "Original Media", clip, date=date)

    def model(self):
        file = self.path("machine.json")
        with open(file, "w", encoding="utf-8") as stream:
            json.dump(self.said, stream)
        return Model(Description(file), self.movies)

    def load(self):
        model = self.model()
        return model, model.load()

    def store(self, domain, values):
        with open(os.path.join(self.make("home/Library/Preferences"), domain + ".plist"), "wb") as stream:
            plistlib.dump(values, stream)


class SearchPaths(OnMachine):
    def test_home_then_volumes_by_display_name_then_boot_then_media_by_path(self):
        self.said = {"home": "/Users/ann",
                     "localVolumes": [{"path": "/"}, {"path": "/Volumes/Data 1", "displayName": "Data"},
                                      {"path": "/Network"},
                                      {"path": "/Network/Servers"}, {"path": "/Volumes/Stick"}],
                     "removableMedia": [{"path": "/Volumes/Stick"}]}
        self.assertEqual(self.model().paths()["projects"], [
            "/Users/ann/Movies/Montaro Projects", "/Volumes/Data/Montaro Projects", "/Volumes/Servers/Montaro Projects",
            "/Volumes/Stick/Montaro Projects", "/Montaro Projects", "/Volumes/Stick/Montaro Projects"])

    def test_without_a_home_folder_the_list_begins_with_the_volumes(self):
        self.said = {"home": None}
        self.assertEqual(self.model().paths(), {"projects": ["/Montaro Projects"], "events": ["/Montaro Events"]})


class Projects(OnMachine):
    def test_projects_and_folders_with_their_parents(self):
        self.project(self.projects, "Trip.x")
        self.project(self.projects, "Old", "Inner")
        model, root = self.load()
        shown = {group.name: group for group in root.children}
        library = os.fsencode(self.path(self.projects))
        self.assertEqual(set(shown), {b"Trip", b"Old", b"Events"})
        self.assertEqual(shown[b"Trip"].parent, library)
        self.assertEqual((shown[b"Old"].kind, shown[b"Old"].parent), ("OBMontaroFolderGroupTypeIdentifier", library))
        self.assertEqual({group.name for group in model.flat_projects if group.path.startswith(library)},
                         {b"Trip", b"Inner"})
        self.assertTrue(model.has_message(shown[b"Trip"]))

    def test_missing_default_folder_gives_a_placeholder_that_is_its_own_parent(self):
        model, root = self.load()
        placeholder = model.flat_projects[0]
        self.assertEqual(placeholder.kind, "OBMontaroProjectLibraryGroupTypeIdentifier")
        self.assertEqual((placeholder.parent, placeholder.date), (placeholder.identifier, None))
        self.assertEqual(model.flat_projects[1].kind, "OBMontaroFolderGroupTypeIdentifier")
        self.assertEqual([child.name for child in root.children], [b"Events"])
        self.assertFalse(model.has_message(root))

    def test_an_empty_folder_is_shown_and_has_a_placeholder(self):
        self.make(self.projects, "Empty")
        model, root = self.load()
        self.assertEqual(root.children[0].name, b"Empty")
        self.assertEqual([group.name for group in model.flat_projects], [b"Empty", b"Montaro Projects"])

    def test_hidden_items_and_packages_stay_out_and_links_are_no_folders(self):
        self.project(self.projects, ".hid")
        self.project(self.projects, "Listed")
        self.project(self.projects, "Some.APP", "Inner")
        self.project(self.projects, "Other.app")
        self.project("store")
        os.symlink(self.path("store"), self.path(self.projects, "link"))
        os.symlink(self.path("home"), self.path(self.projects, "folder"))
        with open(self.path(self.projects, ".hidden"), "wb") as stream:
            stream.write(b"Listed\nNo")
        _, root = self.load()
        self.assertEqual({group.name for group in root.children}, {b"Other", b"link", b"Events"})

    def test_a_marker_that_leads_nowhere_makes_no_project(self):
        os.symlink("gone", os.path.join(self.make(self.projects, "Trip"), "CurrentVersion.mtrproject"))
        self.assertEqual(self.load()[1].children[0].kind, "OBMontaroFolderGroupTypeIdentifier")

    def test_a_folder_that_cannot_be_listed_is_read_without_localized(self):
        self.project(self.projects, "Area", "Trip")
        model = self.model()
        group = model.project_folder(os.fsencode(self.path(self.projects, "Area.localized")))
        self.assertEqual((group.name, len(group.children)), (b"Area.localized", 1))
        self.assertEqual(group.children[0].parent, os.fsencode(self.path(self.projects, "Area")))

    def test_a_key_over_a_real_folder_is_a_link(self):
        self.project(self.projects, "Keyed", "Inner")
        self.project("store")
        self.said["links"] = {self.path(self.projects, "Keyed"): "store"}
        model, root = self.load()
        self.assertEqual(root.children[0].kind, "OBMontaroProjectGroupTypeIdentifier")
        self.said["links"] = {self.path(self.projects, "Keyed"): "home"}
        self.assertEqual([child.name for child in self.load()[1].children], [b"Events"])


class Movies(OnMachine):
    def test_only_four_extensions_in_lower_case(self):
        names = ["clip.MOV", "notes.txt", "x.3gp", ".hid.mov", ".mov", "..mov", "a.mov."]
        self.project(self.projects, "Trip", movies=[(name, None) for name in names])
        self.make(self.projects, "Trip", "Shared Items", "folder.mov")
        objects = self.load()[1].children[0].own_objects
        self.assertEqual({each.name for each in objects}, {b"x", b".hid", b".", b"folder"})

    def test_the_widest_movie_stands_for_the_project_and_the_first_of_equal_ones(self):
        self.project(self.projects, "Trip", movies=[("a.mov", (1280.0, 1088.0)), ("b.m4v", (1920.0, 720.0)),
                                                    ("d.mov", None)])
        model, root = self.load()
        chosen = root.own_objects[0]
        self.assertTrue(chosen.path.endswith(b"b.m4v"))
        self.assertEqual(chosen.attributes["Project Path"], os.fsencode(self.path(self.projects, "Trip")))
        self.assertEqual(chosen.attributes["Project Format Version"], "6")
        project = Group("", "", b"", b"", "")
        project.path = b"/p"
        for name, size in (("a", (10.0, 1.0)), ("b", (20.0, 1.0)), ("c", (20.0, 9.0))):
            place = self.path(name)
            self.file(name)
            model.movies[os.fsencode(place)] = (size, None)
            project.own_objects.append(MediaObject(name, os.fsencode(place), "", None, {}))
        self.assertTrue(model.representatives(project, {})[0].path.endswith(b"/b"))

    def test_a_folder_collects_its_projects_and_those_below(self):
        self.project(self.projects, "F", "One", movies=[("a.mov", (1.0, 1.0))])
        self.project(self.projects, "F", "G", "Two", movies=[("a.mov", (1.0, 1.0))])
        _, root = self.load()
        folder = root.children[0]
        self.assertEqual({each.name for each in folder.own_objects}, {b"One", b"Two"})
        self.assertNotIn("Project Format Version", folder.own_objects[0].attributes)
        self.assertEqual(root.own_objects, folder.own_objects)

    def test_a_folder_without_representatives_answers_what_lies_below(self):
        self.project(self.projects, "F", "One", movies=[("a.mov", None)])
        _, root = self.load()
        self.assertEqual(root.children[0].own_objects, [])
        self.assertEqual([each.name for each in root.own_objects], [b"a"])


class Events(OnMachine):
    def load_events(self, newest):
        self.store("org.ombrix.Montaro", {preferences.ORDER_KEY: newest})
        model, root = self.load()
        return model, root.children[-1]

    def test_the_year_is_that_of_the_extreme_clip(self):
        self.event("Trip.mtrevent", [("a.mov", seconds(2010)), ("b.mov", seconds(2012))])
        for newest, year in ((False, 2010), (True, 2012)):
            _, library = self.load_events(newest)
            event = library.children[0].children[0]
            self.assertEqual((library.children[0].name, event.name), (b"%d" % year, b"Trip.mtrevent"))
            self.assertEqual((event.attributes[OLDEST], event.attributes[NEWEST]), (seconds(2010), seconds(2012)))

    def test_within_one_year_the_first_clip_listed_dates_both_ends(self):
        self.event("Trip", [("a.mov", seconds(2011, 3, 3)), ("b.mov", seconds(2011, 1, 1))])
        _, library = self.load_events(True)
        attributes = library.children[0].children[0].attributes
        first = os.listdir(self.path(self.events, "Trip", "Original Media"))[0]
        date = seconds(2011, 3, 3) if first == "a.mov" else seconds(2011, 1, 1)
        self.assertEqual((attributes[OLDEST], attributes[NEWEST]), (date, date))

    def test_an_event_without_clips_is_in_the_flat_list_only(self):
        self.event("Trip", [(".a.mov", 0)])
        self.make(self.events, "Trip", "Original Media", "folder")
        model, library = self.load_events(True)
        self.assertEqual((len(model.flat_events), library.children), (1, []))

    def test_a_link_becomes_a_clip_at_its_target(self):
        self.file("store", "movie.mov", date=seconds(2005))
        os.symlink(self.path("store", "movie.mov"), os.path.join(self.make(self.events, "Trip", "Original Media"), "x"))
        self.event("Trip", [])
        _, library = self.load_events(True)
        self.assertEqual(library.children[0].children[0].own_objects[0].path,
                         os.fsencode(self.path("store", "movie.mov")))

    def test_undated_clips_end_in_year_zero_or_minus_one(self):
        for name in ("One", "Two"):
            os.symlink("gone.mov", os.path.join(self.make(self.events, name, "Original Media"), "x.mov"))
            self.event(name, [])
        _, library = self.load_events(True)
        self.assertEqual([(each.name, each.attributes) for each in library.children], [(b"0", {}), (b"0", {})])
        _, library = self.load_events(False)
        self.assertEqual([(each.name, each.attributes) for each in library.children], [(b"-1", {YEAR: -1})])

    def test_a_link_to_a_hidden_name_that_is_gone_is_a_clip(self):
        os.symlink("/nowhere/.gone.mov", os.path.join(self.make(self.events, "Trip", "Original Media"), "x.mov"))
        self.event("Trip", [])
        model, _ = self.load_events(True)
        self.assertEqual([clip.name for clip in model.flat_events[0].own_objects], [b".gone"])

    def test_a_date_to_come_gives_way_to_the_day_the_file_was_made(self):
        self.event("Trip", [("a.mov", seconds(2100))])
        model, library = self.load_events(True)
        born = birth_time(os.fsencode(self.path(self.events, "Trip", "Original Media", "a.mov")))
        year = 2100 if born is None else time.localtime(born // 10**9).tm_year
        self.assertEqual(library.children[0].attributes[YEAR], year)

    def test_a_folder_searched_twice_gives_its_events_twice(self):
        self.said["localVolumes"] = self.said["removableMedia"] = [{"path": "/Volumes/Stick"}]
        self.said["links"] = {"/Volumes/Stick": "stick"}
        self.event("Trip", [("a.mov", seconds(2000))], "stick/Montaro Events")
        _, library = self.load_events(True)
        self.assertEqual([each.identifier for each in library.children[0].children],
                         [b"/Volumes/Stick/Montaro Events/Trip"] * 2)
        self.assertEqual(library.children[0].children[0].own_objects[0].path,
                         os.fsencode(self.path("stick/Montaro Events/Trip/Original Media/a.mov")))


class Ordering(unittest.TestCase):
    @staticmethod
    def event(name, year=None, oldest=None, newest=None):
        group = Group("", name, b"", b"", "")
        values = {YEAR: year, OLDEST: oldest, NEWEST: newest}
        group.attributes = {key: value for key, value in values.items() if value is not None}
        return group

    def test_years_then_dates_then_names(self):
        one, other = self.event(b"a", 2009, 5, 5), self.event(b"b", 2011, 4, 4)
        self.assertEqual((oldest_first(one, other), newest_first(one, other)), (-1, 1))
        one, other = self.event(b"a", 2010, 5, 60), self.event(b"b", 2010, 3, 40)
        self.assertEqual((oldest_first(one, other), newest_first(one, other)), (1, -1))
        one, other = self.event(b"beta", 2010, 5, 5), self.event(b"Alpha", 2010, 5, 5)
        self.assertEqual((oldest_first(one, other), newest_first(one, other)), (1, 1))

    def test_an_absent_attribute_ends_the_comparison(self):
        for one, other in ((self.event(b"a"), self.event(b"b", 1, 1, 1)),
                           (self.event(b"a", 1, None, 9), self.event(b"b", 1, 1, 1))):
            self.assertEqual((oldest_first(one, other), newest_first(one, other)), (0, 0))

    def test_simple_folding_keeps_sharp_s_apart(self):
        self.assertEqual(compare_names(self.event("\u00c9T\u00c9".encode()), self.event("\u00e9t\u00e9".encode())), 0)
        self.assertNotEqual(compare_names(self.event("stra\u00dfe".encode()), self.event(b"strasse")), 0)
        self.assertEqual(compare_names(self.event("\u1e9e".encode()), self.event("\u00df".encode())), 0)

    def test_sorting_is_stable_and_complete(self):
        numbers = random.Random(1).choices(range(9), k=50)
        pairs = list(enumerate(numbers))
        self.assertEqual(merge_sort(pairs, lambda a, b: a[1] - b[1]),
                         sorted(pairs, key=functools.cmp_to_key(lambda a, b: a[1] - b[1])))


class Preferences(OnMachine):
    def test_the_order(self):
        for value, expected in ((True, True), (False, False), (0, False), (3, True), (0.0, False),
                                (float("nan"), True), ("YES", True),
                                (" -007", True), ("0", False), ("no", False), ("0x1", False), (b"no", True),
                                ([], True)):
            self.store("org.ombrix.Montaro", {preferences.ORDER_KEY: value})
            self.assertIs(self.model().newest_first, expected, value)
        self.store("org.ombrix.Montaro", {})
        self.assertTrue(self.model().newest_first)

    def test_the_thread_priority(self):
        for value, expected in ((1.0, 1.0), (0.0, 0.0), (1.0001, 0.5), (-0.1, 0.5), ("abc", 0.0), ("0x1", 0.0),
                                ("nan", 0.0), ("1e-1x", 0.1),
                                (True, 1.0), (float("nan"), 0.5), ([], 0.5), (".5", 0.5), ("5.", 0.5), ("", 0.0),
                                ("0.5e", 0.5)):
            self.store("org.ombrix.browser", {preferences.PRIORITY_KEY: value})
            self.assertEqual(self.model().info()["loadThreadPriority"], expected, value)


class Places(OnMachine):
    def test_keys_volumes_and_links_lead_on(self):
        self.file("stick", "a")
        os.symlink("/Volumes/Name/a", self.path("link"))
        self.said["localVolumes"] = [{"path": "/mnt/x", "displayName": "Name"}]
        self.said["links"] = {"/mnt/x": "/Other", "/Other": "stick", "/Other/b": "home"}
        files = self.model().files
        self.assertEqual(files.real_path(os.fsencode(self.path("link"))), os.fsencode(self.path("stick/a")))
        self.assertEqual(files.resolve(b"/Volumes/Name/b").path, os.fsencode(self.path("home")))
        self.assertEqual(files.resolve(b"/Volumes/Names/b").state, "gone")

    def test_links_that_lead_nowhere_or_in_circles(self):
        os.symlink("../gone/x", os.path.join(self.make("f"), "nowhere"))
        os.symlink("circle", self.path("f", "circle"))
        os.symlink("f", self.path("g"))
        files = self.model().files
        self.assertEqual(files.resolve(os.fsencode(self.path("g/nowhere"))).path, os.fsencode(self.path("gone/x")))
        circle = files.resolve(os.fsencode(self.path("g/circle")))
        self.assertEqual((circle.path, circle.state), (os.fsencode(self.path("f/circle")), "circle"))


class Texts(unittest.TestCase):
    def test_extensions(self):
        for name, expected in ((b"a.mov", (b"a", b"mov")), (b".mov", (b".mov", None)), (b"a.", (b"a.", None)),
                               (b"..mov", (b".", b"mov")),
                               (b"a.b.", (b"a.b", b"")), (b"a", (b"a", None)), (b"v1.2 final", (b"v1", b"2 final"))):
            self.assertEqual(split_extension(name), expected)

    def test_bytes_that_are_no_text(self):
        self.assertEqual(printed_text(b"a\xe2\x82\xff\xed\xa0\x80"), "a" + "\ufffd" * 6)

    def test_dates(self):
        self.assertEqual(printed_date(Date(1299146400123456789)), "2011-03-03T10:00:00.123456789Z")
        self.assertEqual(printed_date(Date(-1)), "1969-12-31T23:59:59.999999999Z")


class WrittenMovies(unittest.TestCase):
    def test_a_plain_reader_finds_what_was_written(self):
        for seed in range(500):
            data, size, length = movie.good_movie(random.Random(seed))
            self.assertEqual(reader.read(data), (size, length), seed)
            self.assertEqual(reader.read(movie.damaged_movie(random.Random(seed))), (None, None), seed)


class Comparing(unittest.TestCase):
    def test_differences_are_seen(self):
        for one, other in ((1, True), (None, False), ({"a": 1}, {"a": 1, "b": 2}), ([1, 2], [1]), ("a", "b"),
                           (1.5, 1.50001), ([], {}), (0, None)):
            self.assertRaises(check.Difference, check.compare, one, other)
        check.compare({"a": [1, {"b": 2.0}]}, {"a": [1.0, {"b": 2}]})
        self.assertRaises(check.Difference, check.document, "x", b'{"a": NaN}')
        self.assertRaises(check.Difference, check.document, "x", b'{"a": 1, "a": 2}')
        self.assertRaises(check.Difference, check.document, "x", b'"\xff"')


class Explaining(OnMachine):
    def test_a_record_stands_for_its_path_and_for_the_link_that_it_was_made_from(self):
        self.file("store", "real.mov")
        self.event("Coast", [("plain.mov", None)])
        entry = self.path(self.events + "/Coast/Original Media/linked")
        os.symlink(self.path("store/real.mov"), entry)
        places = explained.Places(self.load()[1])
        coast = self.path(self.events + "/Coast")
        real = self.path("store/real.mov")
        objects = [{"group": "Montaro", "path": real}, {"group": coast, "path": real}]
        self.assertEqual(places.of(os.fsencode(real)), ([], objects))
        self.assertEqual(places.of(os.fsencode(entry)), ([], objects))
        self.assertEqual(places.of(os.fsencode(coast)), ([coast], []))
        self.assertEqual(places.of(os.fsencode(self.path("store"))), ([], []))

    def test_faults_are_seen(self):
        def fault(**changes):
            steps = [{"rule": "search folder", "path": "/l", "passed": True, "text": "x"},
                     {"rule": "r", "path": "/l/a", "passed": False, "text": "y"}]
            answer = {"path": "/l/a/b", "listed": False, "groups": [], "objects": [], "steps": steps, "remedy": "z"}
            for key, value in changes.items():
                answer[key] = value(steps) if callable(value) else value
            return explained.fault_of(answer, b"/l/a/b", [], [], True)

        self.assertIsNone(fault())
        self.assertIsNone(fault(remedy=None))
        for changes in ({"path": "/l/a"}, {"listed": True}, {"groups": ["/l/a/b"]}, {"steps": []}, {"remedy": ""},
                        {"remedy": 1}, {"steps": lambda steps: steps[:1]}, {"steps": lambda steps: steps[1:]},
                        {"steps": lambda steps: steps[::-1]}, {"more": 1},
                        {"steps": lambda steps: [steps[0], {**steps[1], "path": "/l/ab"}]},
                        {"steps": lambda steps: [steps[0], {**steps[1], "text": ""}]}):
            self.assertIsNotNone(fault(**changes), changes)


if __name__ == "__main__":
    sys.exit(unittest.main())

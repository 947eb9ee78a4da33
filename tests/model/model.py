"""What a source answers on a described machine, worked out from its files with the plainest code there is."""

import os
import time

import preferences
from files import Files, join, last_component, split_extension, without_last_component
from records import (CALENDAR, DURATION, EVENT, EVENT_LIBRARY, FOLDER, NEWEST, OLDEST, PROJECT, PROJECT_LIBRARY,
                     PROJECT_PATH, RESOLUTION, ROOT, YEAR, Date, Group, MediaObject, printed_text)

PLUGIN_IDENTIFIER = "org.ombrix.OBMontaroPlugin"
EDITOR_IDENTIFIER = "org.ombrix.Montaro"
PROJECTS_FOLDER = b"Montaro Projects"
EVENTS_FOLDER = b"Montaro Events"
PROJECT_MARKER = b"CurrentVersion.mtrproject"
EVENT_MARKER = b"CurrentVersion.mtrevent"
EVENTS_NAME = b"Events"
MOVIE_EXTENSIONS = (b"mov", b"m4v", b"mp4", b"3gp")


def simple_fold(text):
    """Simple case folding, one code point at a time, in no locale."""
    folded = []
    for character in text:
        full = character.casefold()
        if len(full) != 1:
            lower = character.lower()
            full = lower if len(lower) == 1 else character
        folded.append(ord(full))
    return folded


def compare(first, second):
    return (first > second) - (first < second)


def compare_names(first, second):
    return compare(simple_fold(printed_text(first.name)), simple_fold(printed_text(second.name)))


def oldest_first(first, second):
    for key in (YEAR, OLDEST):
        one, other = first.attributes.get(key), second.attributes.get(key)
        if one is None or other is None:
            return 0
        if one != other:
            return compare(one, other)
    return compare_names(first, second)


def newest_first(first, second):
    one, other = first.attributes.get(YEAR), second.attributes.get(YEAR)
    if one is None or other is None:
        return 0
    if one != other:
        return -compare(one, other)
    if first.attributes.get(OLDEST) is None or second.attributes.get(OLDEST) is None:
        return 0
    one, other = first.attributes.get(NEWEST), second.attributes.get(NEWEST)
    if one is not None and other is not None and one != other:
        return -compare(one, other)
    return compare_names(first, second)


def merge_sort(items, comparison):
    """Cut in the middle, rounded down; of two that compare as same, the one of the first part comes first.

    The comparisons of events are not transitive, so the way of sorting decides the order.
    """
    if len(items) < 2:
        return list(items)
    half = len(items) // 2
    first, second = merge_sort(items[:half], comparison), merge_sort(items[half:], comparison)
    merged = []
    while first and second:
        merged.append(second.pop(0) if comparison(first[0], second[0]) > 0 else first.pop(0))
    return merged + first + second


class Model:
    """`movies` tells resolution and duration of each real path that holds a movie; either may be None."""

    def __init__(self, description, movies):
        self.description = description
        self.files = Files(description)
        self.movies = movies
        self.flat_projects = []
        self.flat_events = []
        self.newest_first = preferences.most_recent_event_first(self.files, description.home)

    # Identity, editor and search paths.

    def can_load(self):
        return self.description.editor is not None and self.files.exists(self.description.editor)

    def info(self):
        return {"displayName": "Montaro", "uniqueID": "Montaro", "appPath": printed_text(self.description.editor),
                "appInstalled": self.description.editor is not None, "canLoadData": self.can_load(),
                "applicationVersion": "10.0", "mediaTypesSupported": 4,
                "mostRecentEventFirst": self.newest_first,
                "loadThreadPriority": preferences.load_thread_priority(self.files, self.description.home),
                "supportedPasteboardTypes": [["OBMontaroProjectsPboardType"]], "pluginVersionNumber": 288.2,
                "pluginVersionString": "@(#)PROGRAM:OBMBMontaroPlugin  PROJECT:OBMBMontaroPlugin-288.2.12\n"}

    def default_folder(self, name):
        home = self.description.home
        return None if home is None else home + b"/Movies/" + name

    def search_paths(self, name):
        default = self.default_folder(name)
        paths = [] if default is None else [default]
        for volume in self.description.local_volumes:
            if volume.path not in (b"/", b"/Network"):
                paths.append(b"/Volumes/" + volume.display_name + b"/" + name)
        paths.append(b"/" + name)
        return paths + [join(volume.path, name) for volume in self.description.removable_media]

    def paths(self):
        return {"projects": [printed_text(path) for path in self.search_paths(PROJECTS_FOLDER)],
                "events": [printed_text(path) for path in self.search_paths(EVENTS_FOLDER)]}

    # One load.

    def load(self):
        self.flat_projects, self.flat_events = [], []
        root = Group(ROOT, "Montaro", b"Montaro", None, "smallAppIcon")
        root.dynamic_objects = False
        for path in self.search_paths(PROJECTS_FOLDER):
            root.children += self.project_folder(path).children
        root.children.append(self.event_library())
        for child in root.children:
            if child.kind == PROJECT:
                root.own_objects += self.representatives(child, {"Project Format Version": "6"})
            elif child.kind != PROJECT_LIBRARY:
                root.own_objects += child.media_objects()
        return root

    def flat_groups(self):
        return self.flat_events + self.flat_projects

    @staticmethod
    def has_message(group):
        return group.kind == PROJECT and not group.children and not group.media_objects()

    # Projects.

    def project_folder(self, path):
        files = self.files
        folder = Group(FOLDER, last_component(path), path, without_last_component(path), "projectIcon", path,
                       files.modification_date(path))
        names, listed = files.listing(path), path
        if names is None and split_extension(last_component(path))[1] == b"localized":
            listed = path[:-len(b".localized")]
            names = files.listing(listed)
        for name in names or []:
            entry = join(listed, name)
            if name.startswith(b".") or files.is_invisible(entry):
                continue
            if files.exists(join(entry, PROJECT_MARKER)):
                project = self.project(entry, listed)
                self.flat_projects.append(project)
                folder.children.append(project)
            elif files.is_container(entry) and not files.is_package(entry):
                child = self.project_folder(entry)
                child.parent = folder.identifier
                folder.children.append(child)
        if not folder.children:
            default = listed == self.default_folder(PROJECTS_FOLDER)
            self.flat_projects.append(Group(PROJECT_LIBRARY if default else FOLDER, last_component(listed), listed,
                                            listed, "projectIcon", listed, files.modification_date(listed)))
        self.collect_representatives(folder)
        return folder

    def project(self, path, listed):
        project = Group(PROJECT, split_extension(last_component(path))[0], path, listed, "projectIcon", path,
                        self.files.modification_date(path))
        shared = join(path, b"Shared Items")
        for name in self.files.listing(shared) or []:
            stem, extension = split_extension(name)
            if extension in MOVIE_EXTENSIONS:
                movie = join(shared, name)
                project.own_objects.append(
                    MediaObject(stem, movie, PLUGIN_IDENTIFIER, "projectIcon", {PROJECT_PATH: movie}))
        return project

    def produce_thumbnail(self, movie):
        place = self.files.real_path(movie.path)
        if place is None or not os.access(place, os.R_OK):
            return
        resolution, duration = self.movies.get(place, (None, None))
        if resolution is not None:
            movie.attributes[RESOLUTION] = resolution
        if duration is not None:
            movie.attributes[DURATION] = duration

    def representatives(self, project, more):
        """The project's widest movie as a list of at most one; of equally wide ones the first."""
        chosen = None
        for movie in project.media_objects():
            self.produce_thumbnail(movie)
            size = movie.attributes.get(RESOLUTION)
            if size is not None and (chosen is None or size[0] > chosen.attributes[RESOLUTION][0]):
                chosen = movie
        if chosen is None:
            return []
        attributes = {PROJECT_PATH: project.path, RESOLUTION: chosen.attributes[RESOLUTION],
                      "Project Representative": True, **more}
        return [MediaObject(project.name, chosen.path, PLUGIN_IDENTIFIER, "thumbnail", attributes)]

    def collect_representatives(self, folder):
        for child in folder.children:
            if child.kind == FOLDER:
                folder.own_objects += child.own_objects
            elif child.kind != PROJECT_LIBRARY:
                folder.own_objects += self.representatives(child, {})

    # Events.

    def event_library(self):
        library = Group(EVENT_LIBRARY, EVENTS_NAME, EVENTS_NAME, b"Montaro", "eventIcon")
        found = []
        for path in self.search_paths(EVENTS_FOLDER):
            found += self.events_in(path)
        comparison = newest_first if self.newest_first else oldest_first
        for event in merge_sort(found, comparison):
            year = event.attributes.get(YEAR)
            matches = [each for each in library.children if year is not None and each.attributes.get(YEAR) == year]
            if not matches:
                title = b"%d" % (year or 0)
                calendar = Group(CALENDAR, title, title, b"Montaro", "calendarIcon")
                if year is not None:
                    calendar.attributes[YEAR] = year
                library.children.append(calendar)
                matches = [calendar]
            matches[-1].children.append(event)
        for calendar in library.children:
            calendar.children = merge_sort(calendar.children, comparison)
        return library

    def events_in(self, folder):
        files = self.files
        found = []
        for name in files.listing(folder) or []:
            path = join(folder, name)
            if name.startswith(b".") or files.is_invisible(path) or not files.is_container(path):
                continue
            clips = files.listing(join(path, b"Original Media"))
            if not files.exists(join(path, EVENT_MARKER)) or not clips:
                continue
            event = Group(EVENT, name, path, folder, "eventIcon", path, files.modification_date(path))
            self.flat_events.append(event)
            self.add_clips(event, join(path, b"Original Media"), clips)
            if event.own_objects:
                found.append(event)
        return found

    def add_clips(self, event, folder, names):
        files = self.files
        minimum, maximum, oldest, newest = 9999, 0, None, None
        for name in names:
            if name.startswith(b"."):
                continue
            place = files.resolve(join(folder, name))
            if place.state != "gone" and (files.is_invisible(place.path) or files.is_container(place.path)):
                continue
            clip = MediaObject(split_extension(last_component(place.path))[0], place.path, EDITOR_IDENTIFIER,
                               "smallAppIcon", {PROJECT_PATH: place.path}, join(folder, name))
            date = files.creation_date(place.path) if place.state == "there" else None
            year = -1 if date is None else time.localtime(date // 10**9).tm_year
            if year < minimum:
                minimum, oldest = year, date
            if year > maximum:
                maximum, newest = year, date
            event.own_objects.append(clip)
        if not event.own_objects:
            return
        oldest = newest if oldest is None else oldest
        year = maximum if self.newest_first else minimum
        if not (year >= 1 if self.newest_first else year <= 9998):
            return
        event.attributes[YEAR] = year
        if oldest is not None:
            event.attributes[OLDEST] = Date(oldest)
        if newest is not None:
            event.attributes[NEWEST] = Date(newest)

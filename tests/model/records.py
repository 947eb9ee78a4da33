"""Groups and media objects, and how they are printed."""

import datetime

ROOT = "OBMontaroRootGroupTypeIdentifier"
PROJECT_LIBRARY = "OBMontaroProjectLibraryGroupTypeIdentifier"
PROJECT = "OBMontaroProjectGroupTypeIdentifier"
FOLDER = "OBMontaroFolderGroupTypeIdentifier"
EVENT_LIBRARY = "OBMontaroEventLibraryGroupTypeIdentifier"
EVENT = "OBMontaroEventGroupTypeIdentifier"
CALENDAR = "OBMontaroEventCalendarGroupTypeIdentifier"

RESOLUTION = "OBMediaObjectResolutionKey"
DURATION = "OBMediaObjectDurationKey"
PROJECT_PATH = "Project Path"
YEAR = "MontaroEventCreationYear"
OLDEST = "MontaroEventOldestClipDate"
NEWEST = "MontaroEventNewestClipDate"


class Date(int):
    """Nanoseconds since 1970."""


def printed_text(name):
    """Text as JSON shows it: every byte that is no UTF-8 becomes one replacement character."""
    if name is None or isinstance(name, str):
        return name
    decoded = name.decode("utf-8", "surrogateescape")
    return "".join("\ufffd" if 0xDC80 <= ord(c) <= 0xDCFF else c for c in decoded)


def printed_date(date):
    if date is None:
        return None
    seconds, nanoseconds = divmod(int(date), 10**9)
    moment = datetime.datetime(1970, 1, 1) + datetime.timedelta(seconds=seconds)
    return "%04d-%02d-%02dT%02d:%02d:%02d.%09dZ" % (moment.year, moment.month, moment.day, moment.hour,
                                                   moment.minute, moment.second, nanoseconds)


def printed_value(value):
    if isinstance(value, Date):
        return printed_date(value)
    if isinstance(value, bytes):
        return printed_text(value)
    if isinstance(value, tuple):
        return {"width": value[0], "height": value[1]}
    return value


def printed_attributes(attributes):
    return {key: printed_value(value) for key, value in attributes.items()}


class MediaObject:
    def __init__(self, name, path, source, icon, attributes, entry=None):
        self.name = name
        self.path = path
        self.entry = entry if entry is not None else path  # what the scan found; elsewhere where a link was followed
        self.source = source
        self.icon = icon
        self.attributes = attributes

    def printed(self, files):
        return {"mediaType": 3, "name": printed_text(self.name), "mediaSourceType": 4,
                "sourcePluginIdentifier": self.source, "path": printed_text(self.path),
                "aliasResolvedPath": printed_text(files.real_path(self.path)), "icon": self.icon,
                "attributes": printed_attributes(self.attributes)}


class Group:
    def __init__(self, kind, name, identifier, parent, icon, path=None, date=None):
        self.kind = kind
        self.name = name
        self.identifier = identifier
        self.parent = parent
        self.icon = icon
        self.path = path
        self.date = date
        self.attributes = {}
        self.own_objects = []
        self.children = []
        self.dynamic_objects = True

    def media_objects(self):
        """What was set on the group, else what its descendants hold."""
        if self.own_objects or not self.dynamic_objects:
            return self.own_objects
        return [each for child in self.children for each in child.media_objects()]

    def depth_first(self):
        yield self
        for child in self.children:
            yield from child.depth_first()

    def printed(self, files, with_children=True):
        shown = {"typeIdentifier": self.kind, "name": printed_text(self.name), "ID": printed_text(self.identifier),
                 "parentID": printed_text(self.parent), "icon": self.icon, "path": printed_text(self.path),
                 "modificationDate": printed_date(self.date), "attributes": printed_attributes(self.attributes),
                 "mediaObjects": [each.printed(files) for each in self.own_objects]}
        if with_children:
            shown["childGroups"] = [child.printed(files) for child in self.children]
        return shown

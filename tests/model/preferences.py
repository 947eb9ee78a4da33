"""The two preferences that a source reads, from property lists below the home folder."""

import os
import plistlib
import re

EDITOR = b"org.ombrix.Montaro"
BROWSER = b"org.ombrix.browser"
ORDER_KEY = "ZREventLibraryModule.arrangeEventsByMostRecent"
PRIORITY_KEY = "MediaBrowserThreadPriorityFolderMediaManager"
DEFAULT_PRIORITY = 0.5

TRUE_TEXT = re.compile(r"[ \t\n\v\f\r]*[+-]?0*[YyTt1-9]")
DECIMAL_TEXT = re.compile(r"[ \t\n\v\f\r]*([+-]?(?:[0-9]+\.?[0-9]*|\.[0-9]+)(?:[eE][+-]?[0-9]+)?)")


def stored(files, home, domain, key):
    """The value that a domain stores under a key; None where the file, its list or the key is not there."""
    if home is None:
        return None
    place = files.real_path(home + b"/Library/Preferences/" + domain + b".plist")
    if place is None or not os.path.isfile(place):
        return None
    try:
        with open(place, "rb") as stream:
            values = plistlib.loads(stream.read())
    except Exception:  # whatever is wrong with the file, it reads as absent
        return None
    return values.get(key) if isinstance(values, dict) else None


def most_recent_event_first(files, home):
    value = stored(files, home, EDITOR, ORDER_KEY)
    if isinstance(value, (bool, int, float)):
        return value != 0
    if isinstance(value, str):
        return TRUE_TEXT.match(value) is not None
    return True


def load_thread_priority(files, home):
    value = stored(files, home, BROWSER, PRIORITY_KEY)
    if isinstance(value, str):
        number = DECIMAL_TEXT.match(value)
        value = float(number.group(1)) if number else 0.0
    if not isinstance(value, (bool, int, float)):
        return DEFAULT_PRIORITY
    return float(value) if 0.0 <= value <= 1.0 else DEFAULT_PRIORITY

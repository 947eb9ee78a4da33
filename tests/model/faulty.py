"""Machine descriptions with one fault each."""

GOOD = """{
  "home": "/abs/home",
  "localVolumes": [
    {"path": "/", "displayName": "Boot"},
    {"path": "/Volumes/Stick", "fileSystem": "ext4"}
  ],
  "removableMedia": [
    {"path": "/Volumes/Stick"}
  ],
  "links": {
    "/Volumes/Stick": "/abs/stick"
  },
  "editor": {"path": "/bin/sh"}
}
"""

# What to replace, by what, and the key that the refusal names; the line is that of the replacement.
FAULTS = [
    ('"home"', '"hone"', "hone"),
    ('"localVolumes"', '"volumes"', "volumes"),
    ('"displayName": "Boot"', '"label": "Boot"', "label"),
    ('"fileSystem"', '"filesystem"', "filesystem"),
    ('"editor": {"path"', '"editor": {"program"', "program"),
    ('"editor": {"path": "/bin/sh"}', '"editor": {"path": "/bin/sh", "name": "x"}', "name"),
    ('"/abs/home"', "7", "home"),
    ('"/abs/home"', '["/abs/home"]', "home"),
    ('"Boot"', "true", "displayName"),
    ('"path": "/"', '"path": 1.5', "path"),
    ('"ext4"', "{}", "fileSystem"),
    ('"/abs/stick"', "null", "/Volumes/Stick"),
    ('"/abs/stick"', "12", "/Volumes/Stick"),
    ('{"path": "/bin/sh"}', '"/bin/sh"', "editor"),
    ('{"path": "/bin/sh"}', "[]", "editor"),
    ('{"path": "/bin/sh"}', "{}", "path"),
    ('{"path": "/", "displayName": "Boot"}', '{"displayName": "Boot"}', "path"),
    ('"removableMedia": [', '"removableMedia": ["/x",', "removableMedia"),
]

# A fault of the text itself: what to replace, by what; the line is that of the replacement.
BROKEN = [
    ('"/abs/home",', '"/abs/home"; '),
    ('"Boot"}', '"Boot",}'),
    ('"Boot"', "'Boot'"),
    ('"ext4"', "ext4"),
    ('"ext4"', '"ext4\\q"'),
]

NO_OBJECTS = [b"", b"home", b"[]", b"null", b"\"text\"", b"{} {}", GOOD.encode()[:-4], b"{\"home\": \"\xff\"}",
              b"{" * 100000,
              b"[" * 100000, bytes(100)]


def line_of(text, place):
    return text.count("\n", 0, place) + 1


def descriptions(random):
    """Text, line and key of some faulty descriptions; the line or key is None where it is not told."""
    found = []
    for old, new, key in random.sample(FAULTS, 6):
        place = GOOD.index(old)
        found.append((GOOD.replace(old, new, 1).encode(), line_of(GOOD, place), key))
    for old, new in random.sample(BROKEN, 2):
        found.append((GOOD.replace(old, new, 1).encode(), None, None))
    return found + [(text, None, None) for text in random.sample(NO_OBJECTS, 3)]

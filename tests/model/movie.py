"""Writes small movies of the ISO base media format, together with what a reader must find in them."""

import struct

UNKNOWN_32 = 0xFFFFFFFF
UNKNOWN_64 = 0xFFFFFFFFFFFFFFFF
ROTATIONS = {0: (1, 0, 0, 1), 90: (0, 1, -1, 0), 180: (-1, 0, 0, -1), 270: (0, -1, 1, 0)}


def box(kind, *parts, wide=False, to_end=False):
    """One box; `wide` writes its size in 64 bits, `to_end` says that it reaches to the end of the file."""
    content = b"".join(parts)
    if to_end:
        return struct.pack(">I4s", 0, kind) + content
    if wide:
        return struct.pack(">I4sQ", 1, kind, len(content) + 16) + content
    return struct.pack(">I4s", len(content) + 8, kind) + content


def full_box(kind, version, flags, *parts, **options):
    return box(kind, struct.pack(">I", version << 24 | flags), *parts, **options)


def matrix(rotation):
    a, b, c, d = (value << 16 for value in ROTATIONS[rotation])
    return struct.pack(">9i", a, b, 0, c, d, 0, 0, 0, 1 << 30)


def times(version, *values):
    """Creation and modification time, then the values, all as wide as the version says; None stands for unknown."""
    return b"".join(struct.pack(">Q" if version else ">I", value) for value in (0, 0) + values)


def movie_header(version, timescale, duration):
    if duration is None:
        duration = UNKNOWN_64 if version else UNKNOWN_32
    content = times(version) + struct.pack(">I", timescale) + struct.pack(">Q" if version else ">I", duration)
    rest = struct.pack(">IH10x", 1 << 16, 1 << 8) + matrix(0) + bytes(24) + struct.pack(">I", 3)
    return full_box(b"mvhd", version, 0, content, rest)


def track_header(version, number, duration, width, height, rotation):
    content = times(version) + struct.pack(">I4x", number) + struct.pack(">Q" if version else ">I", duration)
    rest = bytes(8) + struct.pack(">hhH2x", 0, 0, 0) + matrix(rotation)
    return full_box(b"tkhd", version, 7, content, rest, struct.pack(">II", round(width * 65536), round(height * 65536)))


def handler(kind):
    return full_box(b"hdlr", 0, 0, bytes(4), kind, bytes(12), b"handler\0")


def media(version, kind, entry, data_handler):
    header = full_box(b"mdhd", version, 0, times(version), struct.pack(">I", 600),
                      struct.pack(">Q" if version else ">I", 600), struct.pack(">HH", 0x55C4, 0))
    table = box(b"stbl", full_box(b"stsd", 0, 0, struct.pack(">I", 1), entry),
                full_box(b"stts", 0, 0, bytes(4)), full_box(b"stsc", 0, 0, bytes(4)),
                full_box(b"stsz", 0, 0, bytes(8)), full_box(b"stco", 0, 0, bytes(4)))
    description = (full_box(b"vmhd", 0, 1, bytes(8)) if kind == b"vide" else full_box(b"smhd", 0, 0, bytes(4)))
    # Older movies carry a second handler here, for the data; its kind says nothing about the track.
    second = full_box(b"hdlr", 0, 0, b"dhlr", b"alis", bytes(12), b"\0") if data_handler else b""
    references = box(b"dinf", full_box(b"dref", 0, 0, struct.pack(">I", 1), full_box(b"url ", 0, 1)))
    return box(b"mdia", header, handler(kind), box(b"minf", description, second, references, table))


def video_track(random, number, version, stored, shown, pixel_shape, rotation):
    entry = struct.pack(">6xH16xHHIIIH32xHh", 1, stored[0], stored[1], 72 << 16, 72 << 16, 0, 1, 24, -1)
    extra = box(b"avcC", bytes(7)) if random.random() < 0.5 else b""
    if pixel_shape is not None:
        extra += box(b"pasp", struct.pack(">II", *pixel_shape))
    sample = box(random.choice([b"avc1", b"hvc1", b"mp4v", b"apcn"]), entry, extra)
    edits = box(b"edts", full_box(b"elst", 0, 0, bytes(4))) if random.random() < 0.3 else b""
    return box(b"trak", track_header(version, number, 600, shown[0], shown[1], rotation), edits,
               media(version, b"vide", sample, random.random() < 0.3))


def sound_track(random, number, version):
    entry = struct.pack(">6xH8xHH4xI", 1, 2, 16, 48000 << 16)
    return box(b"trak", track_header(version, number, 600, 0, 0, 0),
               media(version, b"soun", box(b"mp4a", entry), random.random() < 0.3))


class Picture:
    """A video track to be written, and the size at which it is shown."""

    def __init__(self, random):
        self.stored = random.choice([(1280, 720), (1920, 1080), (1920, 1088), (720, 576), (1440, 1080), (640, 480),
                                     (1920, 800), (1, 1), (65535, 2)])
        self.rotation = random.choice([0, 0, 0, 90, 180, 270])
        self.pixel_shape = random.choice([None, None, (1, 1), (4, 3), (16, 11), (64, 45), (10, 11)])
        if random.random() < 0.6:
            self.shown = self.stored
            shape = self.pixel_shape or (1, 1)
            width, height = self.stored[0] * shape[0] / shape[1], float(self.stored[1])
        else:
            self.shown = random.choice([(1024.0, 576.0), (853.5, 480.0), (1919.25, 1080.75), (1280.0, 720.5),
                                        (3840.0, 1600.0)])
            width, height = self.shown
        self.size = (height, width) if self.rotation in (90, 270) else (width, height)


def durations(random):
    """The parts that tell a duration: value of `mvhd`, `mehd` box, `sidx` box, and the seconds they add up to."""
    timescale = random.choice([600, 1000, 30000, 90000, 24, 1])
    length = random.choice([1, 1001, 600, 123456789, 90000, 7])
    told = random.choice(["mvhd", "mvhd", "mvhd", "mehd", "sidx", "none"])
    if told == "mvhd":
        fragments = random.random() < 0.2
        return timescale, length, (length + 5 if fragments else None), None, length / timescale
    nothing = random.choice([0, None])
    if told == "mehd":
        return timescale, nothing, length, None, length / timescale
    if told == "sidx":
        scale = random.choice([600, 90000, 48000])
        pieces = [random.randint(1, 10**6) for _ in range(random.randint(1, 4))]
        return timescale, nothing, None, (scale, pieces), sum(pieces) / scale
    return timescale, nothing, None, None, None


def segment_index(random, scale, pieces):
    version = random.choice([0, 1])
    head = struct.pack(">II", 1, scale) + struct.pack(">QQ" if version else ">II", 0, 0)
    references = b"".join(struct.pack(">III", 1000, piece, 1 << 31) for piece in pieces)
    return full_box(b"sidx", version, 0, head, struct.pack(">HH", 0, len(pieces)), references)


def good_movie(random):
    """The bytes of a movie, its resolution and its duration; either may be None."""
    version = random.choice([0, 0, 1])
    timescale, length, whole, index, seconds = durations(random)
    tracks, size = [], None
    for number in range(random.choice([0, 1, 1, 1, 2, 2, 3])):
        if random.random() < 0.7:
            picture = Picture(random)
            size = size or picture.size
            tracks.append(video_track(random, number + 1, version, picture.stored, picture.shown, picture.pixel_shape,
                                      picture.rotation))
        else:
            tracks.append(sound_track(random, number + 1, version))
    extends = b""
    if whole is not None or index is not None:
        parts = [full_box(b"trex", 0, 0, struct.pack(">IIIII", 1, 1, 0, 0, 0))]
        if whole is not None:
            wide = random.choice([0, 1])
            parts.insert(0, full_box(b"mehd", wide, 0, struct.pack(">Q" if wide else ">I", whole)))
        extends = box(b"mvex", *parts)
    parts = [movie_header(version, timescale, length)] + tracks + [extends]
    if random.random() < 0.3:
        parts.insert(1, box(b"udta", bytes(random.choice([0, 4, 100]))))
    return arranged(random, parts, index), size, seconds


def arranged(random, parts, index):
    """The boxes of a file in one of the orders that cameras and programs write."""
    start = random.choice([box(b"ftyp", b"qt  ", bytes(4), b"qt  "), box(b"ftyp", b"isom", bytes(4), b"isom", b"mp42"),
                           b""])
    payload = random.randbytes(random.choice([0, 16, 5000]))
    pieces = [start] if start else [box(b"wide")]
    if random.random() < 0.3:
        pieces.append(box(b"free", bytes(random.choice([0, 32, 2000]))))
    wide = random.random() < 0.25
    if index is not None or random.random() < 0.5:
        pieces.append(box(b"moov", *parts, wide=wide))
        if index is not None:
            pieces.append(segment_index(random, *index))
        pieces.append(box(b"mdat", payload, wide=random.random() < 0.3, to_end=random.random() < 0.2))
    else:
        pieces.append(box(b"mdat", payload, wide=random.random() < 0.3))
        pieces.append(box(b"moov", *parts, wide=wide, to_end=not wide and random.random() < 0.15))
    return b"".join(pieces)


def damaged_movie(random):
    """Bytes in which no reader may find a resolution or a duration."""
    picture = Picture(random)
    track = video_track(random, 1, 0, picture.stored, picture.stored, None, 0)
    start = box(b"ftyp", b"isom", bytes(4))
    header = movie_header(0, 600, 6000)
    whole = start + box(b"mdat", bytes(64)) + box(b"moov", header, track)
    kind = random.randrange(8)
    if kind == 0:
        return b""
    if kind == 1:
        return b"this is no movie\n" * 8
    if kind == 2:
        return random.randbytes(random.choice([3, 7, 8, 100, 4000]))
    if kind == 3:
        return start + box(b"mdat", bytes(64))
    if kind == 4:
        return whole[:-random.randint(1, len(track))]
    if kind == 5:
        return start + box(b"moov", header, struct.pack(">I4s", len(track) + 100, b"trak"), track[8:])
    if kind == 6:
        return start + box(b"moov", header, struct.pack(">I4s", 4, b"trak"), track[8:])
    return start + struct.pack(">I4sQ", 1, b"moov", UNKNOWN_64 - 3) + header + track

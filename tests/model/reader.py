"""Reads resolution and duration of a movie, box by box, without knowing how it was written."""

import struct


class Damaged(Exception):
    pass


def boxes(data, start, end, top=False):
    """The boxes between two offsets as kind -> list of (start, end) of their contents, in order of the file."""
    found = []
    while start < end:
        if not top and end - start == 4 and data[start:end] == bytes(4):
            break  # older programs close a list of boxes with four zero bytes
        if end - start < 8:
            raise Damaged("rest of a box")
        size, kind = struct.unpack_from(">I4s", data, start)
        head = 8
        if size == 1:
            if end - start < 16:
                raise Damaged("rest of a wide box")
            size, head = struct.unpack_from(">Q", data, start + 8)[0], 16
        elif size == 0 and top:
            size = end - start
        if size < head or size > end - start:
            raise Damaged(f"{kind} of {size} bytes")
        found.append((kind, start + head, start + size))
        start += size
    return found


def first(found, kind):
    return next(((start, end) for each, start, end in found if each == kind), None)


def need(data, place, layout, offset):
    if place is None or place[0] + offset + struct.calcsize(layout) > place[1]:
        raise Damaged("short box")
    return struct.unpack_from(layout, data, place[0] + offset)


def told(value, wide):
    return value if value not in (0, 0xFFFFFFFFFFFFFFFF if wide else 0xFFFFFFFF) else None


def duration(data, top, movie):
    header = first(movie, b"mvhd")
    wide = need(data, header, ">B", 0)[0] == 1
    timescale, length = need(data, header, ">IQ" if wide else ">II", 20 if wide else 12)
    length = told(length, wide)
    extends = first(movie, b"mvex")
    if length is None and extends is not None:
        place = first(boxes(data, *extends), b"mehd")
        if place is not None:
            wide = need(data, place, ">B", 0)[0] == 1
            length = told(need(data, place, ">Q" if wide else ">I", 4)[0], wide)
    if length is not None and timescale:
        return length / timescale
    index = first(top, b"sidx")
    if index is None:
        return None
    scale, wide = need(data, index, ">I", 8)[0], need(data, index, ">B", 0)[0] == 1
    base = 28 if wide else 20
    count = need(data, index, ">H", base + 2)[0]
    total = sum(need(data, index, ">I", base + 4 + 12 * number + 4)[0] for number in range(count))
    return total / scale if scale else None


def resolution(data, movie):
    for kind, start, end in movie:
        if kind != b"trak":
            continue
        track = boxes(data, start, end)
        media = first(track, b"mdia")
        if media is None:
            continue
        media = boxes(data, *media)
        if need(data, first(media, b"hdlr"), "4s", 8)[0] != b"vide":
            continue
        header = first(track, b"tkhd")
        base = 52 if need(data, header, ">B", 0)[0] == 1 else 40
        a, b, _, c, d = need(data, header, ">5i", base)
        width, height = (value / 65536 for value in need(data, header, ">II", base + 36))
        table = boxes(data, *first(boxes(data, *first(media, b"minf")), b"stbl"))
        sample = first(table, b"stsd")
        entry = boxes(data, sample[0] + 8, sample[1])[0]
        stored = need(data, entry[1:], ">HH", 24)
        shape = first(boxes(data, entry[1] + 78, entry[2]), b"pasp")
        if (width, height) == stored and shape is not None:
            across, down = need(data, shape, ">II", 0)
            width = stored[0] * across / down
        return (height, width) if a == 0 and d == 0 and b and c else (width, height)
    return None


def read(data):
    """Resolution and duration, or None twice for what is no whole movie."""
    try:
        top = boxes(data, 0, len(data), top=True)
        place = first(top, b"moov")
        if place is None:
            return None, None
        movie = boxes(data, *place)
        return resolution(data, movie), duration(data, top, movie)
    except Damaged:
        return None, None

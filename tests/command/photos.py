"""Photos made byte by byte, for the command's tests."""

import struct

ASCII, SHORT, LONG, RATIONAL, SRATIONAL = 2, 3, 4, 5, 10
EXIF_POINTER = 0x8769

# The tag and the type that hold a field: of the main directory, and of the Exif directory.
MAIN = {"subfile": (0xFE, LONG), "width": (0x100, SHORT), "height": (0x101, SHORT), "model": (0x110, ASCII),
        "orientation": (0x112, SHORT), "dateTime": (0x132, ASCII)}
EXIF = {"exposureTime": (0x829A, RATIONAL), "fNumber": (0x829D, RATIONAL), "iso": (0x8827, SHORT),
        "dateTimeOriginal": (0x9003, ASCII), "shutterSpeedValue": (0x9201, SRATIONAL),
        "apertureValue": (0x9202, RATIONAL), "exposureBiasValue": (0x9204, SRATIONAL), "meteringMode": (0x9207, SHORT),
        "focalLength": (0x920A, RATIONAL), "whiteBalance": (0xA403, SHORT), "focalLengthIn35mmFilm": (0xA405, SHORT),
        "lensModel": (0xA434, ASCII)}

USUAL = {"width": 6000, "height": 4000, "orientation": 6, "dateTime": "2020:07:06 15:32:17"}
USUAL_CR3 = {"width": 6000, "height": 4000, "orientation": 8, "dateTime": "2021:01:02 03:04:05", "model": "Box Camera",
             "exposureTime": "1/80", "fNumber": "28/5", "iso": 400, "focalLength": "35/1", "exposureBiasValue": "-1/3",
             "meteringMode": 5, "whiteBalance": 1}


def directory(entries, start):
    """A little-endian directory of (tag, type, value) entries that lies at `start`, with its values."""
    entry_bytes, data = b"", b""
    data_start = start + 2 + 12 * len(entries) + 4
    for tag, kind, value in entries:
        if kind in (SHORT, LONG):
            entry_bytes += struct.pack("<HHII", tag, kind, 1, int(value))  # both read the same there
            continue
        if kind == ASCII:
            raw = value if isinstance(value, bytes) else value.encode()
        else:
            raw = struct.pack("<ii" if kind == SRATIONAL else "<II", *map(int, value.split("/")))
        raw = raw.ljust(5, b"\0")  # never inline
        entry_bytes += struct.pack("<HHII", tag, kind, len(raw) if kind == ASCII else 1, data_start + len(data))
        data += raw
    return struct.pack("<H", len(entries)) + entry_bytes + bytes(4) + data


def tiff(entries=()):
    return b"II*\0\x08\0\0\0" + directory(entries, 8)


def box(kind, payload):
    return struct.pack(">I4s", len(payload) + 8, kind) + payload


def photo(kind="tif", **fields):
    """A photo with usual values for all but the given fields; one that is "-" is left out."""
    values = {**(USUAL_CR3 if kind == "cr3" else USUAL), **fields}
    main, exif = ([(*tags[name], value) for name, value in values.items() if name in tags and value != "-"]
                  for tags in (MAIN, EXIF))
    if kind == "cr3":
        identifier = bytes.fromhex("85c0b687820f11e08111f4ce462b6a48")
        return box(b"moov", box(b"uuid", identifier + box(b"CMT1", tiff(main)) + box(b"CMT2", tiff(exif))))
    if not exif:
        return tiff(main)
    end = len(tiff([*main, (EXIF_POINTER, LONG, 0)]))
    return tiff([*main, (EXIF_POINTER, LONG, end)]) + directory(exif, end)

# python/tessel/beginning.py: what a file is, judged by its first bytes.
"""For a file that is no netCDF dataset: what it looks like instead."""

from __future__ import annotations

import os

_LENGTH = 512
_HDF5 = b"\x89HDF\r\n\x1a\n"

FORMATS: tuple[tuple[int, bytes, str], ...] = (
    (0, b"CDF\x01", "begins like a netCDF file of the classic format"),
    (0, b"CDF\x02", "begins like a netCDF file of the 64-bit offset format"),
    (0, b"CDF\x05", "begins like a netCDF file of the 64-bit data format"),
    (0, _HDF5, "begins like an HDF5 file (as netCDF-4 files do)"),
    (0, b"\x0e\x03\x13\x01", "looks like an HDF4 file"),
    (0, b"\x1f\x8b", "is compressed by gzip: decompress it first (gunzip)"),
    (0, b"\x1f\x9d", "is compressed by compress: decompress it first (uncompress)"),
    (0, b"BZh", "is compressed by bzip2: decompress it first (bunzip2)"),
    (0, b"\xfd7zXZ\0", "is compressed by xz: decompress it first (unxz)"),
    (0, b"\x28\xb5\x2f\xfd", "is compressed by zstd: decompress it first (unzstd)"),
    (0, b"PK\x03\x04", "is a zip archive: unpack it first"),
    (257, b"ustar", "is a tar archive: unpack it first"),
    (0, b"GRIB", "is a GRIB file"),
    (0, b"BUFR", "is a BUFR file"),
    (0, b"\x93NUMPY", "is an array of NumPy's: use numpy.load"),
    (0, b"SIMPLE  =", "is a FITS file"),
    (0, b"%PDF", "is a PDF document"),
    (0, b"\x89PNG", "is a PNG picture"),
    (0, b"version https://git-lfs", "is the pointer that stands for a large file in a repository: "
                                    "fetch the file itself (git lfs pull)"),
)
"""Where a format has its mark, the mark, and what the file is then."""

_DAMAGED = ", and what follows is damaged or cut off"
REFUSED: dict[bytes, str] = {
    b"CDF\x01": _DAMAGED, b"CDF\x02": _DAMAGED, b"CDF\x05": _DAMAGED,
    _HDF5: ", and is damaged or no dataset",
}
"""What is wrong with a file of a format that the library reads, when it did not."""

TEXTS: tuple[tuple[bytes, str], ...] = (
    (b"<!doctype html", "is a web page, perhaps what a server said instead of the file"),
    (b"<html", "is a web page, perhaps what a server said instead of the file"),
    (b"<?xml", "is an XML document"),
    (b"netcdf ", "is the text form of a dataset: make a file of it first (ncgen)"),
)
"""How a text begins, in lower case and without blanks before it, and what the file is then."""


def described(path: str, refused: bool = True) -> str:
    """What a file looks like, to be read after "it"; which the library refused, or nobody gave to
    it."""
    try:
        with open(path, "rb") as file:
            first = file.read(_LENGTH)
            size = os.fstat(file.fileno()).st_size
    except OSError as reason:
        return f"cannot be read ({reason.strerror})"
    return recognised(first, size, refused)


def recognised(first: bytes, size: int, refused: bool = True) -> str:
    """What a file of this size looks like that begins so."""
    if not first:
        return "is empty"
    if first.startswith(_HDF5):
        end = _hdf5_end(first)
        if end is not None and size < end:
            return f"is an HDF5 file that was cut off: {size} of {end} bytes are there"
    for offset, mark, what in FORMATS:
        if first.startswith(mark, offset):
            return f"{what}{REFUSED.get(mark, '') if refused else ''} ({size} bytes)"
    for mark in (b"CDF\x01", _HDF5):
        if size < len(mark) and mark.startswith(first):
            return f"was cut off after {size} bytes"
    for mark, what in TEXTS:
        if first.lstrip(b"\xef\xbb\xbf \t\r\n").lower().startswith(mark):
            return what
    if not any(first):
        return f"begins with zeros only ({size} bytes): perhaps nothing was ever written to it"
    text = _text(first)
    if text is not None:
        return f"is text that begins with {text!r}"
    return f"begins with the bytes {first[:8].hex(' ')}, which is no format known here"


def _hdf5_end(first: bytes) -> int | None:
    """Where an HDF5 file says that it ends."""
    version, wide = first[8:9], 8
    if version in (b"\0", b"\1") and first[13:14] == bytes([wide]):
        start = 40 if version == b"\0" else 44
    elif version in (b"\2", b"\3") and first[9:10] == bytes([wide]):
        start = 28
    else:
        return None
    field = first[start:start + wide]
    return int.from_bytes(field, "little") if len(field) == wide else None


def _text(first: bytes) -> str | None:
    """The first line of a text; None for what is none."""
    try:
        text = first.decode("utf-8")
    except UnicodeDecodeError as error:
        if error.start < len(first) - 3 or len(first) < _LENGTH:  # not just cut within a character
            return None
        text = first[:error.start].decode("utf-8")
    if not all(each.isprintable() or each in "\r\n\t\f" for each in text):
        return None
    line = (text.strip().splitlines() or [""])[0]
    return line if len(line) <= 40 else line[:40] + "..."

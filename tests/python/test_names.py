"""tests/python/test_names.py: names that the library would make longer than its limit are refused,
compared with Python's own normalisation, and all others are not."""

import random
import sys
import unicodedata
from collections.abc import Iterator

import pytest
import tessel

nc = tessel.load("netcdf")
LONGEST = 256  # bytes, NC_MAX_NAME
LETTERS = [chr(code) for code in range(0x80, sys.maxunicode + 1) if not 0xD800 <= code < 0xE000]


def size(text: str) -> int:
    return len(text.encode())


def composed(text: str) -> str:
    return unicodedata.normalize("NFC", text)


MADE_OF_PARTS = [each for each in LETTERS if unicodedata.decomposition(each)[:1] not in ("", "<")]
MARKS = [each for each in LETTERS if unicodedata.combining(each)]


@pytest.fixture(name="refused")
def _refused(tmp_path):
    """Whether the guard refuses a name."""
    ncid = nc.create(tmp_path / "names.nc", "CLOBBER")
    nc.def_dim(ncid, "x", 3)

    def refused(name: str) -> bool:
        try:
            nc.rename_dim(ncid, 0, name)
        except tessel.Error as error:
            assert error.identifier == "TESSEL:guard:name", error.identifier
            return True
        return False

    yield refused
    nc.abort(ncid)


def repeated(part: str) -> str:
    """As long as a name may be, of this part; filled up in front, so that none is the same."""
    times = LONGEST // size(part)
    return "x" * (LONGEST - times * size(part)) + part * times


def test_each_letter(refused) -> None:
    """One letter again and again: refused are those that become too long, and no others."""
    grown = 0
    for letter in {*MADE_OF_PARTS, *MARKS, *LETTERS[::97]}:
        name = repeated(letter)
        grows = size(composed(letter)) > size(letter)
        assert refused(name) == grows, hex(ord(letter))
        grown += grows
    assert grown > 50


def test_each_letter_with_each_mark(refused) -> None:
    """Where a mark makes a letter longer than both were, the name is refused."""
    grown = 0
    for letter in MADE_OF_PARTS:
        for mark in MARKS:
            part = letter + mark
            if size(composed(part)) > size(part):
                grown += 1
                assert size(composed(repeated(part))) > LONGEST
                assert refused(repeated(part)), (hex(ord(letter)), hex(ord(mark)))
    assert grown > 1000


def mixtures(number: int) -> Iterator[str]:
    """Letters and marks of all kinds, by lot, most of them of the kinds that become longer."""
    chance = random.Random(7)
    latin = [each for each in MADE_OF_PARTS if each < "\u0250" or "\u1E00" <= each < "\u1F00"]
    below = [each for each in MARKS if each < "\u0370" and unicodedata.combining(each) < 230]
    for _ in range(number):
        kinds = chance.choice([[MADE_OF_PARTS, MARKS], [latin, below], [latin, below, MARKS]])
        name = ""
        while size(name) < LONGEST - 4:
            name += chance.choice(chance.choice(kinds))
        yield name + "x" * (LONGEST - size(name))


def test_mixtures(refused) -> None:
    """Whatever is let through stays within the limit."""
    let_through = 0
    for name in mixtures(4000):
        if not refused(name):
            let_through += 1
            assert size(composed(name)) <= LONGEST, ascii(name)
    assert let_through > 100

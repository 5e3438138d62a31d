# python/tessel/xarray/opening.py: files that are open for reading, and which files those may be.
"""A file as the engine has it open."""

from __future__ import annotations

import os
import threading
from pathlib import Path
from typing import Any

import tessel
from tessel import integrity
from tessel.dataset import Dataset

FORMATS = (b"CDF\1", b"CDF\2")
"""How the files begin that the engine opens: the classic format and the one of 64-bit offsets."""


def is_ours(path: object) -> bool:
    """Whether it is the path of a file in one of the two formats."""
    if not isinstance(path, (str, os.PathLike)) or not os.path.isfile(path):
        return False
    with open(path, "rb") as file:
        return file.read(len(FORMATS[0])) in FORMATS


class OpenFile(Dataset):
    """An open file that several threads may read, while another may close it."""

    def __init__(self, path: str) -> None:
        if not is_ours(path):
            if not os.path.exists(path):
                raise FileNotFoundError(2, "No such file or directory", path)
            raise tessel.Error("TESSEL:python:notAClassicFile",
                               "The engine \"tessel\" opens files of the classic and of the 64-bit "
                               f"offset format, and this is none of them: {path}")
        super().__init__(path)
        self.lock = threading.RLock()
        self.is_open = True
        try:
            integrity.verify(self)
        except BaseException:
            self.close()
            raise

    def close(self) -> None:
        """Closes the file after the calls in progress; more than once does no harm."""
        with self.lock:
            if self.is_open:
                self.is_open = False
                super().close()


def normalized(path: str | os.PathLike[Any]) -> str:
    """The path that is used from now on, whatever the current folder will be."""
    return str(Path(os.path.expanduser(os.fspath(path))).absolute())

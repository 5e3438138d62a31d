# tests/python/counting.py: Python threads over a module that counts its calls in an ordinary variable.
"""usage: counting.py MODULE host|interpreter|nobody

Says under which lock the threads call the module: the host's, which every call takes; the
interpreter's, with the module called by itself; or none. The thread sanitizer must see a race in
the last case, and only there: then its silence about everything else means something.
"""

from __future__ import annotations

import ctypes
import sys
import threading
from collections.abc import Callable

import tessel

THREADS = 8
CALLS = 2000


def entry_of(library: ctypes.CDLL) -> Callable[[], object]:
    """The module's entry point, for a call without arguments and results."""
    function = library.tsxFunction
    function.argtypes = [ctypes.c_int, ctypes.c_void_p, ctypes.c_int, ctypes.c_void_p]
    function.restype = None
    return lambda: function(0, None, 0, None)


def main(path: str, lock: str) -> None:
    """Calls from all threads."""
    module = tessel.load(path)  # and the host, which the module wants, with it
    call = {"host": lambda: module("count"),
            "interpreter": entry_of(ctypes.PyDLL(path)),
            "nobody": entry_of(ctypes.CDLL(path))}[lock]

    def work() -> None:
        for _ in range(CALLS):
            call()

    threads = [threading.Thread(target=work) for _ in range(THREADS)]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    if lock == "host":
        counted = module("count")[0, 0]
        assert counted == THREADS * CALLS + 1, counted
    print(f"{THREADS * CALLS} calls, lock of {lock}")


main(*sys.argv[1:])

"""tests/cost/test_cost.py: the gate bites.

usage: test_cost.py PROGRAM...
"""

from __future__ import annotations

import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

import cost
from cost import Cost

PROGRAM = sys.argv[1:]

# Of two calls of "ours", which calls itself, "free" twice and, through "between", "malloc".
DUMP = """\
ob=/lib/libc.so.6
fn=free
10 400

fn=malloc
11 500

ob=/build/netcdf.tsx
fl=/source/entry.cpp
fn=ours
20 7
fi=/source/inlined.hpp
5 3
cfn=within
calls=2 30
21 90
cob=/lib/libc.so.6
cfi=/libc/free.c
cfn=free
calls=4 10
22 400
cfn=within
calls=2 30
23 90

fn=within
30 60

ob=/lib/libnetcdf.so.19
fn=between
40 9
cob=/lib/libc.so.6
cfn=malloc
calls=2 11
41 500
cob=/build/netcdf.tsx
cfn=within
calls=2 30
42 90
totals: 979
"""


def differences(budgets: cost.Costs, costs: cost.Costs) -> list[str]:
    """The names of the rows of the table that say FAILED; the table agrees with its answer."""
    text, good = cost.table(budgets, costs)
    failed = [line[:42].rstrip() for line in text.splitlines() if "FAILED" in line]
    assert good == (not failed)
    return failed


class Counting(unittest.TestCase):
    def test_only_ours_is_counted(self) -> None:
        self.assertEqual(cost.counted(DUMP.splitlines()), Cost(7 + 3 + 60, 4))

    def test_what_is_ours(self) -> None:
        for path, ours in (("/b/lib/tessel/netcdf.tsx", True), ("/b/lib/libtessel.so.0.1.0", True),
                           ("/b/tests/cost/cost_calls", True),
                           ("/b/python/tessel/_runtime.cpython-311-x86_64-linux-gnu.so", True),
                           ("/usr/lib/libnetcdf.so.19", False), ("/b/libcost_marks.so", False),
                           ("/usr/bin/python3.11", False)):
            self.assertEqual(cost.is_ours(path), ours, path)


class Comparing(unittest.TestCase):
    costs: dict[str, Cost]

    @classmethod
    def setUpClass(cls) -> None:
        cls.costs = cost.measure(PROGRAM)

    def with_instructions(self, name: str, share: float) -> cost.Costs:
        """The costs as budgets, with one call's instructions at a share of what they are."""
        was = self.costs[name]
        return {**self.costs, name: Cost(was.instructions * share, was.others)}

    def test_every_call_is_compared(self) -> None:
        self.assertGreaterEqual(len(self.costs), 5)
        for name, each in self.costs.items():
            self.assertGreater(each.instructions, 100, name)
            self.assertGreaterEqual(each.others, 1, name)
            self.assertEqual(differences(self.with_instructions(name, 0.96), self.costs), [name])
            self.assertEqual(differences(self.with_instructions(name, 0.98), self.costs), [])
            fewer = {**self.costs, name: Cost(each.instructions, each.others - 1)}
            self.assertEqual(differences(fewer, self.costs), [name])

    def test_same_or_less_is_well(self) -> None:
        self.assertEqual(differences(self.costs, self.costs), [])
        more = {name: Cost(each.instructions * 2, each.others + 1)
                for name, each in self.costs.items()}
        self.assertEqual(differences(more, self.costs), [])

    def test_no_row_is_missing(self) -> None:
        for name in self.costs:
            others = {each: cost for each, cost in self.costs.items() if each != name}
            self.assertEqual(differences(others, self.costs), [name])
            self.assertEqual(differences(self.costs, others), [name])

    def test_program_fails_until_updated(self) -> None:
        name = next(iter(self.costs))
        with tempfile.TemporaryDirectory() as folder:
            budgets = Path(folder) / "budgets"
            budgets.write_text("# what is said at the beginning\n")
            cost.write_budgets(budgets, self.with_instructions(name, 0.96))
            command = [sys.executable, cost.__file__, str(budgets), *PROGRAM]
            self.assertEqual(subprocess.run(command, capture_output=True).returncode, 1)
            self.assertEqual(subprocess.run([*command, "--update"],
                                            capture_output=True).returncode, 0)
            self.assertEqual(subprocess.run(command, capture_output=True).returncode, 0)
            self.assertTrue(budgets.read_text().startswith("# what is said at the beginning\n"))


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])

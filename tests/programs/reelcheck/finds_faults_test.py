"""reelcheck finds each fault of a faulty library with the check meant for it, and no fault in the real library.

Environment: see fault_cases.py.
"""

import subprocess
import unittest
from pathlib import Path

from fault_cases import COMMAND, FaultCases, run

PAGE = Path(__file__).resolve().parents[3] / "docs" / "reelcheck.md"


class FindsFaults(FaultCases, unittest.TestCase):
    FAULTS = {
        "lets-go-early": ("exports", "may be unloaded while"),
        "counts-wrongly": ("references", "count"),
        "describes-for-ever": ("descriptions", "more than"),
        "describes-too-much": ("descriptions", ""),  # ends the process
        "trusts-pointers": ("null-arguments", ""),
        "writes-behind": ("small-sizes", "Film Camera, 1x1"),
        "writes-before": ("small-sizes", "Film Camera, 1x1"),
        "writes-source": ("small-sizes", "Film Camera, 1x1"),
        "writes-beside": ("layouts", "outside the processed rectangle"),
        "remembers": ("replay", "another picture"),
        "hangs": ("times", "1e+300"),
        "changes-rounding": ("processor-state", "vector control"),
        "turns-direction": ("processor-state", "direction flag"),
        "allocates": ("frame-allocations", "1 allocations"),
        "leaks": ("create-failures", "1 blocks are lost"),
        "throws": ("create-failures", ""),
    }

    def test_a_crash_costs_one_check_and_no_more(self):
        code, output = run("writes-source", "--only", "references", "--only", "small-sizes", "--only", "table-allocations")
        verdicts = [line.split()[0] for line in output.splitlines() if line.startswith(("ok", "FAILED"))]
        self.assertEqual(verdicts, ["ok", "FAILED", "ok"], output)
        self.assertEqual(code, 1)

    def test_the_page_lists_every_check(self):
        listed = subprocess.run([*COMMAND, "--list"], stdout=subprocess.PIPE, text=True, check=True).stdout
        rows = [line.split(None, 2) for line in listed.splitlines()]
        table = "".join(f"| {name} | {level} | {what} |\n" for level, name, what in rows)
        self.assertIn(table, PAGE.read_text())

    def test_a_wrong_command_line_is_reported(self):
        for words in (["--level", "11"], ["--level"], ["--only", "no-such-check"], ["--seed", "x"], ["--what"]):
            with self.subTest(words=words):
                result = subprocess.run([*COMMAND, *words], stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)
                self.assertEqual(result.returncode, 2)
                self.assertEqual(result.stdout, "")
                self.assertTrue(result.stderr.startswith("reelcheck: "), result.stderr)


if __name__ == "__main__":
    unittest.main()

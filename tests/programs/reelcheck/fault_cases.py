"""What both tests of reelcheck's own reliability do: they run it on something with a fault, and look at the check meant for it.

REELCHECK is the command that runs the program, its words separated by ";".
"""

import os
import subprocess

COMMAND = os.environ["REELCHECK"].split(";")


def run(fault, *arguments, seconds=3):
    """Exit code and output; each check has that many seconds."""
    environment = dict(os.environ, REELCHECK_FAULT=fault, ASAN_OPTIONS="detect_leaks=0:allocator_may_return_null=1")
    result = subprocess.run([*COMMAND, "--seed", "1", "--timeout", str(seconds), *arguments], env=environment,
                            stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True, timeout=100 + 10 * seconds)
    return result.returncode, result.stdout


class FaultCases:
    """To be combined with unittest.TestCase."""

    # fault -> the check that must find it, and what its line contains
    FAULTS = {}
    SECONDS = 3

    def test_every_fault_is_found_by_its_check(self):
        for fault, (check, words) in self.FAULTS.items():
            with self.subTest(fault=fault):
                code, output = run(fault, "--only", check, seconds=self.SECONDS)
                self.assertEqual(code, 1, output)
                line = next(line for line in output.splitlines() if f" {check} " in line)
                self.assertTrue(line.startswith("FAILED"), line)
                self.assertIn(words, line)
                self.assertIn("1 checks, 1 failures", output.splitlines()[-1])

    def test_without_a_fault_the_same_checks_pass(self):
        checks = sorted({check for check, _ in self.FAULTS.values()})
        code, output = run("none", *[word for check in checks for word in ("--only", check)], seconds=self.SECONDS)
        self.assertEqual(code, 0, output)

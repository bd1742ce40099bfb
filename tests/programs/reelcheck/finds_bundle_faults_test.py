"""reelcheck finds each fault of a faulty OpenFX bundle with the check meant for it, and none in the same bundle without one.

REELCHECK is the command that runs the program on that bundle, its words separated by ";". REELCHECK_REFUSES names an option
that the program refuses because of its word size, if there is one.
"""

import os
import subprocess
import unittest

COMMAND = os.environ["REELCHECK"].split(";")

# fault -> the check that must find it, and what its line contains
FAULTS = {
    "forgets-hints": ("openfx-descriptions", "no hint"),
    "trusts-suites": ("openfx-missing-suites", ""),  # ends the process
    "throws": ("openfx-wrong-handles", ""),  # ends the process
    "keeps-images": ("openfx-first-frames", "not given back"),
    "reads-far": ("openfx-first-frames", "rendering gives"),
    "keeps-memory": ("openfx-first-frames", "not freed"),
    "ignores-sign": ("openfx-layouts", ""),  # ends the process, or is a wrong picture
    "writes-beside": ("openfx-layouts", "outside the window"),
    "many-steps": ("openfx-presets", "one step"),
    "never-neutral": ("openfx-identity", "defaults change"),
    "ignores-mask": ("openfx-mask", "wrong mix"),
    "never-divides": ("openfx-spaces", "away at"),
    "wants-tiles": ("openfx-tiles", "too little"),
    "counts-pixels": ("openfx-scales", "region"),
    "ignores-start": ("openfx-times", "clip's frame"),
    "forgets-keys": ("openfx-animation", "same fade"),
    "ignores-fields": ("openfx-fields", "rows of the field"),
    "never-stops": ("openfx-abort", "asks too rarely"),
    "shares-state": ("openfx-threads", "differs"),
    "stays": ("openfx-presets", "stays when it is destroyed"),
}


def run(fault, *arguments):
    environment = dict(os.environ, REELCHECK_FAULT=fault, ASAN_OPTIONS="detect_leaks=0:allocator_may_return_null=1")
    result = subprocess.run([*COMMAND, "--seed", "1", "--timeout", "60", *arguments], env=environment,
                            stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True, timeout=300)
    return result.returncode, result.stdout


class FindsFaults(unittest.TestCase):
    def test_every_fault_is_found_by_its_check(self):
        for fault, (check, words) in FAULTS.items():
            with self.subTest(fault=fault):
                code, output = run(fault, "--only", check)
                self.assertEqual(code, 1, output)
                line = next(line for line in output.splitlines() if f" {check} " in line)
                self.assertTrue(line.startswith("FAILED"), line)
                self.assertIn(words, line)

    def test_without_a_fault_the_same_checks_pass(self):
        checks = sorted({check for check, _ in FAULTS.values()})
        code, output = run("none", *[word for check in checks for word in ("--only", check)])
        self.assertEqual(code, 0, output)

    def test_modules_of_another_word_size_are_refused_plainly(self):
        option = os.environ.get("REELCHECK_REFUSES")
        if option is None:
            self.skipTest("this program loads both")
        result = subprocess.run([*COMMAND, option, "x"], stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)
        self.assertEqual(result.returncode, 2)
        self.assertIn("which this 64-bit program cannot load", result.stderr)


if __name__ == "__main__":
    unittest.main()

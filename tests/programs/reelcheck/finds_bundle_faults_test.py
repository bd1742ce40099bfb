"""reelcheck finds each fault of a faulty OpenFX bundle with the check meant for it, and none in the same bundle without one.

Environment: see fault_cases.py; the command runs the program on that bundle. REELCHECK_REFUSES names an option that the
program refuses because of its word size, if there is one.
"""

import os
import subprocess
import unittest

from fault_cases import COMMAND, FaultCases


class FindsFaults(FaultCases, unittest.TestCase):
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
    SECONDS = 60

    def test_modules_of_another_word_size_are_refused_plainly(self):
        option = os.environ.get("REELCHECK_REFUSES")
        if option is None:
            self.skipTest("this program loads both")
        result = subprocess.run([*COMMAND, option, "x"], stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)
        self.assertEqual(result.returncode, 2)
        self.assertIn("which this 64-bit program cannot load", result.stderr)


if __name__ == "__main__":
    unittest.main()

"""Nothing includes upward, and no two folders include each other; scripts/house.py defines the levels."""

import sys
import tempfile
import unittest
from pathlib import Path

sys.dont_write_bytecode = True
sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "scripts"))
import house  # noqa: E402


class Includes(unittest.TestCase):
    def test_the_house_stands(self):
        self.assertGreater(len(list(house.includes())), 500)
        self.assertEqual([], house.faults())

    def test_every_floor_is_used(self):
        parts = {house.place(house.folder_of(inside)) for inside in house.sources(house.ROOT)}
        for level, row in enumerate(house.FLOORS):
            self.assertTrue(any(part and part[0] == level for part in parts), row)

    def test_faults_are_named(self):
        cases = {
            "upward": ({"render/a.cpp": "int i;\n#include \"effects/b.h\"\n"},
                       ["render/a.cpp:2: includes effects/b.h, but effects/ lies on a floor above"]),
            "sideways, in brackets, from a subfolder": (
                {"render/simd/a.h": "#  include <text/b.h>\n"},
                ["render/simd/a.h:1: includes text/b.h, but text/ lies on the same floor"]),
            "programs side by side": (
                {"programs/reelfx/main.cpp": "#include \"programs/new/b.h\"\n"},
                ["programs/reelfx/main.cpp:1: includes programs/new/b.h, but programs/new/ lies on the same floor"]),
            "a path through the folder above": (
                {"api/a.h": "#include \"../library/b.h\"\n", "library/b.h": ""},
                ["api/a.h:1: includes library/b.h, but library/ lies on a floor above"]),
            "tests": ({"bench/a.cpp": "#include \"tests/common/b.h\"\n"},
                      ["bench/a.cpp:1: includes tests/common/b.h, which is no part of the house"]),
            "folders in each other": (
                {"render/a.h": "#include \"render/simd/b.h\"\n", "render/simd/b.h": "",
                 "render/simd/c.cpp": "\n#include \"render/a.h\"\n"},
                ["render/a.h:1: includes render/simd/b.h, and render/simd/c.cpp:2: includes render/a.h: two folders "
                 "must not include each other"]),
            "no floor": (
                {"attic/a.cpp": ""}, ["attic/a.cpp:1: attic/ has no floor; give it one in scripts/house.py"]),
            "allowed": (
                {"programs/reelfx/main.cpp": "#include \"programs/reelfx/commands/b.h\"\n#include <render/c.h>\n",
                 "tests/a.cpp": "#include \"bench/b.h\"\n"},
                []),
        }
        for name, (files, expected) in cases.items():
            with self.subTest(name), tempfile.TemporaryDirectory() as folder:
                for path, text in files.items():
                    file = Path(folder, path)
                    file.parent.mkdir(parents=True, exist_ok=True)
                    file.write_text(text)
                self.assertEqual(expected, house.faults(Path(folder)))


if __name__ == "__main__":
    unittest.main()

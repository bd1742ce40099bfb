"""The embedding script rejects pictures that the renderer cannot use, and says which and why.

Called with the embedding script and the folder of the pictures.
"""

import pathlib
import shutil
import subprocess
import sys
import tempfile
import unittest

SCRIPT, PICTURES = sys.argv[1:3]


class EmbedPictures(unittest.TestCase):
    def setUp(self):
        temporary = tempfile.TemporaryDirectory()
        self.addCleanup(temporary.cleanup)
        self.folder = pathlib.Path(temporary.name, "pictures")
        self.output = pathlib.Path(temporary.name, "embedded.cpp")
        shutil.copytree(PICTURES, self.folder)

    def embed(self):
        command = [sys.executable, SCRIPT, self.folder, self.output, *self.folder.glob("wear-*.pgm")]
        return subprocess.run(command, capture_output=True, text=True)

    def change(self, name, old, new):
        path = self.folder / name
        content = path.read_bytes()
        self.assertIn(old, content)
        path.write_bytes(content.replace(old, new, 1))

    def assert_refused(self, name, *reasons):
        result = self.embed()
        self.assertNotEqual(result.returncode, 0)
        self.assertFalse(self.output.exists())
        for text in (name, *reasons):
            self.assertIn(text, result.stderr)
        self.assertNotIn("Traceback", result.stderr)

    def test_comment_of_a_paint_program_is_no_fault(self):
        self.change("spot-4.pgm", b"P5\n", b"P5\n# drawn 12 by 12\n")
        self.assertEqual(self.embed().returncode, 0)

    def test_sizes(self):
        self.change("spot-4.pgm", b"8 7", b"7 8")
        self.assert_refused("spot-4.pgm", "size", "found 7x8", "expected 8x7")
        self.change("wear-2004.pgm", b"25 150", b"150 25")
        self.assert_refused("wear-2004.pgm", "size", "found 150x25", "16 to 64 columns")

    def test_every_wear_picture_is_taken(self):
        shutil.copy(self.folder / "wear-2005.pgm", self.folder / "wear-2007.pgm")
        self.assertEqual(self.embed().returncode, 0)
        self.assertIn("{2007, {64, 64, 64, kWear2007}}", self.output.read_text())
        self.assertIn("kWearPictureCount == 8", self.output.read_text())

    def test_gap_in_the_menu_values(self):
        (self.folder / "wear-2003.pgm").unlink()
        self.assert_refused("wear-2004.pgm", "menu value", "expected 2003")

    def test_key(self):
        self.change("spot-7.pgm", b"255\n\x5a", b"255\n\x5b")
        self.assert_refused("spot-7.pgm", "key", "found 91", "expected 90")

    def test_border(self):
        path = self.folder / "spot-0.pgm"
        path.write_bytes(path.read_bytes()[:-1] + b"\x00")
        self.assert_refused("spot-0.pgm", "column 8, row 12", "found 0", "expected 93")

    def test_missing_pixels(self):
        path = self.folder / "wear-2005.pgm"
        path.write_bytes(path.read_bytes()[:-3])
        self.assert_refused("wear-2005.pgm", "found 4093", "expected 4096")

    def test_text_format(self):
        self.change("spot-1.pgm", b"P5", b"P2")
        self.assert_refused("spot-1.pgm", "format", "found P2", "expected P5")

    def test_depth(self):
        self.change("spot-1.pgm", b"\n255\n", b"\n65535\n")
        self.assert_refused("spot-1.pgm", "found 65535", "expected 255")

    def test_missing_file(self):
        (self.folder / "spot-10.pgm").unlink()
        self.assert_refused("spot-10.pgm", "found no readable file")

    def test_empty_file(self):
        (self.folder / "spot-2.pgm").write_bytes(b"")
        self.assert_refused("spot-2.pgm", "expected P5")


unittest.main(argv=sys.argv[:1])

#!/usr/bin/env python3
"""The editors' files, read as the editors read them, and installed into and removed from a user's home.

Environment: REELFX; VELMORA_DIST: the build results, with plug-ins built without sanitizers.
"""

import json
import os
import re
import shutil
import subprocess
import sys
import tempfile
import unittest
import xml.etree.ElementTree as ElementTree
from pathlib import Path

sys.path.insert(0, str(Path(__file__).parent))
import frei0r_hosts_test as hosts  # noqa: E402
from clip import run_host  # noqa: E402

DIST = Path(os.environ["VELMORA_DIST"])
EDITORS = DIST / "editors"
PLUGINS = [hosts.plugin_name(effect) for effect in hosts.PRESETS]
os.environ.setdefault("FREI0R_PATH", str(DIST / "frei0r-1"))


def kdenlive_parameters(plugin):
    root = ElementTree.parse(EDITORS / "kdenlive/effects" / f"{plugin}.xml").getroot()
    assert (root.tag, root.get("tag")) == ("effect", f"frei0r.{plugin}")
    return root.findall("parameter")


def melt_metadata(plugin, data=None):
    environment = dict(os.environ)
    if data:
        environment["MLT_DATA"] = str(data)
    done = run_host("melt", "-query", f"filter=frei0r.{plugin}", env=environment)
    return done.stdout.decode()


def parameters_of_plugin(plugin):
    """What MLT reads from the plug-in itself when none of our descriptions is installed."""
    return re.findall(r"^  - identifier: (.+)$", melt_metadata(plugin), re.MULTILINE)


class EditorFiles(unittest.TestCase):
    def test_kdenlive_binds_every_parameter_but_the_preset_by_its_index(self):
        for plugin in PLUGINS:
            names = [p.get("name") for p in kdenlive_parameters(plugin)]
            self.assertEqual(sorted(names, key=int), [str(i) for i in range(1, len(parameters_of_plugin(plugin)))], plugin)

    def test_kdenlive_finds_values_and_defaults_in_range(self):
        for plugin in PLUGINS:
            for parameter in kdenlive_parameters(plugin):
                where = f"{plugin}: {parameter.findtext('name')}"
                default = parameter.get("default")
                if parameter.get("type") == "list":
                    # Kdenlive splits the values at semicolons and the displayed names at commas.
                    values = parameter.get("paramlist").split(";")
                    self.assertEqual(len(values), len(parameter.findtext("paramlistdisplay").split(",")), where)
                    self.assertIn(default, values, where)
                elif parameter.get("type") in ("animated", "constant"):
                    shown = float(default) * float(parameter.get("factor", 1))
                    self.assertLessEqual(float(parameter.get("min")), shown, where)
                    self.assertLessEqual(shown, float(parameter.get("max")), where)
                elif parameter.get("type") == "color":
                    self.assertRegex(default, "^#[0-9a-f]{6}$", where)
                else:
                    self.assertEqual((parameter.get("type"), default in ("0", "1")), ("bool", True), where)

    def test_presets_of_kdenlive_give_the_frames_of_the_built_in_ones(self):
        work = hosts.Work()
        self.addCleanup(work.folder.cleanup)
        for effect, preset in hosts.PRESETS.items():
            presets = json.loads((EDITORS / f"kdenlive/presets/frei0r.{hosts.plugin_name(effect)}.json").read_text())
            (values,) = [entry[preset] for entry in presets if preset in entry]
            settings = ["preset=none", *(f"{value['name']}={value['value']}" for value in values)]
            self.assertEqual(hosts.in_melt(work, effect, "25", more=settings), work.expected(effect, "25"), effect)

    def test_a_users_own_presets_and_categories_stay_in_kdenlive(self):
        ours = EDITORS / "kdenlive/presets/frei0r.velmora_film_look.json"
        own_sepia = {"Sepia": [{"name": "4", "value": "#123456"}]}
        categories = '<group list="sepia,mine">\n<text>Stylize</text>\n</group>'
        # What the user has before; what the names are after setting up; what is left after removing.
        for before, names, after in [
            (None, 30, None),
            ([{"Mine": []}], 31, [{"Mine": []}]),
            ({"Mine": []}, 31, [{"Mine": []}]),
            ([own_sepia], 30, [own_sepia]),
            ("{ no list", None, "{ no list"),
        ]:
            with self.subTest(before), tempfile.TemporaryDirectory() as home:
                system, data = Path(home) / "system/kdenlive", Path(home) / "data/kdenlive"
                file = data / "effects/presets" / ours.name
                for folder in (system, file.parent):
                    folder.mkdir(parents=True)
                (system / "kdenliveeffectscategory.rc").write_text(categories)
                if before is not None:
                    file.write_text(before if isinstance(before, str) else json.dumps(before))
                setup = [hosts.ROOT / "scripts/kdenlive-setup"]
                environment = dict(os.environ, XDG_DATA_HOME=str(data.parent), XDG_DATA_DIRS=str(system.parent))
                for _ in range(2):
                    subprocess.run(setup, env=environment, check=True, capture_output=True)
                if names:
                    self.assertEqual(len({name for entry in json.loads(file.read_text()) for name in entry}), names)
                text = (data / "kdenliveeffectscategory.rc").read_text()
                self.assertRegex(text, '^<group list="sepia,mine(,frei0r.velmora_film_[a-z]+){5}">\n<text>Stylize')
                subprocess.run([*setup, "--remove"], env=environment, check=True, capture_output=True)
                left = file.read_text() if file.exists() else None
                self.assertEqual(left if left is None or isinstance(before, str) else json.loads(left), after)
                self.assertFalse((data / "kdenliveeffectscategory.rc").exists())

    def test_mlt_reads_its_description(self):
        with tempfile.TemporaryDirectory() as folder:
            data = Path(folder) / "mlt"
            system = next(Path("/usr/share").glob("mlt-*"))
            shutil.copytree(system, data, symlinks=True)
            for file in (EDITORS / "mlt/frei0r").iterdir():
                shutil.copy(file, data / "frei0r")
            for plugin in PLUGINS:
                text = melt_metadata(plugin, data)
                names = re.findall(r"^  - identifier: (.+)$", text, re.MULTILINE)
                self.assertEqual(names, parameters_of_plugin(plugin), plugin)
                self.assertIn("schema_version: 0.3", text)  # ours: MLT's own has 0.1
                self.assertIn("      - Reset To None", text)

    def test_shotcut_has_a_control_for_every_parameter(self):
        for plugin in PLUGINS:
            folder = EDITORS / "shotcut/filters" / plugin
            for file in ("meta.qml", "ui.qml"):
                done = subprocess.run(["qmllint", folder / file], capture_output=True)
                self.assertEqual(done.returncode, 0, done.stderr.decode())
            self.assertIn(f'mlt_service: "frei0r.{plugin}"', (folder / "meta.qml").read_text())
            panel = (folder / "ui.qml").read_text()
            count = len(parameters_of_plugin(plugin))
            self.assertEqual(sorted(re.findall(r"id: control(\d+)", panel), key=int), [str(i) for i in range(count)], plugin)
            # A saved preset that starts with a number would be read wrongly.
            self.assertIn("property var allNames: ['preset', '1', '2',", panel)
            for name in ["preset", *range(1, count)]:
                self.assertEqual(len(re.findall(rf"onClicked: reset\('{name}'", panel)), 1)
                self.assertRegex(panel, rf"filter.get(Double)?\('{name}'\)")

    def test_a_user_installs_and_removes_them(self):
        with tempfile.TemporaryDirectory(prefix="home of é ") as home:
            environment = {k: v for k, v in os.environ.items() if k not in ("FREI0R_PATH", "XDG_DATA_HOME")}
            environment.update(HOME=home, VELMORA_DIST=str(DIST))
            own = Path(home) / ".frei0r-1/lib/own.so"
            own.parent.mkdir(parents=True)
            own.touch()
            script = hosts.ROOT / "scripts/install-user"
            for _ in range(2):  # also over an existing installation
                said = subprocess.run([script], env=environment, capture_output=True, check=True).stdout.decode()
            installed = [p for p in Path(home).rglob("*") if p.is_file() and p != own and p.name != "installed-files"]
            self.assertEqual(sorted(str(p) for p in installed), sorted(line.strip() for line in said.splitlines()))

            shown = run_host("ffmpeg", "-nostdin", "-v", "error", "-f", "lavfi", "-i", "testsrc=s=64x48", "-frames:v",
                             "1", "-vf", "frei0r=velmora_film_pro:oldie", "-f", "null", "-", env=environment)
            self.assertEqual(shown.returncode, 0, shown.stderr.decode())
            done = run_host("melt", "-query", "filters", env=environment)
            for plugin in PLUGINS:
                self.assertIn(f"frei0r.{plugin}", done.stdout.decode())

            subprocess.run([script, "--remove"], env=environment, capture_output=True, check=True)
            left = [p for p in Path(home).rglob("*") if p.is_file() and ".cache" not in p.parts]
            self.assertEqual(left, [own])


if __name__ == "__main__":
    unittest.main()

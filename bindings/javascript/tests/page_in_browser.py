#!/usr/bin/python3
"""The page in a browser, opened as a file: its numbers are those of the command, and it says what is wrong in its fields.

    page_in_browser.py COMMAND PAGE [FOLDER]    with a folder, leaves pictures to look at there instead of testing
"""

import base64
import csv
import pathlib
import subprocess
import sys
import tempfile
import time
import unittest

sys.dont_write_bytecode = True  # the tree stays as it is
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[3] / "tests" / "report"))
from browser import Browser

COMMAND, PAGE = (pathlib.Path(argument).resolve() for argument in sys.argv[1:3])
SCREENSHOTS = pathlib.Path(sys.argv[3]) if len(sys.argv) > 3 else None
PATIENCE = 120  # seconds

REFUSED = [
    ("block-size", "41", "settings-mistake", "40 and 48 are the nearest"),
    ("block-size", "6145", "settings-mistake", "from 40 to 6144"),
    ("block-size", "", "settings-mistake", "The block size is missing"),
    ("block-size", "<img src=x>", "settings-mistake", "The block size “<img src=x>” does not exist"),
    ("block-size", "5.12e2", "settings-mistake", "does not exist"),
    ("iterations", "16", "settings-mistake", "from 1 to 15"),
    ("iterations", "-1", "settings-mistake", "from 1 to 15"),
    ("ebn0", "much", "block-mistake", "The Eb/N0 “much” is not possible"),
    ("ebn0", "0.0001", "block-mistake", "three decimals"),
    ("seed", "18446744073709551616", "settings-mistake", "from 0 to 18446744073709551615"),
    ("block-number", "x", "block-mistake", "The block “x” is not possible"),
    ("block-number", "99999999999999999999", "block-mistake", "is not possible"),
]
REFUSED_SWEEPS = [
    ("from", "2", "lies below the start"),
    ("step", "0", "never reached"),
    ("step", "0.001", "at most 200"),
    ("to", "", "The end is missing"),
    ("block-errors", "0", "from 1 to"),
    ("max-blocks", "many", "not possible"),
    ("workers", "65", "from 1 to 64"),
]


class PageInBrowser(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.folder = tempfile.TemporaryDirectory(prefix="morvik-page-")
        cls.browser = Browser()

    @classmethod
    def tearDownClass(cls):
        cls.browser.close()
        cls.folder.cleanup()

    def setUp(self):
        self.open()

    def open(self, width=1200, height=900):
        self.browser.resize(width, height)
        self.browser.media()
        self.browser.load(PAGE.as_uri())
        self.wait("document.body.dataset.ready === 'true' || document.getElementById('settings-mistake').textContent !== ''")

    def evaluate(self, expression):
        return self.browser.evaluate(expression)

    def wait(self, condition):
        end = time.monotonic() + PATIENCE
        while not self.evaluate(condition):
            self.assertLess(time.monotonic(), end, condition)
            time.sleep(0.05)

    def text(self, selector):
        return self.evaluate(f"document.querySelector({selector!r}).textContent")

    def texts(self, selector):
        return self.evaluate(f"Array.from(document.querySelectorAll({selector!r}), found => found.textContent)")

    def type(self, name, value):
        self.evaluate(f"(() => {{ const field = document.getElementById({name!r}); field.value = {value!r};"
                      "field.dispatchEvent(new Event('input', {bubbles: true})); })()")

    def choose(self, name, value):
        self.evaluate(f"document.querySelector('input[name={name}][value=\"{value}\"]').click()")

    def set(self, K, units, algorithm, iterations, ebn0, seed):
        for name, value in (("units", units), ("algorithm", algorithm)):
            self.choose(name, value)
        for name, value in (("block-size", K), ("iterations", iterations), ("ebn0", ebn0), ("seed", seed)):
            self.type(name, str(value))

    def run_command(self, *words):
        done = subprocess.run([COMMAND, *words], cwd=self.folder.name, check=True, capture_output=True, text=True)
        return done.stdout

    def shown_command(self, name):
        words = self.text("#" + name).split()
        self.assertEqual(words[0], "morvik")
        return words[1:]

    def simulate(self, **fields):
        for name, value in fields.items():
            self.type(name.replace("_", "-"), str(value))
        self.evaluate("document.getElementById('start').click()")
        self.wait("document.getElementById('progress').textContent === 'Complete.'")

    # ---- Loading

    def test_loads_from_a_file_without_messages_and_without_a_network(self):
        self.assertEqual(self.browser.messages, [])
        self.assertEqual(self.browser.requests, [PAGE.as_uri()])
        self.assertEqual(self.text("#settings-mistake"), "")
        self.assertIn("with the vectors", self.text("#footer"))

    def test_decodes_where_there_are_no_vectors(self):
        script = self.browser.call("Page.addScriptToEvaluateOnNewDocument", source="WebAssembly.validate = () => false;")
        try:
            self.open()
            self.assertIn("without the vectors", self.text("#footer"))
            self.set(512, 8, "scaled", 8, 0.7, 1)
            self.check_block(3)
            self.simulate(**{"from": 0, "to": 0.5, "step": 0.5, "block_errors": 20, "max_blocks": 100})
            self.check_sweep()
        finally:
            self.browser.call("Page.removeScriptToEvaluateOnNewDocument", identifier=script["identifier"])

    # ---- One block

    def check_block(self, number):
        """That each iteration's wrong bits are those that the command finds in the block that it replays."""
        self.type("block-number", str(number))
        words = self.shown_command("block-command")
        self.assertEqual(words[-1], f"0:{number}")
        files = self.run_command(*words).strip().split("\n")[-1].split()
        self.assertEqual(files[:2], ["morvik", "decode"])
        sent = pathlib.Path(self.folder.name, files[files.index("--reference") + 1]).read_text().strip()
        at = files.index("--reference")
        del files[at:at + 2]
        counts = [int(count) for count in self.texts("#errors .count")]
        for iteration in range(1, len(counts)):
            files[files.index("--iterations") + 1] = str(iteration)
            decided = self.run_command(*files[1:]).strip()
            self.assertEqual(counts[iteration], sum(a != b for a, b in zip(sent, decided)), (words, iteration))
        return counts

    def test_a_blocks_wrong_bits_are_the_commands(self):
        for settings, number in (((512, 8, "scaled", 8, 0.7, 1), 0), ((40, 2, "max-log", 3, -1, 99), 12345),
                                 ((1056, 4, "table", 5, 0.25, 18446744073709551615), 7)):
            self.set(*settings)
            counts = self.check_block(number)
            self.assertEqual(len(counts), settings[3] + 1)
            self.assertGreater(sum(counts[1:]), 0)
        self.assertEqual(self.browser.messages, [])

    def test_a_block_that_fails_is_found(self):
        self.set(512, 8, "scaled", 4, 0.7, 1)
        self.evaluate("document.getElementById('block-failing').click()")
        number = int(self.evaluate("document.getElementById('block-number').value"))
        self.assertGreater(number, 0)
        self.assertGreater(self.check_block(number)[-1], 0)
        self.set(40, 8, "scaled", 4, 40, 1)
        self.evaluate("document.getElementById('block-failing').click()")
        self.assertRegex(self.text("#block-mistake"), r"None of the blocks \d+ to \d+ has wrong bits")

    def test_values_lie_in_their_windows(self):
        self.set(6144, 8, "scaled", 8, 0.7, 1)
        self.assertEqual(self.evaluate("[document.getElementById('values-picture').width, document.getElementById('values-picture').height]"), [192, 32])
        self.assertEqual(self.evaluate("document.querySelectorAll('#windows rect').length"), 96)
        self.evaluate("document.getElementById('values').focus()")
        for key in ("ArrowRight", "ArrowRight", "ArrowDown"):
            self.browser.press(key)
        self.assertRegex(self.text("#value-tip"), r"^Step 193: sent [01], ratio −?[\d.]+Segment 1, window 1 \(row 0\); unit 0, thread 1$")
        self.choose("values", "parity1")
        self.assertRegex(self.text("#values-text"), r"^Received values of parity 1: \d+ of 6144 have the wrong sign\. 8 units cut the block into 32 segments of 192 steps")
        self.browser.press("Escape")
        self.assertTrue(self.evaluate("document.getElementById('value-tip').hidden"))

    def test_an_iteration_is_looked_at(self):
        self.set(512, 8, "scaled", 8, 0.7, 1)
        counts = self.texts("#errors .count")
        for iteration in (3, 0, 8):
            self.evaluate(f"document.querySelectorAll('#errors button')[{iteration}].click()")
            self.assertIn(f": {counts[iteration]} of 512 have the wrong sign", self.text("#values-text"))
            pressed = self.evaluate("Array.from(document.querySelectorAll('#errors button'), each => each.getAttribute('aria-pressed'))")
            self.assertEqual(pressed.index("true"), iteration)

    # ---- Error rates

    def check_sweep(self):
        words = self.shown_command("sweep-command")
        self.run_command(*words, "--quiet", "--overwrite", "--output", "rates.csv")
        with open(pathlib.Path(self.folder.name, "rates.csv"), newline="") as file:
            expected = list(csv.DictReader(file))
        last = max(int(row["iterations"]) for row in expected)
        rate = "{:.2e}".format
        rows = []
        for row in expected:
            ber, bler = (
                [rate(float(row[kind])), f"{rate(float(row[kind + '_low']))} … {rate(float(row[kind + '_high']))}"]
                if row["block_errors"] != "0" else ["< " + rate(float(row["bler_high"])), "no error seen"] for kind in ("ber", "bler"))
            counts = ["{:,}".format(int(row[name])).replace(",", "\u202f") for name in ("blocks", "bit_errors", "block_errors")]
            rows.append([int(row["iterations"]), ["{:.2f}".format(float(row["ebn0_db"])).replace("-", "−"), *ber, *bler, *counts,
                         rate(float(row["clipped_fraction"]))]])
        shown = self.evaluate("Array.from(document.querySelectorAll('#rows tr'), row => Array.from(row.cells, cell => cell.textContent))")
        self.assertEqual(shown, [cells for iteration, cells in rows if iteration == last])
        return rows

    def test_rates_are_the_commands(self):
        self.set(512, 8, "scaled", 8, 0, 1)
        self.simulate(**{"from": 0, "to": 1.2, "step": 0.4, "block_errors": 50, "max_blocks": 1500, "workers": 2})
        rows = self.check_sweep()
        # The curve of each iteration, as the chart tells its points.
        self.assertEqual(len(self.texts("#legend button")), 8)
        self.evaluate("document.getElementById('chart').focus()")
        self.browser.press("ArrowRight")
        figures = self.texts("#tip dd")
        first = next(cells for iteration, cells in rows if iteration == 1)
        self.assertEqual([figures[1], figures[2], *figures[3:]],
                         [first[1] + first[2], first[3] + first[4], *first[5:]])
        self.assertEqual(self.browser.messages, [])

    def test_rates_of_other_cores_are_the_commands(self):
        for settings in ((40, 2, "max-log", 2, 0, 7), (2048, 4, "table", 3, 0, 18446744073709551615)):
            self.set(*settings)
            self.simulate(**{"from": "−0.50", "to": 3.5, "step": 2, "block_errors": 30, "max_blocks": 300, "workers": 3})
            self.check_sweep()

    def test_a_sweep_is_stopped_and_begun_anew(self):
        self.simulate(**{"from": 6, "to": 6, "step": 1, "block_errors": 1000, "max_blocks": 10})
        self.check_sweep()
        self.type("max-blocks", "1000000000")
        self.evaluate("document.getElementById('start').click()")
        self.type("ebn0", "1")  # of the one block
        self.assertEqual(self.text("#start"), "Stop")
        self.wait("document.querySelectorAll('#rows tr.waiting').length === 0")
        self.evaluate("document.getElementById('start').click()")
        self.assertEqual(self.text("#start"), "Simulate")
        self.wait("document.getElementById('progress').textContent === 'Stopped.'")
        self.type("max-blocks", "10")
        self.simulate(**{"from": 6, "to": 6, "step": 1, "block_errors": 1000, "max_blocks": 10})
        self.check_sweep()
        self.assertEqual(self.browser.messages, [])

    # ---- What is typed

    def test_says_what_is_wrong_in_a_field(self):
        for field, value, place, words in REFUSED:
            before = self.evaluate(f"document.getElementById({field!r}).value")
            self.type(field, value)
            self.assertIn(words, self.text("#" + place), (field, value))
            self.assertEqual(self.evaluate(f"document.getElementById({field!r}).getAttribute('aria-invalid')"), "true")
            self.assertFalse(self.evaluate("document.getElementById('block-content').checkVisibility()"))
            self.type(field, before)
            self.assertEqual(self.text("#" + place), "")
            self.assertEqual(self.evaluate("document.querySelectorAll('[aria-invalid]').length"), 0)
            self.assertTrue(self.evaluate("document.getElementById('block-content').checkVisibility()"))
        self.assertEqual(self.evaluate("document.querySelectorAll('main img').length"), 0)

    def test_says_what_is_wrong_in_a_sweep(self):
        for field, value, words in REFUSED_SWEEPS:
            before = self.evaluate(f"document.getElementById({field!r}).value")
            self.type(field, value)
            self.evaluate("document.getElementById('start').click()")
            self.assertIn(words, self.text("#sweep-mistake"), (field, value))
            self.assertEqual(self.text("#start"), "Simulate")
            self.assertEqual(self.evaluate("document.activeElement.getAttribute('aria-invalid')"), "true", (field, value))
            self.type(field, before)

    def test_leads_to_the_setting_that_keeps_it_from_simulating(self):
        self.type("ebn0", "much")
        self.type("iterations", "16")
        self.evaluate("document.getElementById('start').click()")
        self.assertEqual(self.evaluate("document.activeElement.id"), "iterations")
        self.type("iterations", "8")
        self.simulate(**{"from": 0, "to": 0, "step": 1, "block_errors": 5, "max_blocks": 10})

    # ---- Everywhere

    def test_fits_a_narrow_window(self):
        self.open(width=360, height=700)
        self.simulate(**{"from": 0, "to": 0, "step": 1, "block_errors": 5, "max_blocks": 10})
        self.assertLessEqual(self.evaluate("document.documentElement.scrollWidth"), 360)

    def test_names_what_is_seen_for_those_who_do_not_see(self):
        tree = self.browser.call("Accessibility.getFullAXTree")["nodes"]
        names = {(node["role"]["value"], node.get("name", {}).get("value", "")) for node in tree if not node["ignored"]}
        for role, name in (("radio", "scaled"), ("button", "Simulate"), ("button", "The next block"), ("group", "Processing units"),
                           ("textbox", "Iterations"), ("combobox", "Block size K"), ("textbox", "Eb/N0 (dB)")):
            self.assertTrue(any(role == each and name in other for each, other in names), (role, name, names))

    # ---- To look at

    def screenshots(self):
        for scheme in ("light", "dark"):
            self.open()
            self.browser.media(scheme=scheme)
            self.set(6144, 8, "scaled", 8, 0.6, 1)
            self.evaluate("document.querySelectorAll('#errors button')[3].click()")
            self.simulate(**{"from": 0, "to": 0.8, "step": 0.2, "block_errors": 20, "max_blocks": 300})
            self.screenshot(scheme)
        self.open(width=390, height=800)
        self.type("block-size", "41")
        self.screenshot("mistake")
        self.type("block-size", "512")
        self.simulate(**{"from": 0, "to": 0.8, "step": 0.2, "block_errors": 20, "max_blocks": 300})
        self.screenshot("narrow")

    def screenshot(self, name):
        time.sleep(0.5)
        picture = self.browser.call("Page.captureScreenshot", captureBeyondViewport=True, clip={
            "x": 0, "y": 0, "scale": 1, "width": self.evaluate("innerWidth"),
            "height": self.evaluate("document.documentElement.scrollHeight")})
        SCREENSHOTS.joinpath(name + ".png").write_bytes(base64.b64decode(picture["data"]))


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1] + (["PageInBrowser.screenshots"] if SCREENSHOTS else []))

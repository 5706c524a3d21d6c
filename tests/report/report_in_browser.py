"""The report in a browser: it loads quietly, draws the curves, shows the figures of the point under the pointer.

    report_in_browser.py REPORT_EXAMPLE [FOLDER]    with a folder, leaves pictures to look at there instead of testing
"""

import base64
import pathlib
import subprocess
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True  # the tree stays as it is
from browser import Browser

EXAMPLE = pathlib.Path(sys.argv[1]).resolve()
SCREENSHOTS = pathlib.Path(sys.argv[2]) if len(sys.argv) > 2 else None

TITLES = ["K = 512, 8 units, scaled, 8 iterations", "K = 512, 8 units, max-log, 8 iterations",
          "K = 512, floating point"]  # the reference behind the others
WITHOUT_ERRORS = 2  # points of which only a bound is known
POINTS = 10 + 10 + 9


class ReportInBrowser(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.folder = tempfile.TemporaryDirectory(prefix="morvik-report-")
        subprocess.run([EXAMPLE, cls.folder.name], check=True)
        cls.browser = Browser()

    @classmethod
    def tearDownClass(cls):
        cls.browser.close()
        cls.folder.cleanup()

    def setUp(self):
        self.open("report.html")

    def open(self, name, width=1200, height=900):
        self.browser.resize(width, height)
        self.browser.media()
        self.browser.move(0, 0)
        self.browser.load(pathlib.Path(self.folder.name, name).as_uri())

    def evaluate(self, expression):
        return self.browser.evaluate(expression)

    def count(self, selector):
        return self.evaluate(f"document.querySelectorAll({selector!r}).length")

    def text(self, selector):
        return self.evaluate(f"document.querySelector({selector!r}).textContent")

    def texts(self, selector):
        return self.evaluate(f"Array.from(document.querySelectorAll({selector!r}), found => found.textContent.trim())")

    def middle(self, selector, index=0):
        return self.evaluate(
            f"(() => {{ const box = document.querySelectorAll({selector!r})[{index}].getBoundingClientRect();"
            "return [box.x + box.width / 2, box.y + box.height / 2]; })()")

    def tip_is_shown(self):
        return self.evaluate("document.getElementById('tip').checkVisibility()")

    # ---- Coverage

    def shown(self, selector):
        return self.evaluate(f"Array.from(document.querySelectorAll({selector!r}), found => found.checkVisibility())")

    def test_coverage_shows_counts_as_bars(self):
        self.open("coverage.html")
        self.assertEqual((self.browser.messages, len(self.browser.requests)), ([], 1))
        self.assertEqual(self.texts(".situations tbody tr:first-child .count"), ["1 of 2", "0 of 0", "2 of 2"])
        self.assertEqual(self.texts(".missing code"), ["tie.forward.1"])
        self.assertEqual(self.texts(".impossible .why"), ["cannot occur: max-log has no table"])
        self.assertIn("The candidates are <equal>", self.texts(".text"))
        most, least, between = self.evaluate(
            "Array.from(document.querySelectorAll('.bar span'), bar => bar.getBoundingClientRect().width)")
        self.assertTrue(0 < least < between < most, (least, between, most))
        self.assertAlmostEqual(between / most, 0.5, delta=0.02)  # a thousand of a million

    def test_coverage_shows_what_is_missing_alone(self):
        self.open("coverage.html")
        self.assertEqual(self.shown(".situations code"), [True] * 5)
        self.browser.click(*self.middle("#only"))
        self.assertEqual(self.shown(".situations code"), [False, True, False, False, False])
        self.assertEqual(self.shown(".situations tbody"), [True, False, False])

    # ---- Loading

    def test_messages_would_be_noticed(self):
        self.browser.load("data:text/html,<script>console.error('said'); missing();</script><img src='http://127.0.0.1:1/x'>")
        self.browser.evaluate("new Promise(done => setTimeout(done, 300))")
        self.assertIn("said", self.browser.messages)
        self.assertTrue(any("missing is not defined" in message for message in self.browser.messages))
        self.assertIn("http://127.0.0.1:1/x", self.browser.requests)

    def test_loads_without_messages_and_without_a_network(self):
        self.assertEqual(self.browser.messages, [])
        self.assertEqual(len(self.browser.requests), 1, self.browser.requests)
        self.assertEqual(self.text("title"), "Error rates of a made-up decoder")

    def test_texts_are_never_markup(self):
        self.open("hostile.html")
        self.browser.move(*self.middle("#chart .marker", 3))
        self.assertTrue(self.tip_is_shown())
        self.assertEqual(self.browser.messages, [])
        self.assertEqual(len(self.browser.requests), 1, self.browser.requests)
        image = "<img src=x onerror=\"console.error('image')\"> & 'quoted' \\\" ?"
        script = "</script><script>console.error('script')</script>"
        self.assertEqual(self.text("h1").strip(), image)
        self.assertEqual(self.texts("#legend button")[0], image)
        self.assertEqual(self.texts("#legend button")[2], script)
        self.assertEqual(self.text("pre"), script)
        self.assertEqual(self.count("img, #tip script, table script"), 0)

    # ---- What is drawn

    def test_shows_every_curve(self):
        self.assertEqual(self.texts("#legend button"), TITLES)
        lines = self.evaluate("Array.from(document.querySelectorAll('#chart path.curve'), line => {"
                              "const box = line.getBBox(); return [box.width, box.height, line.getTotalLength()]; })")
        self.assertEqual(len(lines), len(TITLES))
        for width, height, length in lines:
            self.assertGreater(width, 500)
            self.assertGreater(height, 200)
            self.assertGreater(length, 600)
        self.assertEqual(self.count("#chart .marker"), POINTS)
        self.assertEqual(self.count("#chart .own .bar"), 20, "a bar or an arrow for each point")
        self.assertEqual(self.count("#chart .reference .bar"), 0)

    def test_points_lie_where_their_rates_are(self):
        (x0, y0), (x1, _), (x4, y4) = [self.middle("#chart .own[data-curve='0'] .marker", i) for i in (0, 1, 4)]
        self.assertAlmostEqual((x4 - x0) / (x1 - x0), 4, delta=0.01)  # 0, 0.25 and 1 dB
        decades = self.evaluate("Array.from(document.querySelectorAll('#chart .major'), line => line.getBoundingClientRect())"
                                ".filter(box => box.height < box.width).map(box => box.y)")
        self.assertEqual(self.texts("#chart text")[:3], ["100", "10−1", "10−2"], "the rows are decades, from the top")
        self.assertAlmostEqual((y0 - decades[0]) / (decades[1] - decades[0]), 1.256, delta=0.02)  # 5.55e-02
        # Block error rates of 303 / 320 and 301 / 4224 are 1.1234 decades apart, and bit error rates as well.
        self.assertAlmostEqual((y4 - y0) / (decades[1] - decades[0]), 1.1234, delta=0.02)

    def test_covered_curves_show_on_both_sides(self):
        widths = ("Array.from(document.querySelectorAll('#chart .own path.curve'),"
                  "line => parseFloat(getComputedStyle(line).strokeWidth))")
        self.assertEqual(self.evaluate(widths), [2, 2])
        self.open("hostile.html")
        self.assertEqual(self.evaluate(widths), [4, 2])

    def test_references_are_dashed(self):
        dashes = self.evaluate("Array.from(document.querySelectorAll('#chart path.curve'), line => "
                               "[line.parentNode.classList.contains('reference'), getComputedStyle(line).strokeDasharray])")
        self.assertEqual(len(dashes), 3)
        for reference, dash in dashes:
            self.assertEqual(dash != "none", reference)

    def test_the_other_rate_can_be_chosen(self):
        name = "#chart .name:last-of-type"
        self.assertIn("Bit error rate", self.text(name))
        path = self.evaluate("document.querySelector('#chart path.curve').getAttribute('d')")
        self.browser.click(*self.middle(".choice", 1))
        self.assertIn("Block error rate", self.text(name))
        self.assertIn("Block error rate", self.text("#chart desc"))
        self.assertNotEqual(self.evaluate("document.querySelector('#chart path.curve').getAttribute('d')"), path)
        self.assertEqual(self.count("#chart .marker"), POINTS)

    def test_bars_can_be_left_out(self):
        self.browser.click(*self.middle("#bars"))
        self.assertEqual(self.count("#chart .bar"), WITHOUT_ERRORS, "the arrows of the bounds stay")

    def test_series_can_be_hidden_and_shown_again(self):
        button = self.middle("#legend button", 1)
        self.browser.click(*button)
        self.assertEqual(self.count("#chart path.curve"), 2)
        self.assertEqual(self.count("#chart [data-curve='1']"), 0)
        self.assertEqual(self.evaluate("document.querySelectorAll('#legend button')[1].getAttribute('aria-pressed')"), "false")
        self.assertNotIn(TITLES[1], self.text("#chart desc"))
        self.browser.click(*button)
        self.assertEqual(self.count("#chart path.curve"), 3)

    # ---- The figures of a point

    def test_hovering_shows_the_figures(self):
        self.assertFalse(self.tip_is_shown())
        self.browser.move(*self.middle("#chart .own[data-curve='0'] .marker", 4))
        self.assertTrue(self.tip_is_shown())
        self.assertEqual(self.text("#tip strong"), TITLES[0])
        figures = dict(zip(self.texts("#tip dt"), self.texts("#tip dd")))
        self.assertEqual(figures, {
            "Eb/N0": "1.00 dB", "BER": "4.18e-03" + "3.73e-03 … 4.67e-03", "BLER": "7.13e-02" + "6.36e-02 … 7.98e-02",
            "Blocks": "4\u202f224", "Bit errors": "9\u202f030", "Block errors": "301", "Clipped": "2.72e-03"})
        self.assertEqual(self.evaluate("document.querySelector('tr.marked').id"), "p4")
        self.browser.move(3, 3)
        self.assertFalse(self.tip_is_shown())
        self.assertEqual(self.count("tr.marked"), 0)

    def test_hovering_over_a_bound_says_that_no_error_was_seen(self):
        self.browser.move(*self.middle("#chart .own[data-curve='1'] .marker", 9))
        figures = dict(zip(self.texts("#tip dt"), self.texts("#tip dd")))
        self.assertEqual(figures["BLER"], "< 3.00e-06no error seen")
        self.assertEqual(figures["Block errors"], "0")

    def test_the_figures_stay_within_the_chart(self):
        for index in range(POINTS):
            self.browser.move(*self.middle("#chart .marker", index))
            self.assertTrue(self.tip_is_shown())
            self.assertTrue(self.evaluate(
                "(() => { const tip = document.getElementById('tip').getBoundingClientRect();"
                "const chart = document.getElementById('chart').getBoundingClientRect();"
                "return tip.left >= chart.left && tip.right <= chart.right && tip.top >= chart.top && tip.bottom <= chart.bottom; })()"))

    def test_arrow_keys_go_from_point_to_point(self):
        self.evaluate("document.getElementById('chart').focus()")
        shown = []
        for key in ("ArrowRight", "ArrowRight", "ArrowDown", "ArrowLeft", "ArrowUp"):
            self.browser.press(key)
            shown.append((self.text("#tip strong"), self.texts("#tip dd")[0]))
        self.assertEqual(shown[0], (TITLES[2], "−0.10 dB"))  # references are drawn first
        self.assertEqual(shown[1], (TITLES[2], "0.15 dB"))
        self.assertEqual(shown[2][0], TITLES[0])
        self.assertEqual(shown[3], (TITLES[0], "0.00 dB"))
        self.assertEqual(shown[4][0], TITLES[2])
        self.browser.press("Escape")
        self.assertFalse(self.tip_is_shown())

    def test_the_table_has_every_point(self):
        rows = self.evaluate("Array.from(document.querySelectorAll('.points tbody'), body => body.rows.length - 1)")
        self.assertEqual(rows, [10, 10, 9])
        self.assertEqual(
            self.texts("#p4 td"),
            ["1.00", "4.18e-03", "3.73e-03 … 4.67e-03", "7.13e-02", "6.36e-02 … 7.98e-02", "4\u202f224", "9\u202f030", "301", "2.72e-03"])

    # ---- Against iterations

    def test_iterations_are_an_axis_where_there_are_several(self):
        self.assertEqual(self.count("input[name=axis]"), 0)
        self.open("iterations.html")
        self.assertEqual(len(self.texts("#legend button")), 12)
        self.browser.click(*self.middle(".choice", 3))
        self.assertEqual(self.texts("#legend button"), [f"K = 512, 8 units, scaled, {place:.2f} dB" for place in (0, 0.25, 0.5, 0.75, 1)])
        self.assertEqual(self.count("#chart path.curve"), 5)
        self.assertEqual(self.count("#chart .marker"), 60)
        self.assertIn("against iterations", self.text("#chart desc"))
        (x0, _), (x1, _), (x11, _) = [self.middle("#chart .own[data-curve='0'] .marker", i) for i in (0, 1, 11)]
        self.assertAlmostEqual((x11 - x0) / (x1 - x0), 11, delta=0.02)
        self.assertEqual(self.texts("#chart text")[-14:-2], [str(i) for i in range(1, 13)], "whole numbers")
        self.browser.move(*self.middle("#chart .own[data-curve='1'] .marker", 2))
        self.assertEqual(self.text("#tip strong"), "K = 512, 8 units, scaled, 0.25 dB")
        self.assertEqual(dict(zip(self.texts("#tip dt"), self.texts("#tip dd")))["Iterations"], "3")
        self.assertEqual(self.texts("tr.marked td")[0], "0.25")
        self.browser.click(*self.middle(".choice", 2))
        self.assertEqual(len(self.texts("#legend button")), 12)
        self.assertIn("against Eb/N0", self.text("#chart desc"))
        self.assertEqual(self.browser.messages, [])

    def test_iterations_are_shown_first_where_there_is_one_ebn0(self):
        self.open("one_ebn0.html")
        self.assertEqual(self.count("#chart path.curve"), 1)
        self.assertIn("against iterations", self.text("#chart desc"))
        self.assertTrue(self.evaluate("document.querySelector('input[value=iterations]').checked"))

    def test_a_family_has_colours_that_run(self):
        self.open("iterations.html")
        stroke = "Array.from(document.querySelectorAll('#chart path.curve'), line => getComputedStyle(line).stroke)"
        self.assertEqual(len(set(self.evaluate(stroke))), 12)
        light = [brightness(colour) for colour in self.evaluate(stroke)]
        self.assertEqual(light, sorted(light, reverse=True))
        self.browser.media(scheme="dark")
        dark = [brightness(colour) for colour in self.evaluate(stroke)]
        self.assertEqual(dark, sorted(dark))

    # ---- Everywhere

    def test_the_dark_page_is_dark(self):
        look = ("[getComputedStyle(document.body).backgroundColor, getComputedStyle(document.body).color,"
                "getComputedStyle(document.querySelector('#chart path.curve')).stroke]")
        light = self.evaluate(look)
        self.browser.media(scheme="dark")
        dark = self.evaluate(look)
        for before, after in zip(light, dark):
            self.assertNotEqual(before, after)
        self.assertLess(brightness(dark[0]), 40)
        self.assertGreater(brightness(dark[1]), 200)

    def test_prints_on_white_without_controls(self):
        self.browser.media(kind="print", scheme="dark")
        self.assertEqual(self.evaluate("getComputedStyle(document.body).backgroundColor"), "rgb(255, 255, 255)")
        self.assertFalse(self.evaluate("document.getElementById('bars').checkVisibility()"))
        self.assertFalse(self.evaluate("document.querySelector('.choice input:not(:checked) + span').checkVisibility()"))
        self.assertTrue(self.evaluate("document.querySelector('#chart svg').checkVisibility()"))

    def test_prints_whole_tables(self):
        self.browser.resize(718, 1000)  # what A4 has within its margins
        self.browser.media(kind="print")
        self.assertLessEqual(self.evaluate("document.documentElement.scrollWidth"), 718)
        self.assertLessEqual(self.evaluate("document.querySelector('.points').offsetWidth"), 718)

    def test_fits_a_narrow_window(self):
        self.open("report.html", width=360, height=700)
        self.assertLessEqual(self.evaluate("document.documentElement.scrollWidth"), 360)
        self.assertEqual(self.count("#chart .marker"), POINTS)

    def test_is_redrawn_for_another_width(self):
        before = self.evaluate("document.querySelector('#chart svg').viewBox.baseVal.width")
        self.browser.resize(700, 900)
        self.evaluate("new Promise(done => setTimeout(done, 100))")
        self.assertLess(self.evaluate("document.querySelector('#chart svg').viewBox.baseVal.width"), before)
        self.assertEqual(self.browser.messages, [])

    def test_names_what_is_seen_for_those_who_do_not_see(self):
        self.assertEqual(self.text("#chart-title"), "Bit error rate (BER)")
        for title in TITLES:
            self.assertIn(title, self.text("#chart-description"))
        tree = self.browser.call("Accessibility.getFullAXTree")["nodes"]
        names = {(node["role"]["value"], node.get("name", {}).get("value")) for node in tree if not node["ignored"]}
        self.assertIn(("table", "All points"), names)
        self.assertIn(("radio", "BER"), names)
        self.assertIn(("image", "Bit error rate (BER)"), names)

    # ---- To look at

    def screenshots(self):
        for scheme in ("light", "dark"):
            self.open("report.html", height=2500)
            self.browser.media(scheme=scheme)
            self.browser.move(*self.middle("#chart .own[data-curve='0'] .marker", 5))
            self.screenshot(f"hover-{scheme}")
        self.open("report.html", width=390, height=700)
        self.screenshot("narrow")
        self.open("hostile.html")
        self.screenshot("hostile")
        self.open("iterations.html")
        self.browser.click(*self.middle(".choice", 3))
        self.screenshot("iterations")
        self.open("report.html")
        self.browser.media()
        SCREENSHOTS.joinpath("printed.pdf").write_bytes(base64.b64decode(self.browser.call("Page.printToPDF")["data"]))

    def screenshot(self, name):
        picture = self.browser.call("Page.captureScreenshot", captureBeyondViewport=True, clip={
            "x": 0, "y": 0, "scale": 1, "width": self.evaluate("innerWidth"),
            "height": self.evaluate("document.documentElement.scrollHeight")})
        SCREENSHOTS.joinpath(name + ".png").write_bytes(base64.b64decode(picture["data"]))


def brightness(colour):
    """Of a text such as rgb(1, 2, 3), 0 to 255."""
    return sum(int(part) for part in colour[4:-1].split(",")) / 3


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1] + (["ReportInBrowser.screenshots"] if SCREENSHOTS else []))

"""Plots as files: they are what their names say, in the size that is meant, and hold every series.

    picture_files.py REPORT_EXAMPLE
"""

import pathlib
import re
import struct
import subprocess
import sys
import tempfile
import unittest
import xml.etree.ElementTree
import zlib

EXAMPLE = pathlib.Path(sys.argv[1]).resolve()
SVG = "{http://www.w3.org/2000/svg}"


class PictureFiles(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.folder = tempfile.TemporaryDirectory(prefix="morvik-pictures-")
        subprocess.run([EXAMPLE, cls.folder.name], check=True, cwd=cls.folder.name)

    @classmethod
    def tearDownClass(cls):
        cls.folder.cleanup()

    def content(self, name):
        return pathlib.Path(self.folder.name, name).read_bytes()

    def svg(self, name):
        return xml.etree.ElementTree.fromstring(self.content(name))

    def test_svg_holds_every_series(self):
        picture = self.svg("plot.svg")
        texts = ["".join(text.itertext()).strip() for text in picture.iter(SVG + "text")]
        for title in ("K = 512, 8 units, scaled, 8 iterations", "K = 512, 8 units, max-log, 8 iterations",
                      "K = 512, floating point", "Error rates of a made-up decoder", "Bit error rate (BER)",
                      "Block error rate (BLER)", "Bars: 95 % confidence.  Open triangles: no error was seen, the rate is lower."):
            self.assertIn(title, texts)
        self.assertEqual((picture.get("width"), picture.get("role")), ("1000", "img"))
        self.assertEqual([title.text for title in picture.iter(SVG + "title")], ["Error rates of a made-up decoder"])
        self.assertIn("K = 512, floating point (reference)", picture.find(SVG + "desc").text)

    def test_svg_draws_points_bars_and_bounds(self):
        text = self.content("plot.svg").decode()
        colours = {name: f"rgb({value[0]:3}, {value[1]:3}, {value[2]:3})"
                   for name, value in {"scaled": (0, 114, 178), "max-log": (213, 94, 0), "floating": (107, 107, 107)}.items()}
        symbols = lambda symbol, colour: len(re.findall(rf"<use xlink:href='#gpPt{symbol}'[^>]*color='{re.escape(colour)}'", text))
        # In both panels and the legend: filled circles and squares, open circles; triangles at the bounds.
        self.assertEqual(symbols(6, colours["scaled"]), 9 + 9 + 1)
        self.assertEqual(symbols(4, colours["max-log"]), 9 + 9 + 1)
        self.assertEqual(symbols(5, colours["floating"]), 9 + 9 + 1)
        self.assertEqual(symbols(9, colours["scaled"]), 2)
        self.assertEqual(symbols(9, colours["max-log"]), 2)
        self.assertIn("stroke-dasharray", text)

    def test_svg_shows_covered_curves_on_both_sides(self):
        path = r"stroke-width=\"([0-9.]+)\"[^>]*>\s*<path stroke='rgb\(  0, 114, 178\)'"
        widths = lambda name: set(re.findall(path, self.content(name).decode()))
        bars = {"1.20"}
        self.assertEqual(widths("plot.svg"), {"2.00"} | bars)
        self.assertEqual(widths("hostile.svg"), {"4.00"} | bars)

    def test_svg_has_markup_in_titles_as_text(self):
        picture = self.svg("hostile.svg")
        texts = ["".join(text.itertext()).strip() for text in picture.iter(SVG + "text")]
        self.assertIn("</script><script>console.error('script')</script>", texts)
        self.assertIn("<img src=x onerror=\"console.error('image')\"> & 'quoted' \\\" ?", texts)
        self.assertIn("'; system 'touch injected' # `touch injected` $(touch injected) {/:Bold x}_1^2 @HOME %s", texts)
        self.assertFalse(pathlib.Path(self.folder.name, "injected").exists())
        self.assertEqual(list(picture.iter(SVG + "script")), [])

    def test_png_is_a_picture_of_twice_the_size(self):
        content = self.content("plot.png")
        self.assertEqual(content[:8], b"\x89PNG\r\n\x1a\n")
        width, height, depth, kind = struct.unpack(">IIBB", content[16:26])
        self.assertEqual(width, 2000)
        self.assertEqual(height, 2 * int(self.svg("plot.svg").get("height")))
        self.assertIn(b"IEND", content[-12:])
        data, place = b"", 8
        while place < len(content):
            length, name = struct.unpack(">I4s", content[place:place + 8])
            data += content[place + 8:place + 8 + length] if name == b"IDAT" else b""
            place += 12 + length
        pixels = zlib.decompress(data)
        self.assertEqual((depth, kind, len(pixels)), (8, 2, height * (1 + 3 * width)), "true colour")
        self.assertGreater(len(set(pixels)), 100)

    def test_pdf_is_one_page_of_the_size(self):
        content = self.content("plot.pdf")
        self.assertEqual(content[:5], b"%PDF-")
        self.assertEqual(content.rstrip()[-5:], b"%%EOF")
        packed = [zlib.decompressobj().decompress(part) for part in re.findall(rb"stream\r?\n(x.*?)endstream", content, re.S)]
        boxes = re.findall(rb"/MediaBox \[ ?([0-9. ]+) ?\]", content + b"".join(packed))
        self.assertEqual(len(boxes), 1)
        _, _, width, height = map(float, boxes[0].split())
        self.assertAlmostEqual(width, 1000, delta=1)
        self.assertAlmostEqual(height, int(self.svg("plot.svg").get("height")), delta=1)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])

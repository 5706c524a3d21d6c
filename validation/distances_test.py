"""The arithmetic of the comparison: interpolation between points, and the uncertainty of what comes out; and that the
document has what the results give.

    distances_test.py PROGRAMS    PROGRAMS is the folder of morvik and morvik_variants
"""

import math
import pathlib
import random
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True  # writes no bytecode into the tree
from distances import Estimate, Point, crossing, paired_step, read_curves, read_reference
import loss
import scales
from needed import ITERATIONS, SIMULATIONS, TYPES, needed
from validate import DOCUMENT, RESULTS, pictures, with_tables


def curve(start, per_decade, blocks=1000000):
    """Points every 0.5 dB; the rate is 1 at `start` dB and falls by a factor of ten every `per_decade` dB."""
    return [Point(db, blocks, round(blocks * 10 ** (-(db - start) / per_decade))) for db in (1, 1.5, 2, 2.5, 3)]


class Crossing(unittest.TestCase):
    def test_lies_where_a_straight_line_of_the_logarithm_has_the_rate(self):
        self.assertAlmostEqual(crossing(curve(0.25, 1), 0.1).db, 1.25, places=4)
        self.assertAlmostEqual(crossing(curve(0.25, 1), 0.01).db, 2.25, places=4)

    def test_takes_points_in_any_order(self):
        points = curve(0.25, 1)
        self.assertEqual(crossing(points[::-1], 0.1), crossing(points, 0.1))

    def test_takes_a_point_that_has_the_very_rate(self):
        self.assertAlmostEqual(crossing([Point(1, 100, 10), Point(2, 1000, 10)], 0.1).db, 1)

    def test_is_none_where_the_points_do_not_reach_the_rate(self):
        self.assertIsNone(crossing(curve(0.25, 1), 0.5))
        self.assertIsNone(crossing(curve(0.25, 1), 0.001))

    def test_does_not_reach_down_to_a_point_without_errors(self):
        self.assertIsNone(crossing([Point(1, 100, 50), Point(2, 100, 0)], 0.1))

    def test_deviation_is_that_of_repeated_simulations(self):
        rates = {1.0: 0.3, 1.5: 0.03}
        draw = random.Random(1)

        def simulated():
            return [Point(db, 400, sum(draw.random() < rate for _ in range(400))) for db, rate in rates.items()]

        found = [crossing(simulated(), 0.1) for _ in range(400)]
        mean = sum(one.db for one in found) / len(found)
        spread = math.sqrt(sum((one.db - mean) ** 2 for one in found) / (len(found) - 1))
        expected = math.sqrt(sum(one.deviation ** 2 for one in found) / len(found))
        self.assertLess(abs(spread / expected - 1), 0.15)

    def test_deviations_of_a_difference_add_as_squares(self):
        difference = Estimate(2, 0.03) - Estimate(1, 0.04)
        self.assertAlmostEqual(difference.db, 1)
        self.assertAlmostEqual(difference.deviation, 0.05)

    def test_shows_the_95_percent_interval(self):
        self.assertEqual(str(Estimate(0.1234, 0.01)), "0.123 ± 0.020")
        self.assertEqual(str(Estimate(-0.0001, 0.01)), "0.000 ± 0.020")


class PairedStep(unittest.TestCase):
    def test_is_the_distance_of_the_curves(self):
        step = paired_step(curve(0.25, 1), curve(0.35, 1), dict.fromkeys((1, 1.5, 2, 2.5, 3), 0), 0.1)
        self.assertAlmostEqual(step.db, 0.1, places=4)
        self.assertEqual(step.deviation, 0)

    def test_deviation_is_that_of_repeated_simulations(self):
        both, one = {1.0: 0.28, 1.5: 0.025}, {1.0: 0.02, 1.5: 0.005}  # both fail; exactly one fails
        draw = random.Random(2)

        def simulated():
            before, after, disagreements = [], [], {}
            for db in both:
                joint = sum(draw.random() < both[db] for _ in range(400))
                first, second = (sum(draw.random() < one[db] for _ in range(400)) for _ in range(2))
                before.append(Point(db, 400, joint + first))
                after.append(Point(db, 400, joint + second))
                disagreements[db] = first + second
            return paired_step(before, after, disagreements, 0.1)

        found = [simulated() for _ in range(300)]
        spread = math.sqrt(sum(step.db ** 2 for step in found) / len(found))  # the curves are equal
        expected = math.sqrt(sum(step.deviation ** 2 for step in found) / len(found))
        self.assertLess(abs(spread / expected - 1), 0.15)


class Files(unittest.TestCase):
    def read(self, text, reader, *keys):
        with tempfile.TemporaryDirectory() as folder:
            path = pathlib.Path(folder) / "rates.csv"
            path.write_text(text, encoding="utf-8")
            return reader(path, *keys)

    def test_reads_a_reference_behind_its_comments(self):
        points = self.read("# title: x\nebn0_db,esn0_db,frames,frame_errors\n0.50,-4,200,20\n", read_reference)
        self.assertEqual(points, [Point(0.5, 200, 20)])

    def test_divides_results_into_curves(self):
        curves = self.read("num_pu,ebn0_db,blocks,block_errors\n2,1,9,3\n4,1,9,2\n2,1.5,9,1\n", read_curves, "num_pu")
        self.assertEqual(curves, {("2",): [Point(1, 9, 3), Point(1.5, 9, 1)], ("4",): [Point(1, 9, 2)]})


class Simulations(unittest.TestCase):
    def test_of_few_bits_have_the_rate_for_all_iterations(self):
        """The shortest form of `scripts/validate units` and `undivided`."""
        for name, simulation in SIMULATIONS.items():
            short = simulation._replace(scope=simulation.scope._replace(sizes=(40,), bits=100000))
            with tempfile.TemporaryDirectory() as folder:
                path = pathlib.Path(folder) / f"{name}.csv"
                short.run(PROGRAMS, path)
                found = needed(path)
                header = path.read_text(encoding="utf-8").splitlines()[0]
            self.assertEqual(set(found), {(40, algorithm, each) for algorithm in TYPES for each in ITERATIONS})
            self.assertTrue(all(1 < estimate.db < 5 for estimate in found.values()), found)
            self.assertEqual(header, (RESULTS / f"{name}.csv").read_text(encoding="utf-8").splitlines()[0])


    def test_behind_the_chain_have_the_rate_for_all_decoders(self):
        """The shortest form of `scripts/validate loss`."""
        short = loss.Loss((loss.Format("0.50", "16qam", 16, 80),), loss.DECODERS, 20000)
        with tempfile.TemporaryDirectory() as folder:
            path = pathlib.Path(folder) / "loss.csv"
            short.run(PROGRAMS, path)
            ((needed_db, more, steps),) = loss.estimates(path).values()
            header = path.read_text(encoding="utf-8").splitlines()[0]
        self.assertTrue(5 < needed_db.db < 9, needed_db)
        self.assertTrue(-0.2 < more < 0.5, more)
        self.assertEqual(len(steps), 3)
        self.assertEqual(header, (RESULTS / "loss.csv").read_text(encoding="utf-8").splitlines()[0])


class Document(unittest.TestCase):
    def test_has_the_pictures_that_the_results_give(self):
        for name, picture in pictures(RESULTS).items():
            self.assertEqual((DOCUMENT.parent / name).read_bytes(), picture, name)

    def test_has_the_tables_that_the_results_give(self):
        text = DOCUMENT.read_text(encoding="utf-8")
        self.assertEqual(with_tables(text), text)
        text = scales.DOCUMENT.read_text(encoding="utf-8")
        self.assertEqual(scales.with_table(text, RESULTS / "scales.csv"), text)

    def test_default_scales_are_within_a_few_hundredths_of_a_decibel_of_the_best(self):
        lines = scales.lines_of(RESULTS / "scales.csv")
        self.assertEqual(len(lines), len(scales.MODULATIONS) * len(scales.RATES))
        for line, rows in lines.items():
            self.assertGreater(min(scales.losses(rows)[1]), -0.03, line)


if __name__ == "__main__":
    PROGRAMS = pathlib.Path(sys.argv.pop(1))
    unittest.main()

"""A turbo decoder core, written from the rules of docs/arithmetic.md alone, without a look at the model.

A column of metrics has the shape (8 states, blocks, segments), branch metrics (4, steps of a segment, blocks,
segments). The steps of a recursion follow each other, as in the hardware; blocks and segments are computed side by
side. All values are aligned words: an eighth is 16.
"""

import numpy as np

STATES = np.arange(8)
FORMAT_MIN, FORMAT_MAX = -2048, 2032  # soft values and branch metrics, rules 4 and 5
EIGHTH_MASK = ~15
BORDER_MASK = np.int16(~127)


# The trellis: the picture, TS 36.212 clause 5.1.3.2.1.


def encoder_step(state, bit):
    """The next state and the parity bit."""
    newest, middle, oldest = state >> 2 & 1, state >> 1 & 1, state & 1
    fed_back = bit ^ middle ^ oldest
    return fed_back << 2 | newest << 1 | middle, fed_back ^ newest ^ oldest


SUCCESSOR = np.array([[encoder_step(state, bit)[0] for state in STATES] for bit in (0, 1)])
PREDECESSOR = np.argsort(SUCCESSOR, axis=1)


# Rules 3, 7 and 9: decisions.


def correction_table(points=16):
    """Rule 9, by d modulo 2^16."""
    d = np.arange(65536).astype(np.uint16).astype(np.int16).astype(int)
    magnitude = np.where(d < 0, -d - 1, d)
    fraction_bits = min(max(int(np.log2(points)) - 3, 0), 3)
    r = (magnitude >> (7 - fraction_bits)) / 2**fraction_bits
    return np.where(r < points, np.floor(8 * np.log1p(np.exp(-r)) + 0.5) * 16, 0).astype(np.int16)


class Mod:
    """The greater candidate. Nothing is ever pending."""

    @staticmethod
    def decide(c1, c2):
        (metric1, _), (metric2, _) = c1, c2
        return np.where(metric1 - metric2 < 0, metric2, metric1), None

    decide_last = decide


class ModSharp:
    """The greater candidate and the correction that was pending with it; that of this decision is now pending."""

    table = correction_table()

    @classmethod
    def decide(cls, c1, c2):
        (metric1, pending1), (metric2, pending2) = c1, c2
        d = metric1 - metric2
        value = np.where(d < 0, metric2 + pending2, metric1 + pending1)
        return value, cls.table[d.view(np.uint16)]

    @classmethod
    def decide_last(cls, c1, c2):
        value, pending = cls.decide(c1, c2)
        return value + pending, None


def nothing_pending(column):
    return column, np.zeros_like(column)


def part(candidate, index):
    """The metrics of some states, with what is pending with them."""
    metric, pending = candidate
    return metric[index], None if pending is None else pending[index]


def plus(candidate, addend):
    metric, pending = candidate
    return metric + addend, pending


# Rules 4 to 6, 8, 10 and 12: a pass.


def aligned_inputs(values):
    """Rule 4."""
    shifted = (np.asarray(values, np.int64) << 8).astype(np.int32)
    return (np.clip(shifted, -32768, 32512) >> 8) * 16


def branch_sums(intrinsic, parity):
    """Rule 5, before clipping: g0 ... g3 in front of the shape of the arguments."""
    same, opposed = 2 * intrinsic + parity, 2 * intrinsic - parity
    return np.stack([same, opposed, opposed, same])


def branch_metrics(intrinsic, parity):
    return np.clip(branch_sums(intrinsic, parity), FORMAT_MIN, FORMAT_MAX).astype(np.int16)


def forward_step(engine, column, g):
    zero, one = PREDECESSOR
    return engine.decide(plus(part(column, one), g[one // 2]), plus(part(column, zero), -g[zero // 2]))


def backward_step(engine, column, g):
    zero, one = SUCCESSOR
    return engine.decide(plus(part(column, one), g[STATES // 2]), plus(part(column, zero), -g[STATES // 2]))


def best_path(engine, bit, forward, backward, g):
    """Rule 8: the best branch of a bit."""
    through = forward + backward[SUCCESSOR[bit]]
    pairs = engine.decide(nothing_pending(through[1::2]), nothing_pending(through[0::2]))
    pairs = plus(pairs, g if bit else -g)
    halves = engine.decide(part(pairs, slice(0, 4, 2)), part(pairs, slice(1, 4, 2)))
    return engine.decide_last(part(halves, 0), part(halves, 1))[0]


def known_state(shape):
    column = np.full((8, *shape), -16384, np.int16)
    column[0] = 0
    return column


def unknown_state(shape):
    return np.zeros((8, *shape), np.int16)


def tail_column(systematic, parity, clipped=False):
    """Rule 12: the one path from each state to state 0; its three steps are the first axis of both arguments."""
    sums = [branch_sums(s // 2, p) for s, p in zip(systematic, parity)]
    if clipped:
        sums = [np.clip(g, FORMAT_MIN, FORMAT_MAX) for g in sums]
    column = []
    for state in STATES:
        metric = 0
        for g in sums:
            bit = int(SUCCESSOR[1][state] < 4)  # the encoder feeds in what makes the newest delay 0
            metric = metric + (g if bit else -g)[state // 2]
            state = SUCCESSOR[bit][state]
        column.append(metric)
    return np.stack(column).astype(np.int16) & BORDER_MASK


# Rules 17 and 18.


def segment_count(block_size, units):
    segments = 1
    while segments < 4 * units and block_size >= 128 * segments:
        segments *= 2
    return segments


def window_starts(steps):
    """The first step of each window of a segment, and the end of the last."""
    starts = [0]
    while steps - starts[-1] >= 128:
        starts.append(starts[-1] + 64)
    rest = steps - starts[-1]
    if rest > 64:
        starts.append(starts[-1] + (rest + 1) // 2)
    return [*starts, steps]


class ConstituentDecoder:
    """The passes over one of the two codes, and the columns that stay between them."""

    def __init__(self, engine, streams, parity, tail, segments):
        blocks, block_size = parity.shape
        self.engine, self.segments = engine, segments
        self.systematic, self.parity = streams, parity
        self.tail = tail
        self.windows = window_starts(block_size // segments)
        shape = (blocks, segments)
        self.forward_borders = unknown_state(shape)  # where each segment starts, rule 19
        self.forward_borders[..., 0] = known_state((blocks,))
        self.backward_borders = [unknown_state(shape) for _ in self.windows[1:]]  # where each window ends, rule 20
        self.first_pass = True

    def by_segments(self, values):
        blocks, block_size = values.shape
        return values.reshape(blocks, self.segments, block_size // self.segments).transpose(2, 0, 1)

    def forward(self, g):
        """Rules 6, 11 and 19: the columns before each step."""
        columns = [nothing_pending(self.forward_borders)]
        for step in range(self.windows[-1]):
            columns.append(forward_step(self.engine, columns[-1], g[:, step]))
        reached = columns.pop()[0]
        self.forward_borders = self.forward_borders.copy()
        self.forward_borders[..., 1:] = reached[..., :-1] & BORDER_MASK
        return np.stack([metrics for metrics, _ in columns], axis=1)

    def backward(self, g):
        """Rules 6, 11 and 20: the columns behind each step."""
        rows = len(self.windows) - 1
        behind = [None] * self.windows[-1]
        start = self.start_columns(0)
        for row in range(rows):
            next_start = self.start_columns(row + 1) if row + 1 < rows else None
            column = nothing_pending(start)
            for step in reversed(range(self.windows[row], self.windows[row + 1])):
                behind[step] = column[0]
                column = backward_step(self.engine, column, g[:, step])
            if row > 0:
                self.backward_borders[row - 1] = column[0] & BORDER_MASK
            else:
                self.backward_borders[-1] = self.backward_borders[-1].copy()
                self.backward_borders[-1][..., :-1] = column[0][..., 1:] & BORDER_MASK
            start = next_start
        return np.stack(behind, axis=1)

    def start_columns(self, row):
        """What the windows of a row start from, as far as it is stored by now."""
        last_row = row == len(self.windows) - 2
        start = unknown_state(self.forward_borders.shape[1:]) if self.first_pass else self.backward_borders[row].copy()
        if last_row:
            start[..., -1] = self.tail
        return start

    def run(self, a_priori):
        """One half-iteration: ratios and the intrinsic values that they contain."""
        intrinsic = intrinsic_values(a_priori, self.systematic)
        g = branch_metrics(self.by_segments(intrinsic), self.by_segments(self.parity))
        forward, backward = self.forward(g), self.backward(g)
        one, zero = (best_path(self.engine, bit, forward, backward, g) for bit in (1, 0))
        self.first_pass = False
        ratios = (one - zero).transpose(1, 2, 0).reshape(intrinsic.shape).astype(int)
        return ratios, intrinsic


# Rules 13 and 14.


def divided(values, divisor):
    """Truncated toward zero."""
    return np.trunc(values / divisor).astype(int)


def intrinsic_values(a_priori, systematic):
    return divided((divided(a_priori, 2) & EIGHTH_MASK) + systematic, 2)


def extrinsic_values(ratios, intrinsic, scale):
    x = np.trunc((ratios - 4 * intrinsic) * scale).astype(int)
    x = np.clip(x, FORMAT_MIN, FORMAT_MAX)
    return x if scale == 1 else x & EIGHTH_MASK


# Rules 15 and 16.


def interleaver(block_size, f1, f2):
    """TS 36.212, clause 5.1.3.2.3: value j of the interleaved order is value Pi(j) of the natural one."""
    j = np.arange(block_size)
    return (f1 * j + f2 * j * j) % block_size


def decode(soft_values, permutation, units, algorithm, iterations, tail_clipped=False):
    """Ratios, in eighths, of blocks of one size: soft_values[block, position, stream]. 0 or more decides for 1.

    tail_clipped makes the mistake against which rule 12 warns."""
    values = aligned_inputs(soft_values)
    blocks, block_size = values.shape[0], values.shape[1] - 4
    segments = segment_count(block_size, units)
    engine = ModSharp if algorithm == 2 else Mod
    scale = 0.75 if algorithm == 1 else 1
    systematic, parity1, parity2 = np.moveaxis(values[:, :block_size], 2, 0)
    # The four rows of the tail, read row by row: x z x z x z of the first encoder, then of the second.
    tail = values[:, block_size:].reshape(blocks, 2, 3, 2)
    tail1, tail2 = (tail_column(*np.moveaxis(tail[:, code], (1, 2), (1, 0)), tail_clipped) for code in (0, 1))
    natural = ConstituentDecoder(engine, systematic, parity1, tail1, segments)
    interleaved = ConstituentDecoder(engine, systematic[:, permutation], parity2, tail2, segments)

    extrinsic = np.zeros((blocks, block_size), int)  # in natural order
    for _ in range(iterations):
        ratios, intrinsic = interleaved.run(extrinsic[:, permutation])
        extrinsic[:, permutation] = extrinsic_values(ratios, intrinsic, scale)
        ratios, intrinsic = natural.run(extrinsic)
        extrinsic = extrinsic_values(ratios, intrinsic, scale)
    return ratios // 16

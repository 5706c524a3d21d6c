"""Blocks for GNU Radio: the LTE chain around the core, on streams.

A transport block is so many items of a stream: bits are bytes of 0 and 1, ratios floats, positive where a 1 is likelier, as
those of GNU Radio's own soft decoders. All work on as many transport blocks at once as their buffers hold.
"""

import numpy as np
from gnuradio import gr

import morvik
from morvik import lte


class _Chunks(gr.basic_block):
    """Turns every `taken` items of the input into `given` items of the output."""

    def __init__(self, name, from_type, taken, to_type, given, more_outputs=()):
        gr.basic_block.__init__(self, name=name, in_sig=[from_type], out_sig=[to_type, *more_outputs])
        self._taken = taken
        self._given = given
        self.set_relative_rate(given, taken)
        self.set_output_multiple(given)

    def forecast(self, noutput_items, ninputs):
        return [max(noutput_items // self._given, 1) * self._taken] * ninputs

    def general_work(self, input_items, output_items):
        count = min(len(input_items[0]) // self._taken, len(output_items[0]) // self._given)
        if count == 0:
            return 0
        rows = input_items[0][: count * self._taken].reshape(count, self._taken)
        for port, items in enumerate(self.turn(rows)):
            output_items[port][: items.size] = items.reshape(-1)
            self.produce(port, items.size)
        self.consume(0, count * self._taken)
        return gr.WORK_CALLED_PRODUCE


class encoder(_Chunks):
    """Encodes transport blocks: CRC, code blocks, turbo code and rate matching of 3GPP TS 36.212.

    In: bytes, ``transport_block_size`` bits of each transport block. Out: bytes, ``coded_bits`` bits of each.
    """

    def __init__(self, transport_block_size, coded_bits, modulation="qpsk", version=0):
        self._chain = lte.Transport(transport_block_size, coded_bits, modulation)
        self._version = version
        _Chunks.__init__(self, "morvik encoder", np.uint8, transport_block_size, np.uint8, coded_bits)

    def turn(self, rows):
        return (self._chain.encode(rows, self._version),)


class mapper(_Chunks):
    """Maps bits to symbols of mean energy 1: 3GPP TS 36.211, QPSK to 256QAM. In: bytes. Out: complex."""

    def __init__(self, modulation="qpsk"):
        self._modulation = modulation
        _Chunks.__init__(self, "morvik mapper", np.uint8, lte.bits_per_symbol(modulation), np.complex64, 1)

    def turn(self, rows):
        return (lte.map(rows, self._modulation),)


class demapper(_Chunks):
    """The log-likelihood ratios of the bits of symbols in white Gaussian noise. In: complex. Out: floats."""

    def __init__(self, modulation="qpsk", noise_variance=0.1, demapper="max-log"):
        self._modulation = modulation
        self._demapper = demapper
        self.set_noise_variance(noise_variance)
        _Chunks.__init__(self, "morvik demapper", np.complex64, 1, np.float32, lte.bits_per_symbol(modulation))

    def set_noise_variance(self, noise_variance):
        """Of I and Q together, N0. May be called while the flowgraph runs."""
        self._noise_variance = noise_variance

    def turn(self, rows):
        return (lte.demap(rows, self._modulation, self._noise_variance, demapper=self._demapper),)


class decoder(_Chunks):
    """Decodes transport blocks as the hardware core does, and checks their CRCs.

    In: floats, ``coded_bits`` ratios of each transport block. Out: bytes, ``transport_block_size`` bits of each; and on the
    second port a byte for each transport block, 1 where all of its CRCs fit.
    """

    def __init__(
        self,
        transport_block_size,
        coded_bits,
        modulation="qpsk",
        version=0,
        num_pu=2,
        algorithm="scaled",
        iterations=8,
        scale=None,
    ):
        self._chain = lte.Transport(transport_block_size, coded_bits, modulation)
        self._decoder = morvik.Decoder(num_pu, algorithm)
        self._version = version
        self._iterations = iterations
        self._scale = scale
        _Chunks.__init__(
            self, "morvik decoder", np.float32, coded_bits, np.uint8, transport_block_size, more_outputs=[np.uint8]
        )

    def turn(self, rows):
        buffers = self._chain.recover(rows, self._version)
        received = self._chain.decode(self._decoder, buffers, self._iterations, scale=self._scale)
        return received.bits, received.fits.astype(np.uint8)

"""The BLER of a custom receiver, beside that of `morvik ber`.

bindings/python/run examples/error_rate.py
"""

import morvik
import numpy as np

K, BLOCKS, EBN0_DB = 512, 5000, [0.6, 0.8, 1.0]


def received(streams, variance, rng):
    """The part for your own channel and receiver: here BPSK, noise, and a 4-bit converter in units of half the amplitude."""
    for stream in streams:
        values = 2.0 * stream - 1 + rng.normal(0, variance**0.5, stream.shape)
        yield 4 * np.clip(np.round(2 * values), -8, 7).astype(np.int8)


rng = np.random.default_rng(1)
simulated = morvik.error_rate(K, EBN0_DB, max_blocks=20_000)
with morvik.Decoder(num_pu=4) as decoder:
    for ebn0_db, bler in zip(EBN0_DB, simulated.bler):
        bits = rng.integers(0, 2, (BLOCKS, K), dtype=np.uint8)
        variance = (3 * K + 12) / (2 * K) / 10 ** (ebn0_db / 10)  # of the noise, for bits sent as -1 and 1
        decoded = decoder.decode(*received(morvik.encode(bits), variance, rng), iterations=8)
        wrong = np.any(decoded.bits != bits, axis=1)
        print(f"{ebn0_db:.1f} dB: {wrong.mean():.4f} of the blocks are wrong, {bler:.4f} with all bits")

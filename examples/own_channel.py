"""A channel of one's own around the LTE chain and the core: OFDM over echoes, with an equaliser that leaves each subcarrier
its own gain. How many transport blocks arrive with the first transmission, and how many with the second?

    bindings/python/run examples/own_channel.py
"""

import morvik
import numpy as np
from morvik import lte

SUBCARRIERS, PREFIX = 600, 48  # of an OFDM symbol; samples of its cyclic prefix
DELAYS, POWERS = [0, 3, 9, 21, 40], np.array([0.5, 0.25, 0.15, 0.07, 0.03])  # of the echoes, in samples
MODULATION, SIZE, CODED = "16qam", 3240, 7200  # three OFDM symbols

rng = np.random.default_rng(1)
chain = lte.Transport(SIZE, CODED, MODULATION)
decoder = morvik.Decoder(num_pu=4)


def received(bits, version, noise_variance):
    """The ratios of the coded bits of a transmission of each transport block, each over its own echoes."""
    grid = lte.map(chain.encode(bits, version), MODULATION).reshape(len(bits), -1, SUBCARRIERS)
    samples = np.fft.ifft(grid, norm="ortho")
    samples = np.concatenate([samples[..., -PREFIX:], samples], axis=-1)  # the cyclic prefix
    echoes = rng.normal(0, np.sqrt(POWERS / 2), (2, len(bits), len(DELAYS)))
    amplitudes = echoes[0] + 1j * echoes[1]
    heard = sum(amplitudes[:, [i], None] * np.roll(samples, delay, axis=-1) for i, delay in enumerate(DELAYS))
    noise = rng.normal(0, np.sqrt(noise_variance / 2), (2, *heard.shape))
    symbols = np.fft.fft((heard + noise[0] + 1j * noise[1])[..., PREFIX:], norm="ortho")
    response = sum(amplitudes[:, [i], None] * np.exp(-2j * np.pi * np.arange(SUBCARRIERS) * delay / SUBCARRIERS)
                   for i, delay in enumerate(DELAYS))
    gains = np.broadcast_to(np.abs(response), symbols.shape)
    turned = symbols * np.conj(response) / np.abs(response)  # each subcarrier's phase turned back
    flat = (len(bits), -1)
    return lte.demap(turned.reshape(flat), MODULATION, noise_variance, gains=gains.reshape(flat))


print("Es/N0   first   second transmission")
for esn0_db in (4, 8, 12, 16):
    sent = rng.integers(0, 2, (400, SIZE))
    variance = 10 ** (-esn0_db / 10)
    first = chain.recover(received(sent, 0, variance))
    both = chain.recover(received(sent, 2, variance), 2, first)
    arrived = [chain.decode(decoder, buffers).fits.mean() for buffers in (first, both)]
    print(f"{esn0_db:2} dB   {arrived[0]:5.1%}   {arrived[1]:5.1%}")

"""The throughput of MCS 0 to 28 over Es/N0, with the hardware's decoder, beside Shannon's limit, as throughput.png.

    bindings/python/run examples/throughput.py

It prints the best MCS at each Es/N0.
"""

import matplotlib.pyplot as plt
import morvik
import numpy as np

ESN0_DB = np.arange(-6, 21)
COLOURS = {"qpsk": "C0", "16qam": "C1", "64qam": "C2"}

rates = morvik.error_rate(
    mcs=range(29),
    resource_blocks=6,
    resource_elements=138,
    esn0_db=ESN0_DB,
    iterations=6,
    early_stop="crc",
    block_errors=50,
    max_blocks=100,
)

figure, axes = plt.subplots(figsize=(8, 5), layout="constrained")
for modulation, colour in COLOURS.items():
    axes.plot([], colour, label=modulation.upper())
    for name in dict.fromkeys(rates.mcs[rates.modulation == modulation]):
        axes.plot("esn0_db", "throughput", data=rates[rates.mcs == name], color=colour, linewidth=1, label="_" + name)
axes.plot(ESN0_DB, np.log2(1 + 10 ** (ESN0_DB / 10)), "k--", label="Shannon's limit")
axes.set(xlabel="Es/N0 in dB", ylabel="bits per symbol", ylim=(0, 6.2), title="MCS 0 to 28 on 6 pairs of resource blocks")
axes.grid(alpha=0.3)
axes.legend()
figure.savefig("throughput.png", dpi=150)

for esn0_db in ESN0_DB[::2]:
    best = max(rates[rates.esn0_db == esn0_db], key=lambda row: row.throughput)
    print(f"{esn0_db:3} dB: MCS {best.mcs.split()[1]:>2}, {best.modulation:>5}, {best.throughput:.3f} bits per symbol")

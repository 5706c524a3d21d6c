"""A notebook of error rates: run it as a script, or cell by cell in an editor that knows `# %%`.

    bindings/python/run

It takes some seconds, and leaves waterfall.png.
"""

# %% The tools
import matplotlib.pyplot as plt
import morvik
import numpy as np
import pandas as pd

K = 512
rng = np.random.default_rng(1)

# %% One point by hand: encode, send, decode, count
bits = rng.integers(0, 2, (2000, K))
soft = morvik.awgn(morvik.encode(bits), ebn0_db=1.0, rng=rng)
with morvik.Decoder(num_pu=4) as decoder:
    decoded = decoder.decode(*soft, iterations=8)
wrong = np.any(decoded.bits != bits, axis=1)
print(f"{wrong.sum()} of {len(bits)} blocks are wrong at 1 dB")

# %% The waterfall of each algorithm
rates = morvik.error_rate(
    K,
    np.linspace(0, 1.8, 10),
    algorithm=["max-log", "scaled", "table"],
    block_errors=100,
    max_blocks=20_000,
    stop_bler=1e-3,
)
curves = pd.DataFrame(rates)
print(curves.pivot(index="ebn0_db", columns="algorithm", values="bler").to_string(float_format="%.2g"))

# %% What each iteration brings
steps = morvik.error_rate(
    K, [0.8, 1.0, 1.2], iterations=12, each_iteration=True, block_errors=100, max_blocks=20_000
)

# %% The pictures
figure, (left, right) = plt.subplots(1, 2, figsize=(11, 4.5), sharey=True, layout="constrained")
for name, curve in curves.groupby("algorithm"):
    (line,) = left.semilogy("ebn0_db", "bler", data=curve, marker="o", label=name)
    left.fill_between("ebn0_db", "bler_low", "bler_high", data=curve, color=line.get_color(), alpha=0.2)
left.plot(1.0, wrong.mean(), "kx", markersize=9, label="by hand")
left.set(title=f"{K} bits, 8 iterations", xlabel="Eb/N0 in dB", ylabel="block error rate, and its bounds of 95 %")

for ebn0_db, curve in pd.DataFrame(steps).groupby("ebn0_db"):
    right.semilogy("iterations", "bler", data=curve, marker="o", label=f"{ebn0_db:g} dB")
right.set(title=f"{K} bits, scaled", xlabel="iterations")

for axes in (left, right):
    axes.grid(which="both", alpha=0.3)
    axes.legend()
figure.savefig("waterfall.png", dpi=150)

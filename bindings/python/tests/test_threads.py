"""Threads of a call, and threads of the caller."""

import os
import subprocess
import sys
import threading
import time
from concurrent.futures import ThreadPoolExecutor

import morvik
import numpy as np
import pytest


@pytest.fixture(scope="module")
def blocks():
    rng = np.random.default_rng(3)
    bits = rng.integers(0, 2, (4000, 1024))
    return morvik.awgn(morvik.encode(bits), 0.6, rng=rng)


@pytest.fixture(scope="module")
def expected(blocks):
    return morvik.Decoder(threads=1).decode(*blocks, llrs=True, tag=np.arange(4000) % 256)


class Watch:
    """Counts the progress of this thread while another one is in a call, and the number of threads meanwhile."""

    def __init__(self, call):
        self.ticks = 0
        self.most_threads = 0
        self._start = self._end = 0.0
        self._thread = threading.Thread(target=self._time, args=(call,))
        self._thread.start()
        while self._thread.is_alive():
            now = time.perf_counter()
            if self._start and not self._end and now > self._start:
                self.ticks += 1
                self.most_threads = max(self.most_threads, len(os.listdir("/proc/self/task")))
            time.sleep(0.001)
        self._thread.join()

    def _time(self, call):
        self._start = time.perf_counter()
        call()
        self._end = time.perf_counter()


def is_seen(condition, call):
    """Whether the condition holds for a watched call: the first or, on a busy machine, a later one."""
    return any(condition(Watch(call)) for _ in range(20))


def test_other_threads_run_while_one_decodes(blocks):
    decoder = morvik.Decoder(threads=1)
    assert is_seen(lambda watch: watch.ticks > 10, lambda: decoder.decode(*blocks, iterations=15))


def test_other_threads_run_during_a_simulation():
    def simulate():
        morvik.error_rate(6144, 0.5, threads=1, max_blocks=1000, block_errors=1000)

    assert is_seen(lambda watch: watch.ticks > 10, simulate)


def test_a_batch_is_spread_over_threads(blocks):
    decoder = morvik.Decoder(threads=5)
    every = 1 + 5  # this one, and the threads of the call
    assert is_seen(lambda watch: watch.most_threads >= every, lambda: decoder.decode(*blocks, iterations=15))


@pytest.mark.parametrize("threads", [2, 3, 7, 1024])
def test_the_number_of_threads_changes_nothing(blocks, expected, threads):
    decoded = morvik.Decoder(threads=threads).decode(*blocks, llrs=True, tag=np.arange(4000) % 256)
    assert all(np.array_equal(a, b) for a, b in zip(decoded, expected))


@pytest.mark.parametrize("count", [1, 2, 3, 63, 64, 65, 129])
def test_batches_of_any_size_are_divided(blocks, expected, count):
    decoded = morvik.Decoder(threads=4).decode(*(stream[:count] for stream in blocks))
    assert np.array_equal(decoded.bits, expected.bits[:count])


def test_threads_with_a_decoder_each(blocks, expected):
    def decode(part):
        with morvik.Decoder(threads=1) as decoder:
            return decoder.decode(*(stream[part] for stream in blocks)).bits

    with ThreadPoolExecutor(8) as pool:
        parts = [slice(i, i + 250) for i in range(0, 4000, 250)]
        assert np.array_equal(np.concatenate(list(pool.map(decode, parts))), expected.bits)


def test_threads_that_share_a_decoder_take_turns(blocks, expected):
    decoder = morvik.Decoder(threads=2)

    def decode(part):
        return decoder.decode(*(stream[part] for stream in blocks)).bits

    with ThreadPoolExecutor(8) as pool:
        parts = [slice(i, i + 250) for i in range(0, 4000, 250)]
        assert np.array_equal(np.concatenate(list(pool.map(decode, parts))), expected.bits)


def test_messages_come_to_their_own_thread(blocks):
    one = [stream[0] for stream in blocks]

    def refused(iterations):
        with pytest.raises(morvik.Error) as error, morvik.Decoder(threads=1) as decoder:
            decoder.decode(*one, iterations=8)
            decoder.decode(*one, iterations=iterations)
        return str(error.value)

    with ThreadPoolExecutor(8) as pool:
        texts = list(pool.map(refused, range(16, 216)))
    assert texts == [
        f"Number of iterations must be in the range 1 to 15 (iterations={iterations})" for iterations in range(16, 216)
    ]


def tasks():
    return len(os.listdir("/proc/self/task"))


def test_closing_waits_for_a_call(blocks, expected):
    def closes_during_a_call():
        decoder = morvik.Decoder(threads=2)
        with ThreadPoolExecutor(1) as pool:
            pool.submit(tasks).result()  # the pool has its thread
            before = tasks()
            decoded = pool.submit(decoder.decode, *blocks)
            while tasks() == before and not decoded.done():
                time.sleep(0.001)
            in_time = not decoded.done()
            decoder.close()
        assert decoder.closed
        assert np.array_equal(decoded.result().bits, expected.bits)
        return in_time

    assert any(closes_during_a_call() for _ in range(20))


def test_works_in_a_forked_process(blocks, expected):
    child = os.fork()
    if child == 0:
        decoded = morvik.Decoder(threads=3).decode(*blocks)
        os._exit(0 if np.array_equal(decoded.bits, expected.bits) else 1)
    assert os.waitpid(child, 0)[1] == 0


_DAEMONS = """
import os, threading, time
import morvik, numpy
soft = numpy.full((20, 6148), -24, numpy.int8)
decoded = [threading.Event(), threading.Event()]
def decode(event):
    decoder = morvik.Decoder(threads=1)
    while True:
        decoder.decode(soft, soft, soft)
        event.set()
def simulate():
    morvik.error_rate(512, 0.5, block_errors=10**9, max_blocks=10**9, threads=1, progress=print)
def tasks():
    return len(os.listdir("/proc/self/task"))
for event in decoded:
    threading.Thread(target=decode, args=(event,), daemon=True).start()
for event in decoded:
    event.wait()
before = tasks()
threading.Thread(target=simulate, daemon=True).start()
while tasks() < before + 2:  # with the thread of the simulation
    time.sleep(0.001)
print("ends")
"""


def test_the_interpreter_ends_while_daemon_threads_work():
    for _ in range(3):
        ended = subprocess.run([sys.executable, "-c", _DAEMONS], capture_output=True, text=True, timeout=100)
        assert (ended.returncode, ended.stdout, ended.stderr) == (0, "ends\n", "")

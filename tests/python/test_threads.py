"""Several fits at a time, each in a thread of its own. `./test --all` runs this file under ThreadSanitizer too."""

from __future__ import annotations

import threading

import mcbinning as mb
import numpy as np

FITS = 4


def table(number: int) -> tuple[np.ndarray, np.ndarray]:
    rng = np.random.default_rng(number)
    y = rng.choice(["c", "a", "b"], 15_000)
    return rng.normal(size=(15_000, 3)) + (y == "a")[:, None], y


def fit(number: int) -> list[list[float]]:
    X, y = table(number)
    binner = mb.SupervisedBinner() if number % 2 == 0 else mb.EqualFrequencyBinner(n_bins=5 + number)
    return [cuts.tolist() for cuts in binner.fit(X, y).cut_points_]


def test_fits_in_threads_find_what_they_find_one_after_the_other():
    expected = [fit(number) for number in range(FITS)]
    found: list[list[list[list[float]]]] = [[] for _ in range(FITS)]
    start = threading.Barrier(FITS)

    def work(number: int) -> None:
        start.wait(timeout=60)
        for _ in range(3):
            found[number].append(fit(number))

    threads = [threading.Thread(target=work, args=[number]) for number in range(FITS)]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join(timeout=240)

    assert found == [[cuts] * 3 for cuts in expected] and all(any(cuts) for cuts in expected)

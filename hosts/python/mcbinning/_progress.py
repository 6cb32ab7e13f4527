"""Progress bars for runs."""

from __future__ import annotations

from collections.abc import Callable, Iterator
from contextlib import contextmanager
from typing import Any

from ._features import require

Report = Callable[[str, int], None]
Progress = bool | Report
"""Whether to show progress bars, or a function that is called with the phase, `"records"` or `"attributes"`, and the
number of records read or the place of the attribute just done among the variables."""


class _Bars:
    """A bar for the rows, then one for the attributes."""

    def __init__(self, names: list[str], total: int, rows: int | None) -> None:
        tqdm = require("tqdm.auto", "progress bars", "progress").tqdm
        self._tqdm: Any = tqdm
        self._names = names
        self._total = total
        self._bar = tqdm(desc="reading", unit=" rows", unit_scale=True, total=rows)
        self._phase = "records"

    def __call__(self, phase: str, index: int) -> None:
        if phase == "records":
            self._bar.update(index - self._bar.n)
            return
        if self._phase == "records":
            self._phase = phase
            self._bar.close()
            self._bar = self._tqdm(desc="binning", unit=" attributes", total=self._total)
        self._bar.set_postfix_str(self._names[index], refresh=False)
        self._bar.update(1)

    def close(self) -> None:
        self._bar.close()


@contextmanager
def reporting(progress: Progress, names: list[str], total: int, rows: int | None = None) -> Iterator[Report | None]:
    """What to call while a run goes on. `total` attributes are binned, and `names` are those of all variables."""
    if callable(progress):
        yield progress
    elif progress:
        bars = _Bars(names, total, rows)
        try:
            yield bars
        finally:
            bars.close()
    else:
        yield None

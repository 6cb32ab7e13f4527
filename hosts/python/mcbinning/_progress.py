"""Progress bars for runs."""

from __future__ import annotations

from collections.abc import Callable, Iterator
from contextlib import contextmanager
from typing import Any

from ._features import require

Report = Callable[[str, int], None]
Progress = bool | Report
"""Whether to show progress bars, or a function that is called with the phase and a number: `"records"` and how many
were read, `"attributes"` and the index of the variable just done, `"query"` and how much of it is done in percent."""


class _Bars:
    """A bar for the rows, if they are read here, then one for the attributes."""

    def __init__(self, names: list[str], total: int, rows: int | None, are_rows_read: bool) -> None:
        tqdm: Any = require("tqdm.auto", "progress bars", "progress").tqdm
        self._names = names
        self._open = {
            "records": lambda: tqdm(desc="reading", unit=" rows", unit_scale=True, total=rows),
            "attributes": lambda: tqdm(desc="binning", unit=" attributes", total=total),
        }
        self._phase = ""
        self._bar: Any = None
        if are_rows_read:
            self._show("records")

    def __call__(self, phase: str, index: int) -> None:
        bar = self._show("records" if phase == "records" else "attributes")
        if phase == "records":
            bar.update(index - bar.n)
        elif phase == "query":
            bar.set_postfix_str(f"query {index} %")
        else:
            bar.set_postfix_str(self._names[index], refresh=False)
            bar.update(1)

    def _show(self, phase: str) -> Any:
        if phase != self._phase:
            self.close()
            self._bar = self._open[phase]()
            self._phase = phase
        return self._bar

    def close(self) -> None:
        if self._bar is not None:
            self._bar.close()


@contextmanager
def reporting(
    progress: Progress, names: list[str], total: int, rows: int | None = None, are_rows_read: bool = True
) -> Iterator[Report | None]:
    """What to call while a run goes on. `total` attributes are binned, and `names` are those of all variables.
    `are_rows_read` is False where an engine may reduce them."""
    if callable(progress):
        yield progress
    elif progress:
        bars = _Bars(names, total, rows, are_rows_read)
        try:
            yield bars
        finally:
            bars.close()
    else:
        yield None

"""The native part of the package: tables and arrays as the library's records, and its runs."""

from collections.abc import Callable, Iterator
from typing import Any

import numpy as np
import numpy.typing as npt

MISSING: float
"""The double that stands for a missing value inside the library."""

_Status = tuple[int, str, tuple[int, int, int], tuple[float, float, float]]
_Outcome = tuple[_Status, list[dict[str, Any]], int, str, int | None, float | None]
"""Status, results, records, version, records without a weight, and the grid that weights were moved to."""

def temp_directory(named: str) -> str: ...

class Table:
    @staticmethod
    def from_stream(stream: object, explain: Callable[[str], str] | None = None) -> Table: ...
    @staticmethod
    def from_iterator(schema: object, iterator: Iterator[object]) -> Table: ...
    @property
    def columns(self) -> list[tuple[str, str, str, bool, bool]]:
        """Of each column the name, the kind of its values, its time zone, whether it can be used, and whether it is a
        dictionary that declares the order of its values."""

class Feed:
    def __init__(self, table: Table | None) -> None: ...
    def add_variable(
        self,
        name: str,
        use: str,
        *,
        column: int = -1,
        array: npt.NDArray[Any] | None = None,
        num_codes: int = 0,
        rounding: str = "none",
    ) -> None: ...
    def declare_missing(
        self, index: int, values: list[float], interval: tuple[float, float] | None, texts: list[str]
    ) -> None: ...
    def set_categories(
        self, index: int, categories: list[str] | list[float], unseen: str = "changed"
    ) -> None: ...
    def categories(self, index: int) -> list[str] | list[float]: ...
    def learn(self) -> None: ...
    def weights(self) -> tuple[int, float]: ...
    def set_weights(self, weights: tuple[int, float]) -> None: ...
    def read(self, max_rows: int) -> list[npt.NDArray[np.float64]]: ...
    def spool(self, directory: str) -> None: ...
    def bin_supervised(
        self,
        attributes: list[int],
        targets: list[int],
        *,
        n_bins: int,
        max_distinct: int,
        small_bin_ratio: float,
        right_closed: bool,
        temp_dir: str,
        progress: Callable[[str, int], None] | None,
    ) -> _Outcome: ...
    def bin_equal_frequency(
        self,
        attributes: list[int],
        *,
        n_bins: int,
        right_closed: bool,
        temp_dir: str,
        progress: Callable[[str, int], None] | None,
    ) -> _Outcome: ...

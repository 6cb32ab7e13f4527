"""The native part of the package: tables and arrays as the library's records, and its runs and bins."""

from collections.abc import Callable, Iterator
from typing import Any

import numpy as np
import numpy.typing as npt

_Floats = npt.NDArray[np.float64]
__version__: str

_Evidence = tuple[float, float, float]
_Row = tuple[str, str, float, float, float, float, list[float], _Evidence | None, list[_Evidence | None]]
_Status = tuple[int, str, tuple[int, int, int], tuple[float, float, float]]

def temp_directory(named: str) -> str: ...
def grid_factors(positive: int, largest: float) -> tuple[float, float]:
    """The step of the grid of weights, of which so many are positive, as the product of two powers of two."""

def status_words(code: int, is_warning: bool) -> str: ...
def describe_not_json(line: int) -> str: ...
def describe_unusable(categories: list[str], records: int) -> str:
    """Why a column of text with these categories, in so many records, is not binned; empty if it is."""

class CategoryCodes:
    """The categories of an attribute as they get their codes."""

    def __init__(self, names: list[str]) -> None: ...
    names: list[str]
    rare_code: int | None
    rare: list[str]

class Table:
    @staticmethod
    def from_stream(stream: object, explain: Callable[[str], str] | None = None) -> Table: ...
    @staticmethod
    def from_iterator(schema: object, iterator: Iterator[object]) -> Table: ...
    @property
    def columns(self) -> list[tuple[str, str, str, bool, bool]]:
        """Of each column the name, the kind of its values, its time zone, whether it can be used, and whether it is a
        dictionary that declares the order of its values."""

class Variable:
    name: str
    label: str
    role: str
    kind: str
    time_zone: str
    categories: list[str] | list[float] | None
    rounding: str | None
    weight_scale: str | None
    grid: float | None
    category_order: str | None
    order_target: str | None
    rare_code: int | None
    rare: list[str]
    missing_texts: list[str]
    """Of a variable of texts all that are missing, of others those that are no numbers."""
    missing_numbers: list[float]
    missing_interval: tuple[float, float] | None

class AttributeBins:
    """Each access makes a new copy. A figure that was not found is NaN."""

    variable: Variable
    target: Variable | None
    status: _Status
    right_closed: bool
    cut_points: _Floats
    borders: _Floats
    border_texts: list[str]
    labels: list[str]
    weights: _Floats
    target_weights: _Floats | None
    n_distinct: int | None
    weight: float
    weight_with_missing: float
    minimum: float
    maximum: float
    target_entropy: float
    model_entropy: float
    gain: float
    rates: _Floats | None
    woe: _Floats | None
    iv: _Floats | None
    information_value: float
    smoothing: float
    edited: bool
    information_values: list[float]
    rows: list[_Row]
    """Of each bin, the missing if they have weight, and the total: "bin", "missing" or "total", the label, the borders,
    the weight and its share of the total, the weight in each category of the target, and rate, weight of evidence and
    information value, which a target of more than two categories has for each of them."""

    def find_bin(self, value: float) -> int: ...
    def codes(self, encode: str) -> _Floats:
        """The numbers that stand for values: by bin, and behind them of a missing value, NaN if it has none."""
    def by_category(self) -> AttributeBins:
        """With a bin for each category."""
    def alone(self) -> Bins:
        """As the only result of a run."""

class Reduction:
    engine: str
    reason: str
    queries: int
    is_distinct_exact: bool
    groups: list[int]

    def __init__(self, engine: str, reason: str, queries: int, is_distinct_exact: bool, groups: list[int]) -> None: ...

class Bins:
    component_version: str
    method: str
    closed: str
    n_bins: int
    max_distinct: int | None
    small_bin_ratio: float | None
    smoothing: float
    round: str | None
    data_name: str | None
    records: int | None
    records_without_weight: int | None
    reduction: Reduction | None
    missing_text: list[str]
    variables: list[Variable]
    status: _Status
    results: list[AttributeBins]

    @staticmethod
    def read(document: Any, name: str) -> Bins:
        """From the values of a JSON text, with its objects as tuples of pairs. Raises a ValueError that begins with the
        name of the document."""
    def set_border_texts(self, index: int, texts: list[str]) -> None: ...
    def set_weight_grid(self, step: float | None) -> None: ...
    def add_part(self, part: Bins, attribute: int, target: int, n_distinct: int | None = None) -> None:
        """Adds what a run of one attribute has found, with the indices that it and its target, or -1, have here."""
    def select(self, indices: list[int]) -> Bins:
        """With some of the results alone, in the order of the indices."""
    def merge(self, index: int, first: int, last: int) -> Bins: ...
    def recut(self, index: int, cut_points: list[float]) -> Bins:
        """With other cut points of one result; without weights there unless they are a part of those it has."""
    def replace(self, index: int, other: Bins, other_index: int) -> Bins: ...
    def columns(self, taken: list[str], encode: str) -> list[tuple[int, str]]:
        """Of each column of bins the index of its result, and its name."""
    def to_json(self) -> str: ...
    def to_csv(self) -> str: ...
    def to_case(self, index: int, codes: list[float], duckdb: bool, cast: bool) -> str:
        """The expression of one result, which gives these numbers: by bin, and behind them for a missing value."""
    def to_sql(self, duckdb: bool, encode: str, cast: bool, table: str) -> str: ...

class Evaluation:
    first: Bins
    second: Bins
    indices: list[int]
    weight_of_unseen_targets: float

    @staticmethod
    def join(
        first: Bins,
        parts: list[Evaluation],
        data_name: str | None,
        records: int,
        records_without_weight: int | None,
        step: float | None,
        weight_of_unseen_targets: float,
    ) -> Evaluation:
        """The whole of an evaluation whose results were found one by one."""
    def rows(self, index: int) -> list[tuple[_Row, _Row, float | None]]: ...
    def flags(self, index: int) -> list[str]: ...
    def outside(self, index: int) -> tuple[float, float]:
        """The weights of values below and above those that the bins were made of."""
    def unseen(self, index: int) -> tuple[float, list[str]]: ...
    def round_cut_points(self) -> Bins:
        """The first bins, with the shortest decimals between the values of the second ones as cut points."""
    def to_json(self) -> str: ...
    def to_csv(self) -> str: ...

class Feed:
    def __init__(self, table: Table | None) -> None: ...
    def add_field(
        self,
        name: str,
        use: str,
        *,
        column: int = -1,
        array: npt.NDArray[Any] | None = None,
        rounding: str = "none",
        scaled: bool = False,
        optional: bool = False,
    ) -> int:
        """The index of the field."""
    def declare_missing(
        self, index: int, values: list[float], interval: tuple[float, float] | None, texts: list[str]
    ) -> None: ...
    def set_categories(self, index: int, categories: list[str] | list[float], unseen: str = "changed") -> None: ...
    def describe_unusable(self, index: int) -> str:
        """Once the records have been read: why a column of text is not binned unless it is named."""
    def drop(self, index: int) -> None: ...
    def count_categories(
        self, pairs: list[tuple[int, int | None]], *, rare: float, by_rate: bool
    ) -> list[CategoryCodes]: ...
    def set_codes(
        self, index: int, codes: CategoryCodes, *, rare: float = 0.0, order: str, target: str = ""
    ) -> None: ...
    def set_unseen_code(self, index: int, code: int) -> None: ...
    def set_value_kind(self, index: int, kind: str) -> None: ...
    def categories(self, index: int) -> list[str] | list[float]: ...
    def learn(self) -> None: ...
    def weights(self) -> tuple[int, float]: ...
    def set_weights(self, weights: tuple[int, float], scale: float = 1.0) -> None: ...
    def scale_weights(self) -> float:
        """Reads the records, whose weights are known, and scales these to sum to the number of records."""
    def read(self, max_rows: int) -> list[_Floats]: ...
    def spool(self, directory: str) -> None: ...
    def count(
        self,
        first: Bins,
        counted: list[tuple[int, int, int | None]],
        data_name: str | None,
        are_groups: bool = False,
    ) -> Evaluation:
        """Counts all records; `counted` are indices of results, of the field of each, and of its target's. A group that
        weighs 0 has a further value of records that another group counts."""
    def describe(
        self,
        *,
        has_targets: bool,
        target: int | None = None,
        n_bins: int,
        max_distinct: int | None = None,
        small_bin_ratio: float | None = None,
        smoothing: float = 0.5,
        right_closed: bool,
        data_name: str | None = None,
    ) -> Bins:
        """The bins of a run before it has found any."""
    def bin(
        self,
        attributes: list[int],
        targets: list[int] | None = None,
        *,
        target: int | None = None,
        n_bins: int,
        max_distinct: int | None = None,
        small_bin_ratio: float | None = None,
        smoothing: float = 0.5,
        right_closed: bool,
        data_name: str | None = None,
        temp_dir: str,
        progress: Callable[[str, int], None] | None,
    ) -> Bins: ...

"""What was found: the bins of each attribute."""

from __future__ import annotations

import os
from collections.abc import Iterator, Mapping
from dataclasses import dataclass, field
from functools import cached_property
from typing import TYPE_CHECKING, Any

import numpy as np
import pandas as pd

from . import _values
from ._sources import name_of
from ._status import Status
from ._types import Closed, MemoryLimit, Method, Role, Unseen
from ._values import Codes, Floats

if TYPE_CHECKING:
    import matplotlib.axes
    import matplotlib.figure
    import pyarrow as pa

_ROUNDING = 1e-12


@dataclass(frozen=True)
class Variable:
    """A column of the analysis."""

    name: str
    role: Role = "attribute"
    kind: str = "float"
    """What its values are: `"float"`, `"integer"`, `"decimal"`, `"boolean"`, `"date"`, `"timestamp"`, `"text"`."""
    time_zone: str = ""
    categories: tuple[Any, ...] | None = None
    """As texts or numbers, by code; None for a column that is measured."""
    missing_values: tuple[Any, ...] = ()
    missing_interval: tuple[float, float] | None = None
    label: str = ""
    rounding: str | None = None
    """Of a weight: `"none"`, `"truncate"` or `"closest"`."""
    missing_texts: tuple[str, ...] = ()
    """What stands for a missing value in a text file, where `missing_values` are numbers."""
    grid: float | None = None
    """Of a weight: of what its values were made multiples, so that all sums are exact; None if none had to move."""

    @property
    def is_categorical(self) -> bool:
        return self.categories is not None

    def category_names(self) -> list[Any]:
        """The categories as the user knows them."""
        if self.kind == "text":
            return list(self.categories or ())
        return [_values.decode(float(number), self.kind, self.time_zone) for number in self.categories or ()]

    def category_label(self, code: int) -> str:
        """The category in words."""
        if self.kind in ("float", "decimal") and self.categories is not None:
            return self.format(float(self.categories[code]))
        return str(self.category_names()[code])

    def format(self, value: float) -> str:
        return _values.format_value(value, self.kind, self.time_zone)


@dataclass(frozen=True)
class Settings:
    closed: Closed = "right"
    n_bins: int = 10
    max_distinct: int | None = None
    small_bin_ratio: float | None = None


@dataclass(frozen=True)
class AttributeBins:
    """The bins of one attribute, against one target or none."""

    variable: Variable
    target: Variable | None
    status: Status
    closed: Closed
    cut_points: Floats
    """In ascending order. Dates are days and timestamps microseconds since 1970; categories are codes."""
    weights: Floats
    """By bin; one bin more than there are cut points, or none where nothing was binned."""
    target_weights: Floats | None
    """By bin and category of the target."""
    n_distinct: int
    weight: float
    """Of the records with a valid value, and a valid target if there is one."""
    weight_with_missing: float
    minimum: float
    maximum: float
    model_entropy: float
    """What is left of the target's entropy within the bins, in bits; NaN without a target."""

    @property
    def attribute(self) -> str:
        return self.variable.name

    @property
    def n_bins(self) -> int:
        return len(self.weights)

    @property
    def missing_weight(self) -> float:
        return self.weight_with_missing - self.weight

    @cached_property
    def target_entropy(self) -> float:
        """The target's entropy over the records that `weight` counts, in bits; NaN without a target."""
        if self.target_weights is None or len(self.target_weights) == 0:
            return float("nan")
        return _values.entropy(self.target_weights.sum(axis=0))

    @property
    def gain(self) -> float:
        """By how many bits the bins lower the target's entropy; NaN without a target."""
        difference = self.target_entropy - self.model_entropy
        # No cut raises the entropy, and none at all leaves it: below this the difference is what rounding has left.
        is_nothing = difference < _ROUNDING * max(1.0, self.target_entropy) or len(self.cut_points) == 0
        return 0.0 if is_nothing and not np.isnan(difference) else difference

    @property
    def borders(self) -> Floats:
        """The cut points as people read them. One between two days or two microseconds is shown as the nearest of these
        that parts the same dates or timestamps."""
        if self.variable.kind not in ("date", "timestamp"):
            return self.cut_points
        shown: Floats = np.floor(self.cut_points) if self.closed == "right" else np.ceil(self.cut_points)
        return shown

    @cached_property
    def labels(self) -> list[str]:
        """The bins in words: an interval, or the categories that are in it."""
        if not self.variable.is_categorical:
            return _values.intervals(self.borders, self.closed, self.variable.format)
        names = np.array([self.variable.category_label(code) for code in range(len(self.variable.categories or ()))])
        bins = _values.bin_numbers(np.arange(len(names), dtype=np.float64), self.cut_points, self.closed)
        return ["{" + ", ".join(names[bins == bin]) + "}" for bin in range(len(self.cut_points) + 1)]

    def to_pandas(self) -> pd.DataFrame:
        """A row for each bin: its ends, its weight and share, and its weight in each category of the target."""
        ends = [-np.inf, *self.cut_points, np.inf]
        n = self.n_bins
        with np.errstate(invalid="ignore", divide="ignore"):
            shares = self.weights / self.weights.sum()
        columns: dict[str, Any] = {
            "attribute": [self.attribute] * n,
            "target": [self.target.name if self.target else None] * n,
            "bin": np.arange(n),
            "interval": self.labels[:n],
            "left": ends[:n],
            "right": ends[1 : n + 1],
            "weight": self.weights,
            "share": shares,
        }
        if self.target is not None and self.target_weights is not None:
            for code, name in enumerate(self.target.category_names()):
                columns[f"weight[{name}]"] = self.target_weights[:, code]
        return pd.DataFrame(columns)

    def bin_numbers(self, values: Floats) -> Codes:
        """The bin of each value, from 0; one past the last bin for a NaN. A value outside the range seen falls into an
        outer bin. Of a categorical attribute the values are codes."""
        return _values.bin_numbers(values, self.cut_points, self.closed)

    def plot(self, ax: matplotlib.axes.Axes | None = None) -> matplotlib.axes.Axes:
        """The share of each category of the target, bin by bin; a bin is as wide as its weight."""
        from ._plots import plot_bins

        return plot_bins(self, ax)


@dataclass(frozen=True, eq=False)
class BinningResult(Mapping[Any, AttributeBins]):
    """The bins of all attributes, by the attribute's name; with several targets, by attribute and target.

    In a notebook it shows itself as its `summary()`.
    """

    method: Method
    settings: Settings
    variables: tuple[Variable, ...]
    status: Status
    bins: tuple[AttributeBins, ...]
    left_out: Mapping[str, str] = field(default_factory=dict)
    """What each column holds that was not named, and is not of a kind that is binned unless it is: text, durations."""
    data_name: str | None = None
    records: int | None = None
    """How many were read, whatever their weight."""
    component_version: str = ""
    missing_text: tuple[str, ...] = ()
    records_without_weight: int | None = None
    """How many were left out since their weight is missing; None without a weight."""

    @property
    def weight_grid(self) -> float | None:
        """Of what the weights were made multiples, so that every sum of them is exact; None where all weights were such
        multiples, and without weights."""
        return next((variable.grid for variable in self.variables if variable.role == "weight"), None)

    def __getitem__(self, key: Any) -> AttributeBins:
        for found in self.bins:
            if found.attribute == name_of(key):
                return found
        if isinstance(key, tuple) and len(key) == 2:
            attribute, target = map(name_of, key)
            for found in self.bins:
                if found.attribute == attribute and found.target and found.target.name == target:
                    return found
        raise KeyError(key)

    def __iter__(self) -> Iterator[Any]:
        targets = {found.target.name for found in self.bins if found.target}
        for found in self.bins:
            yield (found.attribute, found.target.name) if found.target and len(targets) > 1 else found.attribute

    def __len__(self) -> int:
        return len(self.bins)

    def by_gain(self) -> list[AttributeBins]:
        """With the largest gain first; those without one, in their order, last."""
        return sorted(self.bins, key=lambda found: -found.gain if found.gain == found.gain else np.inf)

    def summary(self) -> pd.DataFrame:
        """A row for each attribute, with the largest gain first, and for each column that was left out."""
        rows = [
            {
                "attribute": found.attribute,
                "target": found.target.name if found.target else None,
                "gain": found.gain,
                "target_entropy": found.target_entropy,
                "model_entropy": found.model_entropy,
                "bins": found.n_bins,
                "distinct_values": found.n_distinct,
                "weight": found.weight,
                "missing_weight": found.missing_weight,
                "minimum": _values.decode(found.minimum, found.variable.kind, found.variable.time_zone),
                "maximum": _values.decode(found.maximum, found.variable.kind, found.variable.time_zone),
                "status": found.status.words,
            }
            for found in self.by_gain()
        ]
        rows += [
            {"attribute": name, "bins": 0, "status": f"left out: {kind}"} for name, kind in self.left_out.items()
        ]
        frame = pd.DataFrame(rows).astype({"distinct_values": "Int64"} if rows else {})
        if self.method != "supervised":
            frame = frame.drop(columns=["target", "gain", "target_entropy", "model_entropy"], errors="ignore")
        return frame

    def to_pandas(self) -> pd.DataFrame:
        """A row for each bin of each attribute."""
        frames = [found.to_pandas() for found in self.bins if found.n_bins]
        return pd.concat(frames, ignore_index=True) if frames else pd.DataFrame()

    def to_arrow(self) -> pa.Table:
        """`to_pandas()` as an Arrow table."""
        import pyarrow

        return pyarrow.Table.from_pandas(self.to_pandas(), preserve_index=False)

    def to_json(self, path: str | os.PathLike[str] | None = None) -> str:
        """Writes all bins as JSON, as `mcbin --format json` does and `mcbin apply` reads it.

        Parameters
        ----------
        path : path, default=None
            The file that the text goes into as well. None: into none.

        Returns
        -------
        str
            The text, from which `from_json` makes the same bins, to the last bit.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> bins = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=2)
        >>> mb.BinningResult.from_json(bins.to_json())["income"].labels
        ['(-inf, 49.5]', '(49.5, +inf)']
        """
        from ._json import dump

        text = dump(self)
        if path is not None:
            with open(path, "w", encoding="utf-8") as file:
                file.write(text)
        return text

    @classmethod
    def from_json(cls, source: str | os.PathLike[str]) -> BinningResult:
        """Reads what `to_json` or `mcbin --format json` wrote.

        Parameters
        ----------
        source : str or path
            The text itself, or the path of a file.

        Returns
        -------
        BinningResult
            As it was written, but for `left_out`, which JSON has no place for.

        Raises
        ------
        ValueError
            The text is no JSON of bins, or of a newer version.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> text = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=2).to_json()
        >>> mb.BinningResult.from_json(text).method
        'equal-frequency'
        """
        from ._json import load

        text = os.fspath(source)
        if not text.lstrip().startswith("{"):
            with open(text, encoding="utf-8") as file:
                text = file.read()
        return load(text)

    def to_sql(self, dialect: str = "", table: str | None = None, labels: bool = False) -> str:
        """Writes SQL that finds the bins of each row: a CASE expression for each attribute.

        Parameters
        ----------
        dialect : str, default=""
            One of sqlglot's, such as "duckdb", "postgres" or "bigquery"; standard SQL without one.
        table : str, default=None
            The table of the SELECT around the expressions. None: the expressions alone.
        labels : bool, default=False
            Whether the bins are told in words; otherwise by their numbers from 0.

        Returns
        -------
        str
            The SQL. It gives NULL for a missing value, and for a category that the bins were made without.

        Raises
        ------
        ValueError
            There is no such dialect.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> bins = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=2)
        >>> print(bins.to_sql("duckdb"))
        CASE WHEN "income" IS NULL THEN NULL WHEN "income" <= 49.5 THEN 0 ELSE 1 END AS "income_bin"
        """
        from ._sql import write

        return write(self, dialect, table, labels)

    def transform(
        self, data: Any, labels: bool = False, *, unseen: Unseen = "error", memory_limit: MemoryLimit | None = None
    ) -> Any:
        """Finds the bins of new data.

        Parameters
        ----------
        data : table, stream, path or list of paths
            As `supervised_bins` takes them, with the columns of all attributes.
        labels : bool, default=False
            Whether the bins are told in words; otherwise by their numbers from 0.
        unseen : {"error", "missing"}, default="error"
            What a category is that the bins were made without: an error with its row and column, or a missing value.
        memory_limit : int or str, default=None
            The most memory that the reading of a file may take, as in `supervised_bins`.

        Returns
        -------
        pandas.DataFrame, polars.DataFrame, pyarrow.Table or pyarrow.RecordBatchReader
            A column for each attribute. A pandas or polars frame gives one of its kind, an Arrow table gives a table;
            a path, a LazyFrame or any other stream gives a reader, which takes the data batch by batch. A missing value
            has no bin.

        Raises
        ------
        DataError
            A column is missing or of another type, or a category unseen; `column` and `row` tell where.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> bins = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=2)
        >>> bins.transform(pd.DataFrame({"income": [12, None, 70]}), labels=True)["income"].tolist()
        ['(-inf, 49.5]', nan, '(49.5, +inf)']
        """
        from ._transform import transform

        return transform(self, data, labels, unseen, memory_limit)

    def plot(self, attribute: Any = None, ax: matplotlib.axes.Axes | None = None) -> matplotlib.axes.Axes:
        """Draws one attribute; the one of the largest gain if none is named."""
        return (self.by_gain()[0] if attribute is None else self[attribute]).plot(ax)

    def plot_all(self, columns: int = 3) -> matplotlib.figure.Figure:
        """Draws all attributes, the one with the largest gain first."""
        from ._plots import plot_all

        return plot_all(self, columns)

    def __repr__(self) -> str:
        return f"<BinningResult: {self.method}, {self._count()}>\n{self._shown().to_string(index=False, na_rep='')}"

    def _repr_html_(self) -> str:
        figures = self._shown().to_html(index=False, float_format=lambda value: f"{value:.4g}", na_rep="")
        return f"<div><p>Bins, {self.method}: {self._count()}</p>{figures}</div>"

    def _shown(self) -> pd.DataFrame:
        """The summary, empty where a column that was left out has no figures."""
        shown = self.summary()
        if self.left_out:
            figures = ["distinct_values", "minimum", "maximum"]
            shown[figures] = shown[figures].astype(object).where(shown[figures].notna(), "")
        return shown

    def _count(self) -> str:
        return f"{len(self)} results" + (f", {len(self.left_out)} columns left out" if self.left_out else "")

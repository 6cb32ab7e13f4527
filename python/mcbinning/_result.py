"""What was found: the bins of each attribute."""

from __future__ import annotations

import os
from collections.abc import Iterator, Mapping
from dataclasses import dataclass
from functools import cached_property
from typing import TYPE_CHECKING, Any

import numpy as np
import pandas as pd

from . import _values
from ._status import Status
from ._values import Codes, Floats

if TYPE_CHECKING:
    import matplotlib.axes
    import matplotlib.figure
    import pyarrow as pa


@dataclass(frozen=True)
class Variable:
    """A column of the analysis."""

    name: str
    role: str = "attribute"
    """`"attribute"`, `"target"` or `"weight"`."""
    kind: str = "float"
    """What its values are: `"float"`, `"integer"`, `"decimal"`, `"boolean"`, `"date"`, `"timestamp"`, `"text"`."""
    time_zone: str = ""
    categories: tuple[Any, ...] | None = None
    """As texts or numbers, by code; None for a column that is measured."""
    missing_values: tuple[Any, ...] = ()
    missing_interval: tuple[float, float] | None = None
    label: str = ""
    rounding: str | None = None
    missing_texts: tuple[str, ...] = ()
    """What stands for a missing value in a text file, where `missing_values` are numbers."""

    @property
    def is_categorical(self) -> bool:
        return self.categories is not None

    def category_names(self) -> list[Any]:
        """The categories as the user knows them."""
        if self.kind == "text":
            return list(self.categories or ())
        return [_values.decode(float(number), self.kind, self.time_zone) for number in self.categories or ()]

    def format(self, value: float) -> str:
        return _values.format_value(value, self.kind, self.time_zone)


@dataclass(frozen=True)
class Settings:
    closed: str = "right"
    n_bins: int = 10
    max_distinct: int | None = None
    small_bin_ratio: float | None = None


@dataclass(frozen=True)
class AttributeBins:
    """The bins of one attribute, against one target or none."""

    variable: Variable
    target: Variable | None
    status: Status
    closed: str
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
        return self.target_entropy - self.model_entropy

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
        names = np.array(list(map(str, self.variable.category_names())), dtype=object)
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

    method: str
    """`"supervised"` or `"equal-frequency"`."""
    settings: Settings
    variables: tuple[Variable, ...]
    status: Status
    bins: tuple[AttributeBins, ...]
    left_out: tuple[str, ...] = ()
    """Columns of text, which are binned only if they are asked for."""
    data_name: str | None = None
    records: int | None = None
    """How many were read, whatever their weight."""
    component_version: str = ""
    missing_text: tuple[str, ...] = ()

    def __getitem__(self, key: Any) -> AttributeBins:
        attribute, target = key if isinstance(key, tuple) else (key, None)
        for found in self.bins:
            if found.attribute == attribute and target in (None, found.target.name if found.target else None):
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
        """A row for each attribute, with the largest gain first."""
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
        frame = pd.DataFrame(rows)
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
        """Everything, as `mcbin --format json` writes and `mcbin apply` reads it; into a file, too, if one is named."""
        from ._json import dump

        text = dump(self)
        if path is not None:
            with open(path, "w", encoding="utf-8") as file:
                file.write(text)
        return text

    @classmethod
    def from_json(cls, source: str | os.PathLike[str]) -> BinningResult:
        """Reads what `to_json` or `mcbin --format json` gave: the text itself, or the path of a file."""
        from ._json import load

        text = os.fspath(source)
        if not text.lstrip().startswith("{"):
            with open(text, encoding="utf-8") as file:
                text = file.read()
        return load(text)

    def to_sql(self, dialect: str = "", table: str | None = None, labels: bool = False) -> str:
        """SQL that gives each row the bins of its values: one CASE expression for each attribute, in a SELECT if
        `table` names one. The dialect is one of sqlglot's; without one it is standard SQL."""
        from ._sql import write

        return write(self, dialect, table, labels)

    def transform(self, data: Any, labels: bool = False) -> Any:
        """The bins of new data: a column of bin numbers from 0 for each attribute, or of the bins in words.

        A pandas or polars frame gives one of its kind, an Arrow table gives a table; a path or any other stream gives a
        `pyarrow.RecordBatchReader`, which reads it batch by batch. A missing value has no bin.
        """
        from ._transform import transform

        return transform(self, data, labels)

    def plot(self, attribute: Any = None, ax: matplotlib.axes.Axes | None = None) -> matplotlib.axes.Axes:
        """Draws one attribute; the one of the largest gain if none is named."""
        return (self.by_gain()[0] if attribute is None else self[attribute]).plot(ax)

    def plot_all(self, columns: int = 3) -> matplotlib.figure.Figure:
        """Draws all attributes, the one with the largest gain first."""
        from ._plots import plot_all

        return plot_all(self, columns)

    def __repr__(self) -> str:
        return f"<BinningResult: {self.method}, {len(self)} results>\n{self.summary().to_string(index=False)}"

    def _repr_html_(self) -> str:
        figures = self.summary().to_html(index=False, float_format=lambda value: f"{value:.4g}", na_rep="")
        return f"<div><p>Bins, {self.method}: {len(self)} results</p>{figures}</div>"

"""The bins of one attribute."""

from __future__ import annotations

import datetime
from dataclasses import dataclass
from functools import cached_property
from typing import TYPE_CHECKING, Any, cast

import numpy as np

from . import _core, _values
from ._features import require
from ._json import read_bins
from ._status import Status
from ._types import Closed, Encoding, Role
from ._values import Codes, Floats

if TYPE_CHECKING:
    import matplotlib.axes
    import pandas as pd

    from ._result import BinningResult


@dataclass(frozen=True)
class Variable:
    """A column of the analysis."""

    name: str
    role: Role
    kind: str
    """What its values are: `"float"`, `"integer"`, `"boolean"`, `"date"`, `"timestamp"`, `"text"`. Numbers that are
    measured are `"float"`, and those that are categories `"integer"` if all of them are whole."""
    time_zone: str
    categories: tuple[Any, ...] | None
    """As texts or numbers, by code; None for a column that is measured."""
    missing_values: tuple[Any, ...]
    missing_interval: tuple[float, float] | None
    label: str
    rounding: str | None
    """Of a weight: `"none"`, `"truncate"` or `"closest"`."""
    missing_texts: tuple[str, ...]
    """What stands for a missing value in a text file, where `missing_values` are numbers."""
    grid: float | None
    """Of a weight: of what its values were made multiples, so that all sums are exact; None if none had to move."""
    category_order: str | None = None
    """What the order of texts follows: `"text"`, `"rate"` of `order_target`, or what was `"declared"`; None otherwise,
    and where it is not known."""
    order_target: str | None = None
    rare: tuple[str, ...] = ()
    """The categories that share a code, as each has too little weight; unseen ones have it as well."""
    rare_code: int | None = None
    """That code; None where there is none."""
    weight_scale: str | None = None
    """Of a weight: `"rows"` if it is scaled to sum to the number of records."""

    @classmethod
    def from_core(cls, core: _core.Variable) -> Variable:
        is_text = core.kind == "text"
        return cls(
            core.name,
            cast(Role, core.role),
            core.kind,
            core.time_zone,
            None if core.categories is None else tuple(core.categories),
            tuple(core.missing_texts if is_text else core.missing_numbers),
            core.missing_interval,
            core.label,
            core.rounding,
            () if is_text else tuple(core.missing_texts),
            core.grid,
            core.category_order,
            core.order_target,
            tuple(core.rare),
            core.rare_code,
            core.weight_scale,
        )

    @property
    def is_categorical(self) -> bool:
        return self.categories is not None

    def category_names(self) -> list[Any]:
        """The categories as the user knows them."""
        if self.kind == "text":
            return list(self.categories or ())
        return [_values.decode(number, self.kind, self.time_zone) for number in self.categories or ()]


@dataclass(frozen=True)
class Missing:
    """The records without a valid value of the attribute, but with a category if there is a target."""

    weight: float
    target_weights: tuple[float, ...]
    """By category of the target."""
    rate: float | None
    """As of a bin; None unless the target has two categories."""
    woe: float | None
    iv: float | None

    @classmethod
    def of_rows(cls, rows: list[Any]) -> Missing | None:
        """None where no such record has weight."""
        for kind, _, _, _, weight, _, target_weights, evidence, _ in rows:
            if kind == "missing":
                return cls(weight, tuple(target_weights), *(evidence or (None,) * 3))
        return None


class AttributeBins:
    """The bins of one attribute, against one target or none."""

    def __init__(self, core: _core.AttributeBins, result: BinningResult | None = None) -> None:
        self._core = core
        self._result = result
        self.variable = Variable.from_core(core.variable)
        self.target = None if core.target is None else Variable.from_core(core.target)
        self.status = Status.from_core(core.status)
        self.closed: Closed = "right" if core.right_closed else "left"
        self.cut_points = core.cut_points
        """In ascending order. Dates are days and timestamps microseconds since 1970; categories are codes."""
        self.weights = core.weights
        """By bin; one bin more than there are cut points, or none where nothing was binned."""
        self.target_weights = core.target_weights
        """By bin and category of the target."""
        self.n_distinct = core.n_distinct
        """None where records were only counted in bins that were there."""
        self.weight = core.weight
        """Of the records with a valid value, and a valid target if there is one."""
        self.weight_with_missing = core.weight_with_missing
        self.minimum = core.minimum
        """NaN where there is no valid value, as with the maximum."""
        self.maximum = core.maximum
        self.target_entropy = core.target_entropy
        """The target's entropy over the records that `weight` counts, in bits; NaN without a target."""
        self.model_entropy = core.model_entropy
        """What is left of the target's entropy within the bins, in bits; NaN without a target."""
        self.gain = core.gain
        """By how many bits the bins lower the target's entropy; NaN without a target."""
        self.rates = core.rates
        """By bin: the share of the target's second category, the event; None unless the target has two categories."""
        self.woe = core.woe
        """By bin: the weight of evidence ln(p / q), where p is the bin's share of all events, and q of all others, also
        of those with a missing value; None unless the target has two categories."""
        self.iv = core.iv
        """By bin: its part of the information value, (p - q) ln(p / q); None unless the target has two categories."""
        self.information_value = core.information_value
        """The sum over the bins and the missing; NaN unless the target has two categories."""
        self.information_values = tuple(core.information_values)
        """By category of the target: that of the category against all others."""
        self.smoothing = core.smoothing
        """What is added to both weights of a bin, for its weight of evidence, where one of them is 0."""
        self.missing = Missing.of_rows(core.rows)
        self.edited = core.edited
        """Whether a person has changed the bins after they were found."""

    def __reduce__(self) -> tuple[Any, ...]:
        restore = _restore_bins if self._result is None else type(self._result).restore_alone
        return restore, (self._core.alone().to_json(),)

    @property
    def attribute(self) -> str:
        return self.variable.name

    @property
    def n_bins(self) -> int:
        return len(self.weights)

    @property
    def missing_weight(self) -> float:
        return self.weight_with_missing - self.weight

    @property
    def borders(self) -> Floats:
        """The cut points as people read them. One between two days or two microseconds is shown as the nearest of these
        that parts the same dates or timestamps."""
        return self._core.borders

    @property
    def border_texts(self) -> list[str]:
        """The borders in words."""
        return self._core.border_texts

    @cached_property
    def labels(self) -> list[str]:
        """The bins in words: an interval, or the categories that are in it."""
        return self._core.labels

    def to_pandas(self) -> pd.DataFrame:
        """A row for each bin: its ends, its weight and share, and its weight in each category of the target; of a
        target of two categories `rate`, `woe` and `iv`, too, and of one of more each of them for each category against
        all others. Behind the bins a row for the missing, if they have
        weight, and one for the total; they have no number."""
        return self._tabulate(self._core)

    def categories_to_pandas(self) -> pd.DataFrame:
        """As `to_pandas`, but with a row for each category of an attribute that has them, whose number is that of its
        bin. Empty where that is not known, as of bins that an earlier release has written."""
        frame = self._tabulate(self._core.by_category())
        is_category = frame["bin"].notna()
        codes = frame.loc[is_category, "bin"].to_numpy(dtype=float)
        frame.loc[is_category, "bin"] = self.bin_numbers(codes)
        names = self.variable.category_names()
        frame.insert(3, "category", [names[int(code)] for code in codes] + [None] * (len(frame) - len(codes)))
        return frame.drop(columns=["left", "right"])

    def _tabulate(self, core: _core.AttributeBins) -> pd.DataFrame:
        pandas = require("pandas", "data frames", "pandas")
        rows = core.rows
        numbers = [index if row[0] == "bin" else None for index, row in enumerate(rows)]
        columns: dict[str, Any] = {
            "attribute": [self.attribute] * len(rows),
            "target": [self.target.name if self.target else None] * len(rows),
            "bin": pandas.array(numbers, dtype="Int64"),
            "interval": [row[1] for row in rows],
            "left": [row[2] for row in rows],
            "right": [row[3] for row in rows],
            "weight": [row[4] for row in rows],
            "share": [row[5] for row in rows],
        }
        if self.target is not None:
            for code, name in enumerate(self.target.category_names()):
                columns[f"weight[{name}]"] = [row[6][code] for row in rows]
        if self.rates is not None:
            evidence = [row[7] or (np.nan,) * 3 for row in rows]
            columns |= {name: [row[i] for row in evidence] for i, name in enumerate(("rate", "woe", "iv"))}
        elif self.target is not None and rows and rows[0][8]:
            for i, figure in enumerate(("rate", "woe", "iv")):
                for code, name in enumerate(self.target.category_names()):
                    columns[f"{figure}[{name}]"] = [(row[8][code] or (np.nan,) * 3)[i] for row in rows]
        frame: pd.DataFrame = pandas.DataFrame(columns)
        return frame

    def bin_numbers(self, values: Floats) -> Codes:
        """The bin of each value, from 0; one past the last bin for a NaN. A value outside the range seen falls into an
        outer bin. Of a categorical attribute the values are codes."""
        return _values.bin_numbers(values, self.cut_points, self.closed)

    def codes(self, encode: Encoding) -> Floats:
        """The numbers that stand for values: by bin, and behind them of a missing value, NaN if it has none."""
        return self._core.codes(encode)

    def merge(self, first: int, last: int) -> BinningResult:
        """Joins neighbouring bins. Their weights are added, so that no data are needed.

        Parameters
        ----------
        first : int
            The number of the first bin that is joined, from 0.
        last : int
            The number of the last one.

        Returns
        -------
        BinningResult
            The whole result, with these bins joined.

        Raises
        ------
        ValueError
            There are no such bins.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> bins = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=4)
        >>> bins["income"].merge(1, 2)["income"].labels
        ['(-inf, 24.5]', '(24.5, 74.5]', '(74.5, +inf)']
        """
        result, index = self._find()
        if first < 0:
            raise ValueError(f"bins have numbers from 0, so {first} is none")
        return type(result)(result._core.merge(index, first, last), result.left_out)

    def split(self, at: float, data: Any) -> BinningResult:
        """Cuts a bin in two.

        Parameters
        ----------
        at : float
            The new cut point.
        data : table, stream, path or list of paths
            What is counted on its sides, as `BinningResult.evaluate` takes it.

        Returns
        -------
        BinningResult
            The whole result, with this cut point.

        Raises
        ------
        ValueError
            There is such a cut point already.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> people = pd.DataFrame({"income": range(100)})
        >>> bins = mb.equal_frequency_bins(people, n_bins=2)
        >>> bins["income"].split(10, people)["income"].weights.tolist()
        [11.0, 39.0, 50.0]
        """
        cuts = self.cut_points.tolist()
        if at in cuts:
            raise ValueError(f"{at} is a cut point already")
        return self._recut(sorted([*cuts, at]), data)

    def move(self, cut: float, to: float, data: Any) -> BinningResult:
        """Puts another cut point in the place of one.

        Parameters
        ----------
        cut : float
            One of the cut points.
        to : float
            The new one, between its neighbours.
        data : table, stream, path or list of paths
            What is counted on its sides, as `BinningResult.evaluate` takes it.

        Returns
        -------
        BinningResult
            The whole result, with this cut point.

        Raises
        ------
        ValueError
            There is no such cut point, or the new one is not between its neighbours.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> people = pd.DataFrame({"income": range(100)})
        >>> bins = mb.equal_frequency_bins(people, n_bins=2)
        >>> bins["income"].move(49.5, 60, people)["income"].weights.tolist()
        [61.0, 39.0]
        """
        cuts = self.cut_points.tolist()
        if cut not in cuts:
            raise ValueError(f"{cut} is no cut point; there are {cuts}")
        cuts[cuts.index(cut)] = to
        return self._recut(cuts, data)

    def _recut(self, cuts: list[float], data: Any) -> BinningResult:
        result, index = self._find()
        return result.with_cuts({list(result)[index]: cuts}, data)

    def _find(self) -> tuple[BinningResult, int]:
        """The result that these bins belong to, and their index in it."""
        if self._result is None:
            raise ValueError("these bins belong to no result that could be changed")
        return self._result, next(index for index, found in enumerate(self._result.bins) if found is self)

    def plot(self, ax: matplotlib.axes.Axes | None = None) -> matplotlib.axes.Axes:
        """The share of each category of the target, bin by bin; a bin is as wide as its weight."""
        from ._plots import plot_bins

        return plot_bins(self, ax)

    def __repr__(self) -> str:
        against = f" against {self.target.name!r}" if self.target else ""
        return f"<AttributeBins of {self.attribute!r}{against}: {self.labels if self.n_bins else self.status}>"


def _restore_bins(text: str) -> AttributeBins:
    core = read_bins(text)
    tell_in_time_zones(core)
    return AttributeBins(core.results[0])


def tell_in_time_zones(core: _core.Bins) -> None:
    """Words the borders of timestamps as people in their time zone read them, which the core can't."""
    for index, found in enumerate(core.results):
        if found.variable.time_zone:
            core.set_border_texts(index, _word_borders(found))


def _word_borders(found: _core.AttributeBins) -> list[str]:
    """Those beyond all calendars stay numbers."""
    stamps = [_values.decode(border, "timestamp", found.variable.time_zone) for border in found.borders.tolist()]
    return [
        str(stamp) if isinstance(stamp, datetime.datetime) else text for stamp, text in zip(stamps, found.border_texts)
    ]

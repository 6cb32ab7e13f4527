"""Bins in two populations: that of which they were made, and another one."""

from __future__ import annotations

import os
from collections.abc import Iterator, Mapping
from dataclasses import dataclass
from typing import TYPE_CHECKING, Any

from . import _core
from ._bins import AttributeBins
from ._features import require
from ._json import write_text

if TYPE_CHECKING:
    import matplotlib.axes
    import pandas as pd

    from ._result import BinningResult


@dataclass(frozen=True)
class AttributeEvaluation:
    """The bins of one attribute in both populations."""

    first: AttributeBins
    """As they were found."""
    second: AttributeBins
    """As they were counted in the other data."""
    stability: float
    """The population stability index: the sum of (a - b) ln(a / b) over the bins, the missing and the unseen, where a
    is the share in the second and b that in the first population; NaN where one has no weight."""
    weight_below: float
    """Of values below the least that the bins were made of."""
    weight_above: float
    unseen_weight: float
    """Of categories that the bins were made without."""
    unseen_categories: tuple[str, ...]
    """The first ten of them."""
    flags: tuple[str, ...]
    """What should be looked at, in words: an index from 0.1 or 0.25 on, and unseen categories."""
    _rows: list[Any]

    @property
    def attribute(self) -> str:
        return self.first.attribute

    def to_pandas(self) -> pd.DataFrame:
        """A row for each bin, the missing and the unseen, if they have weight, and the total: the figures of both
        populations, and the row's part of the stability index."""
        pandas = require("pandas", "data frames", "pandas")
        columns: dict[str, Any] = {
            "attribute": [self.attribute] * len(self._rows),
            "target": [self.first.target.name if self.first.target else None] * len(self._rows),
            "bin": pandas.array(
                [number if first[0] == "bin" else None for number, (first, _, _) in enumerate(self._rows)],
                dtype="Int64",
            ),
            "interval": [second[1] for _, second, _ in self._rows],
        }
        for population, name in enumerate(("first", "second")):
            rows = [row[population] for row in self._rows]
            columns[f"{name}_weight"] = [row[4] for row in rows]
            columns[f"{name}_share"] = [row[5] for row in rows]
            if any(row[7] for row in rows):
                for figure, title in enumerate(("rate", "woe", "iv")):
                    columns[f"{name}_{title}"] = [row[7][figure] if row[7] else None for row in rows]
        columns["stability"] = [part for _, _, part in self._rows]
        frame: pd.DataFrame = pandas.DataFrame(columns)
        return frame

    def plot(self, ax: matplotlib.axes.Axes | None = None) -> matplotlib.axes.Axes:
        """The shares of both populations side by side, and their rates as lines."""
        from ._plots import plot_evaluation

        return plot_evaluation(self, ax)


class Evaluation(Mapping[Any, AttributeEvaluation]):
    """The bins of all attributes in both populations, by the keys of the result.

    In a notebook it shows itself as its `summary()`.
    """

    def __init__(self, core: _core.Evaluation, first: BinningResult, second: BinningResult) -> None:
        self._core = core
        self.first = first
        self.second = second
        self.weight_of_unseen_targets = core.weight_of_unseen_targets
        """Of the records with a category of a target that the bins do not know, which are left out."""
        self._keys = [list(self.first)[index] for index in core.indices]
        self._evaluations = [self._evaluate(number, index) for number, index in enumerate(core.indices)]

    def _evaluate(self, number: int, index: int) -> AttributeEvaluation:
        rows = self._core.rows(number)
        stability = rows[-1][2]
        unseen_weight, unseen_categories = self._core.unseen(number)
        return AttributeEvaluation(
            self.first.bins[index],
            self.second.bins[number],
            float("nan") if stability is None else stability,
            *self._core.outside(number),
            unseen_weight,
            tuple(unseen_categories),
            tuple(self._core.flags(number)),
            rows,
        )

    def __getitem__(self, key: Any) -> AttributeEvaluation:
        found = self.first[key]
        for evaluation in self._evaluations:
            if evaluation.first is found:
                return evaluation
        raise KeyError(key)

    def __iter__(self) -> Iterator[Any]:
        return iter(self._keys)

    def __len__(self) -> int:
        return len(self._keys)

    @property
    def flags(self) -> dict[Any, tuple[str, ...]]:
        """Of the attributes that should be looked at."""
        return {key: evaluation.flags for key, evaluation in self.items() if evaluation.flags}

    def summary(self) -> pd.DataFrame:
        """A row for each attribute, with the least stable one first."""
        ordered = sorted(self._evaluations, key=lambda evaluation: -evaluation.stability)
        rows = [
            {
                "attribute": evaluation.attribute,
                "target": evaluation.first.target.name if evaluation.first.target else None,
                "stability": evaluation.stability,
                "first_gain": evaluation.first.gain,
                "second_gain": evaluation.second.gain,
                "first_information_value": evaluation.first.information_value,
                "second_information_value": evaluation.second.information_value,
                "first_missing_weight": evaluation.first.missing_weight,
                "second_missing_weight": evaluation.second.missing_weight,
                "flags": "; ".join(evaluation.flags),
            }
            for evaluation in ordered
        ]
        pandas = require("pandas", "data frames", "pandas")
        frame: pd.DataFrame = pandas.DataFrame(rows)
        return frame

    def to_pandas(self) -> pd.DataFrame:
        """A row for each row of each attribute."""
        pandas = require("pandas", "data frames", "pandas")
        frame: pd.DataFrame = pandas.concat([one.to_pandas() for one in self._evaluations], ignore_index=True)
        return frame

    def to_json(self, path: str | os.PathLike[str] | None = None) -> str:
        """Writes both populations as JSON, as `mcbin evaluate --format json` does.

        Parameters
        ----------
        path : path, default=None
            The file that the text goes into as well. None: into none.

        Returns
        -------
        str
            The text.
        """
        return write_text(self._core.to_json(), path)

    def to_csv(self, path: str | os.PathLike[str] | None = None) -> str:
        """Writes a row for each row of each attribute as CSV, as `mcbin evaluate --format csv` does.

        Parameters
        ----------
        path : path, default=None
            The file that the text goes into as well. None: into none.

        Returns
        -------
        str
            The text.
        """
        return write_text(self._core.to_csv(), path)

    def __repr__(self) -> str:
        head = f"<Evaluation: {len(self)} results, {len(self.flags)} flagged>"
        try:
            return f"{head}\n{self.summary().to_string(index=False, na_rep='')}"
        except ImportError:  # without pandas
            return head

    def _repr_html_(self) -> str:
        figures = self.summary().to_html(index=False, float_format=lambda value: f"{value:.4g}", na_rep="")
        return f"<div><p>{len(self)} results, {len(self.flags)} flagged</p>{figures}</div>"

"""What was found: the bins of all attributes."""

from __future__ import annotations

import os
from collections.abc import Iterator, Mapping, Sequence
from dataclasses import dataclass
from typing import TYPE_CHECKING, Any, cast

import numpy as np

from . import _core, _values
from ._bins import AttributeBins, Variable, tell_in_time_zones
from ._features import require
from ._json import read_bins, write_text
from ._sources import name_of
from ._status import Status
from ._types import Closed, Distinct, Encoding, MemoryLimit, Method, Round, Unseen

if TYPE_CHECKING:
    import matplotlib.axes
    import matplotlib.figure
    import pandas as pd
    import pyarrow as pa

    from ._evaluation import Evaluation


@dataclass(frozen=True)
class Settings:
    closed: Closed
    n_bins: int
    max_distinct: int | None
    small_bin_ratio: float | None
    smoothing: float
    round: Round | None


@dataclass(frozen=True)
class Reduction:
    """How an engine reduced the rows to groups of equal values; or why it did not."""

    engine: str | None
    """None where the rows were read after all."""
    reason: str | None
    """Why the engine or the rows were chosen; None if they were asked for."""
    queries: int
    """That the engine ran."""
    distinct: Distinct
    """Whether the number of distinct values of an attribute with very many is exact."""
    groups: Mapping[Any, int]
    """By the result's keys: how many groups were binned."""
    weight_grid: float | None
    """Of what the weights were made multiples; None if none had to move."""


class BinningResult(Mapping[Any, AttributeBins]):
    """The bins of all attributes, by the attribute's name; with several targets, by attribute and target.

    In a notebook it shows itself as its `summary()`.
    """

    def __init__(self, core: _core.Bins, left_out: Mapping[str, str] | None = None) -> None:
        tell_in_time_zones(core)
        self._core = core
        self.method = cast(Method, core.method)
        self.settings = Settings(
            cast(Closed, core.closed),
            core.n_bins,
            core.max_distinct,
            core.small_bin_ratio,
            core.smoothing,
            cast("Round | None", core.round),
        )
        self.variables = tuple(map(Variable.from_core, core.variables))
        self.status = Status.from_core(core.status)
        self.bins = tuple(AttributeBins(found, self) for found in core.results)
        self.left_out = dict(left_out or {})
        """What each column holds that was not named, and is not of a kind that is binned unless it is, such as text."""
        self.data_name = core.data_name
        self.records = core.records
        """How many were read, whatever their weight."""
        self.records_without_weight = core.records_without_weight
        """How many were left out since their weight is missing; None without a weight."""
        self.component_version = core.component_version
        self.missing_text = tuple(core.missing_text)
        """What stands for a missing value in every column of a text file."""

    def __reduce__(self) -> tuple[Any, ...]:
        return _restore, (self.to_json(), self.left_out)

    @classmethod
    def restore_alone(cls, text: str) -> AttributeBins:
        """The bins of a pickle, as the only ones of a result."""
        return cls(read_bins(text)).bins[0]

    @property
    def weight_grid(self) -> float | None:
        """Of what the weights were made multiples, so that every sum of them is exact; None where all weights were such
        multiples, and without weights."""
        return next((variable.grid for variable in self.variables if variable.role == "weight"), None)

    @property
    def reduction(self) -> Reduction | None:
        """How the rows were reduced by an engine; None where that was not thought of."""
        core = self._core.reduction
        if core is None:
            return None
        groups = dict(zip(self, core.groups))
        distinct: Distinct = "exact" if core.is_distinct_exact else "approximate"
        return Reduction(core.engine or None, core.reason or None, core.queries, distinct, groups, self.weight_grid)

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

    def select(
        self, *, min_gain: float | None = None, min_iv: float | None = None, top: int | None = None
    ) -> BinningResult:
        """Keeps the attributes that tell most about their target.

        Parameters
        ----------
        min_gain : float, default=None
            The least gain, in bits. None: any.
        min_iv : float, default=None
            The least information value; results of targets that have not two categories have none, and are left out.
            None: any.
        top : int, default=None
            How many to keep at most: those with the largest information value if `min_iv` is given, else with the
            largest gain. None: all.

        Returns
        -------
        BinningResult
            The results that are kept, the best first.

        Raises
        ------
        ValueError
            `top` is below 0.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> people = pd.DataFrame({"age": range(12), "size": [3] * 12, "bought": 6 * ["no"] + 6 * ["yes"]})
        >>> bins = mb.supervised_bins(people, target="bought", attributes=["age"])
        >>> list(bins.select(min_iv=0.02, top=10))
        ['age']
        """
        if top is not None and top < 0:
            raise ValueError(f"top must be at least 0, not {top}")

        def rank(found: AttributeBins) -> float:
            value = found.gain if min_iv is None else found.information_value
            return -value if value == value else np.inf

        # A figure that was not found is NaN, and reaches no bound.
        kept = [
            index
            for index, found in sorted(enumerate(self.bins), key=lambda pair: rank(pair[1]))
            if (min_gain is None or found.gain >= min_gain) and (min_iv is None or found.information_value >= min_iv)
        ]
        return BinningResult(self._core.select(kept[:top]), self.left_out)

    def summary(self) -> pd.DataFrame:
        """A row for each attribute, with the largest gain first, and for each column that was left out. Targets of two
        categories have an `information_value`."""
        rows = [
            {
                "attribute": found.attribute,
                "target": found.target.name if found.target else None,
                "gain": found.gain,
                "target_entropy": found.target_entropy,
                "model_entropy": found.model_entropy,
                "information_value": found.information_value,
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
        rows += [{"attribute": name, "bins": 0, "status": f"left out: {kind}"} for name, kind in self.left_out.items()]
        pandas = require("pandas", "data frames", "pandas")
        frame: pd.DataFrame = pandas.DataFrame(rows).astype({"distinct_values": "Int64"} if rows else {})
        if self.method != "supervised":
            of_targets = ["target", "gain", "target_entropy", "model_entropy", "information_value"]
            frame = frame.drop(columns=of_targets, errors="ignore")
        elif rows and frame["information_value"].isna().all():
            frame = frame.drop(columns="information_value")
        return frame

    def to_pandas(self) -> pd.DataFrame:
        """A row for each bin of each attribute."""
        frames = [found.to_pandas() for found in self.bins if found.n_bins]
        pandas = require("pandas", "data frames", "pandas")
        frame: pd.DataFrame = pandas.concat(frames, ignore_index=True) if frames else pandas.DataFrame()
        return frame

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
        return write_text(self._core.to_json(), path)

    def to_csv(self, path: str | os.PathLike[str] | None = None) -> str:
        """Writes a row for each bin as CSV, as `mcbin --format csv` does.

        Parameters
        ----------
        path : path, default=None
            The file that the text goes into as well. None: into none.

        Returns
        -------
        str
            The text.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> bins = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=2)
        >>> len(bins.to_csv().splitlines())
        3
        """
        return write_text(self._core.to_csv(), path)

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
            The text is no JSON of bins, or of a newer version. The message names the file, and the path of the fault.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> text = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=2).to_json()
        >>> mb.BinningResult.from_json(text).method
        'equal-frequency'
        """
        return cls(read_bins(source))

    def to_sql(
        self,
        dialect: str = "",
        table: str | None = None,
        labels: bool = False,
        *,
        encode: Encoding | None = None,
        cast: bool = False,
    ) -> str:
        """Writes SQL that finds the bins of each row: a CASE expression for each attribute.

        Parameters
        ----------
        dialect : str, default=""
            One of sqlglot's, such as "duckdb", "postgres" or "bigquery"; standard SQL without one.
        table : str, default=None
            The table of the SELECT around the expressions, as it stands in SQL. None: the expressions alone.
        labels : bool, default=False
            Whether the bins are told in words; otherwise by their numbers from 0.
        encode : {"number", "label", "woe", "rate"}, default=None
            What stands for a value, as in `transform`. None: what `labels` tells.
        cast : bool, default=False
            Whether the columns of numbers hold texts, as where a file was loaded as it is, and are cast.

        Returns
        -------
        str
            The SQL. It gives what `transform` does, and for a category that the bins were made without what a missing
            value gets. Its columns are named as those of `transform`.

        Raises
        ------
        ValueError
            There is no such dialect, or no such encoding of these bins.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> bins = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=2)
        >>> print(bins.to_sql("duckdb"), end="")
        CASE
          WHEN "income" IS NULL OR isnan("income") THEN NULL
          WHEN "income" <= 49.5 THEN 0
          ELSE 1
        END AS "income_bin"
        """
        from ._sql import write

        return write(self._core, dialect, table, encode or _name_encoding(labels), cast)

    def transform(
        self,
        data: Any,
        labels: bool = False,
        *,
        encode: Encoding | None = None,
        unseen: Unseen = "error",
        memory_limit: MemoryLimit | None = None,
    ) -> Any:
        """Finds the bins of new data.

        Parameters
        ----------
        data : table, stream, path or list of paths
            As `supervised_bins` takes them, with the columns of all attributes.
        labels : bool, default=False
            Whether the bins are told in words; otherwise by their numbers from 0.
        encode : {"number", "label", "woe", "rate"}, default=None
            What stands for a value: the number of its bin, its label, or the weight of evidence or the rate of its bin,
            for which the target must have two categories. A missing value has those of the missing; where the bins were
            made without missing values, a weight of evidence of 0 and the rate of all records. None: what `labels`
            tells.
        unseen : {"error", "missing"}, default="error"
            What a category is that the bins were made without: an error with its row and column, or a missing value.
        memory_limit : int or str, default=None
            The most memory that the reading of a file may take, as in `supervised_bins`.

        Returns
        -------
        pandas.DataFrame, polars.DataFrame, pyarrow.Table or pyarrow.RecordBatchReader
            A column for each attribute, such as "age_bin", "age_woe" or "age_rate", or "age_by_bought_bin" where there
            are several targets; "_2" and so on follow where the data have such a column. A pandas or polars frame gives
            one of its kind, an Arrow table gives a table; a path, a LazyFrame or any other stream gives a reader, which
            takes the data batch by batch. A missing value has no bin.

        Raises
        ------
        DataError
            A column is missing or of another type, or a category unseen; `column` and `row` tell where.
        ValueError
            The bins have no weights of evidence.

        Warns
        -----
        BinningWarning
            An attribute has no bins, and so no column.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> bins = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=2)
        >>> bins.transform(pd.DataFrame({"income": [12, None, 70]}), labels=True)["income_bin"].tolist()
        ['(-inf, 49.5]', nan, '(49.5, +inf)']
        """
        from ._transform import transform

        return transform(self, self._core.columns, data, encode or _name_encoding(labels), unseen, memory_limit)

    def evaluate(
        self,
        data: Any,
        target: Any = None,
        weight: Any = None,
        *,
        memory_limit: MemoryLimit | None = None,
        temp_dir: str | os.PathLike[str] | None = None,
    ) -> Evaluation:
        """Counts other data in these bins, and tells how far their population has moved.

        Parameters
        ----------
        data : table, stream, path or list of paths
            As `supervised_bins` takes them, with the columns of all attributes. Any number of records.
        target : str, default=None
            The column of the target. None: that of the name which it had, or none where the data lack it; there are no
            rates then.
        weight : str, default=None
            The column of the weight. None: that of the name which it had.
        memory_limit : int or str, default=None
            The most memory that the reading of a file may take, as in `supervised_bins`.
        temp_dir : path, default=None
            The directory of the temporary file that weighted data go through which can be read only once.

        Returns
        -------
        Evaluation
            A mapping with the keys of the result. The data that the bins were made of give these again, to the last
            bit.

        Raises
        ------
        DataError
            A column is missing or of another type; `column` and `row` tell where.

        Warns
        -----
        UserWarning
            The data lack the weight that the bins had.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> bins = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=2)
        >>> evaluation = bins.evaluate(pd.DataFrame({"income": [12, 17, 70, 190]}))
        >>> evaluation["income"].second.weights.tolist(), evaluation["income"].weight_above
        ([2.0, 2.0], 1.0)
        >>> evaluation["income"].stability
        0.0
        """
        from ._counting import count
        from ._evaluation import Evaluation

        chosen = [index for index, found in enumerate(self.bins) if found.n_bins]
        core = count(self, chosen, data, target, weight, memory_limit, temp_dir)
        return Evaluation(core, BinningResult(core.first), BinningResult(core.second))

    def with_cuts(self, cuts: Mapping[Any, Sequence[float]], data: Any = None) -> BinningResult:
        """Bins between cut points of a person's choice.

        Parameters
        ----------
        cuts : dict
            By attribute, or pair of attribute and target: all cut points, which rise. Dates are days and timestamps
            microseconds since 1970; between categories they are codes.
        data : table, stream, path or list of paths, default=None
            Where there are new cut points, what is counted between them, as `evaluate` takes it. None: all cut points
            are among those that there are, so that bins are only joined.

        Returns
        -------
        BinningResult
            With the other attributes as they were. Those that were changed are `edited`.

        Raises
        ------
        KeyError
            There is no such attribute.
        TypeError
            There are new cut points, and no data.
        ValueError
            Cut points do not rise.

        Examples
        --------
        >>> import mcbinning as mb
        >>> import pandas as pd
        >>> people = pd.DataFrame({"income": range(100)})
        >>> bins = mb.equal_frequency_bins(people, n_bins=4)
        >>> bins.with_cuts({"income": [20, 60]}, people)["income"].weights.tolist()
        [21.0, 40.0, 39.0]
        >>> bins.with_cuts({"income": [49.5]})["income"].weights.tolist()
        [50.0, 50.0]
        """
        core, uncounted = self._core, []
        for key, cut_points in cuts.items():
            index = next(i for i, found in enumerate(self.bins) if found is self[key])
            wanted = [float(cut_point) for cut_point in cut_points]
            core = core.recut(index, wanted)
            if not set(wanted) <= set(self.bins[index].cut_points.tolist()):
                uncounted.append(index)
        if not uncounted:
            return BinningResult(core, self.left_out)
        if data is None:
            raise TypeError("what lies between new cut points has to be counted, so data must be given")
        from ._counting import count

        counted = count(BinningResult(core), uncounted, data).second
        for number, index in enumerate(uncounted):
            core = core.replace(index, counted, number)
        return BinningResult(core, self.left_out)

    def plot(self, attribute: Any = None, ax: matplotlib.axes.Axes | None = None) -> matplotlib.axes.Axes:
        """Draws one attribute; the one of the largest gain if none is named."""
        return (self.by_gain()[0] if attribute is None else self[attribute]).plot(ax)

    def plot_all(self, columns: int = 3) -> matplotlib.figure.Figure:
        """Draws all attributes, the one with the largest gain first."""
        from ._plots import plot_all

        return plot_all(self, columns)

    def __repr__(self) -> str:
        head = f"<BinningResult: {self.method}, {self._count()}>"
        try:
            return f"{head}\n{self._shown().to_string(index=False, na_rep='')}"
        except ImportError:  # without pandas
            return head

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


def _name_encoding(labels: bool) -> Encoding:
    return "label" if labels else "number"


def _restore(text: str, left_out: Mapping[str, str]) -> BinningResult:
    return BinningResult(read_bins(text), left_out)

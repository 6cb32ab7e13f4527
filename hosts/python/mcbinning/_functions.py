"""Binning of data that need not be in memory."""

from __future__ import annotations

import os
from collections.abc import Iterable, Mapping, Sequence
from typing import Any

from ._files import Reading
from ._opening import open_source
from ._outcome import make_result
from ._plan import Plan, columns_left_out, name_missing, name_orders, named_in, names_to_bin, texts_of
from ._progress import Progress
from ._result import BinningResult
from ._runs import run
from ._settings import Reducing, RunSettings, check_settings, check_share, directory_of
from ._sources import name_of
from ._types import CategoryOrder, Closed, Distinct, MemoryLimit, Missing, Reduce, Round, Rounding, WeightScale


def supervised_bins(
    data: Any,
    target: Any = None,
    attributes: Sequence[Any] | None = None,
    weight: Any = None,
    missing: Missing | None = None,
    pairs: Iterable[tuple[Any, Any]] | None = None,
    *,
    category_order: CategoryOrder = "rate",
    rare: float = 0.0,
    max_distinct: int | None = None,
    n_bins: int = 1000,
    closed: Closed = "right",
    small_bin_ratio: float = 0.0,
    smoothing: float = 0.5,
    round: Round | None = None,
    rounding: Rounding = "none",
    weight_scale: WeightScale | None = None,
    reduce: Reduce | None = None,
    max_groups: int = 20_000_000,
    distinct: Distinct = "exact",
    memory_limit: MemoryLimit | None = None,
    threads: int | None = None,
    temp_dir: str | os.PathLike[str] | None = None,
    progress: Progress = False,
) -> BinningResult:
    """Finds the bins that best separate the categories of a target.

    An attribute is cut where that lowers the entropy of the target most, again and again, for as long as the gain
    outweighs what the cut costs to describe.

    Parameters
    ----------
    data : table, stream, path or list of paths
        A pandas or polars frame, a polars LazyFrame, a DuckDB relation, anything of pyarrow's or with
        `__arrow_c_stream__`; or the path of a CSV, JSON, Parquet or Arrow IPC file, which may be a pattern such as
        "data/*.parquet", or several paths of files of one form. Data that can be read only once go through a nameless
        temporary file. A Spark frame, or what `query_source` gives, stays where it is: its engine reduces it.
    target : str, default=None
        The column whose categories are separated; at least 2 and at most 256. Its missing values leave a record out.
        Required without `pairs`.
    attributes : sequence of str, default=None
        The columns to cut. None: all of numbers, booleans, dates and timestamps, and those of text that are cut between
        sets of their categories: of these there are from 2 to 256, and five records for each on average. Other ones
        are left out, and the result's `left_out` names them.
    weight : str, default=None
        The column with the weight of each record, a finite number from 0, which may be fractional. None: each record
        weighs 1. A record without a weight is left out, and counted in the result.
    missing : dict, default=None
        By column: a value that stands for a missing one, or a list of such values. A tuple of two numbers among them is
        an interval, both ends included; there is at most one. `{"age": [9, 99, (900, 999)]}`
    pairs : iterable of (str, str), default=None
        Attribute and target of each result, to bin against several targets in one pass; takes the place of `target` and
        `attributes`.
    category_order : {"rate", "text"} or dict, default="rate"
        In which order the categories of an attribute are cut that have none of their own, as those of an ordered
        categorical have. "rate": by the share of the target's second category, or with several along the first
        principal direction of their shares; of an attribute with several targets the first one counts. "text": by
        their bytes. A dict tells by column all categories in their order; the others follow their rate.
    rare : float, default=0.0
        Categories with less than this share of the weight, 0 to 1, that have no order of their own become one,
        "(rare)", to which `transform` and SQL count categories that were never seen, too.
    max_distinct : int, default=None
        An attribute with more distinct values than this, at least 1, is pre-binned into `n_bins` bins of equal
        frequency, between which it is then cut. None: never.
    n_bins : int, default=1000
        The number of those pre-bins, at least 2.
    closed : {"right", "left"}, default="right"
        The side of a bin that belongs to it: (a, b] or [a, b).
    small_bin_ratio : float, default=0.0
        An inner bin whose weight is below this share, 0 to 1, of its lighter neighbour's is merged away.
    smoothing : float, default=0.5
        What is added to the weights of a bin's events and others for the weight of evidence, where one of them is 0.
        With 0 such a weight of evidence is infinite.
    round : {"auto"}, default=None
        "auto": each cut point between numbers becomes the shortest decimal between the values that it parts, such as
        34.5 for 34.4871, so that no record comes into another bin. The data are read once more for it.
    rounding : {"none", "truncate", "closest"}, default="none"
        Whether weights become whole numbers, and how. "none": they count with their fractions, but for a last digit or
        two, as they are put on a grid on which every sum is exact. So the order of the records makes no difference.
        Among a million records a weight moves by less than one part in 10^9 of the largest.
    weight_scale : {"rows"}, default=None
        "rows": the weights are scaled to sum to the number of records that have one above 0, so that the criterion sees
        as much evidence as there is; for the weights of a survey. The weights are read once more for it.
    reduce : {"rows", "engine", "auto"}, default=None
        Where the records become groups of equal values, of which the bins are made; these are the same to the last bit.
        "rows": all rows are read, as they are by default. "engine": the engine of the data sums the weights of each
        value and category, and tells these alone, as it does by default with Spark and `query_source`; DuckDB does it
        with its relations and the files that it reads. "auto": what is likely to be cheaper; the result's `reduction`
        tells the reason.
    max_groups : int, default=20000000
        The most groups that may come from an engine for one attribute. An attribute that is pre-binned may have any
        number of values, as they are told one by one only where a pre-bin may end.
    distinct : {"exact", "approximate"}, default="exact"
        How an engine counts the values of an attribute with more than `max_groups`: an exact count is the dearest of
        its queries, and nothing but `n_distinct`, and whether the attribute is pre-binned, depends on it.
    memory_limit : int or str, default=None
        The most memory that the reading of a file may take, in bytes, or as a text such as "512MB" or "2GiB". None:
        what the machine has. One batch of the columns that are read has to fit: of Parquet a page of each column, of
        CSV some 100 MB. The library itself takes 16 bytes for each row, twice while it sorts; with `reduce="engine"`
        for each group, and DuckDB keeps in files what exceeds the limit. Only with a path.
    threads : int, default=None
        Those of DuckDB, where it reduces files. None: as many as the process may use.
    temp_dir : path, default=None
        The directory of the temporary files, 8 bytes for each row and column. None: TMPDIR, else /tmp.
    progress : bool or callable, default=False
        Whether to show progress bars; or a function that is called with the phase and a number: "records" and how many
        were read, "attributes" and the index of the variable that is done, or "query" and how much of an engine's query
        is done, in percent.

    Returns
    -------
    BinningResult
        A mapping from each attribute, or pair of attribute and target, to its `AttributeBins`. The order of the rows
        makes no difference.

    Raises
    ------
    DataError
        The data can't be binned; `column` and `row` tell where.
    FileNotFoundError
        No file has this path.
    StreamError
        The reading failed behind `row` rows, or takes more than `memory_limit`.
    BinningError
        The run failed as a whole; `status` tells why.
    ValueError, TypeError
        An argument can't be used; the message names it.

    Warns
    -----
    BinningWarning
        Something is odd about one attribute: all its values are equal, or no cut separates the categories well enough.

    Examples
    --------
    >>> import mcbinning as mb
    >>> import pandas as pd
    >>> ages = [21, 22, 23, 24, 25, 26, 41, 42, 43, 44, 45, 46]
    >>> people = pd.DataFrame({"age": ages, "bought": 6 * ["no"] + 6 * ["yes"]})
    >>> bins = mb.supervised_bins(people, target="bought")
    >>> bins["age"].labels
    ['(-inf, 26]', '(26, +inf)']
    >>> bins["age"].gain
    1.0
    >>> bins.transform(pd.DataFrame({"age": [30, None, 18]}))["age_bin"].tolist()
    [1, <NA>, 0]
    """
    if (target is None) == (pairs is None):
        raise TypeError("either target or pairs must be given")
    if pairs is not None and attributes is not None:
        raise TypeError("pairs name the attributes, so attributes can't be given, too")
    check_settings(
        closed,
        n_bins,
        max_distinct,
        small_bin_ratio,
        rounding=rounding,
        smoothing=smoothing,
        round=round,
        weight_scale=weight_scale,
    )
    order = name_orders(category_order)
    check_share("rare", rare)
    reducing = Reducing(reduce, max_groups, distinct)
    source = open_source(data, Reading(memory_limit=memory_limit, threads=threads, temp_dir=temp_dir))
    target, weight = (None if label is None else name_of(label) for label in (target, weight))
    if pairs is not None:
        wanted = list(dict.fromkeys((name_of(attribute), name_of(category)) for attribute, category in pairs))
    else:
        wanted = [(name, target) for name in names_to_bin(source, attributes, [target, weight], True)]
    is_chosen = attributes is not None or pairs is not None
    plan = Plan(
        source,
        wanted,
        target,
        weight,
        name_missing(missing),
        rounding,
        optional=frozenset() if is_chosen else texts_of(source, [target, weight, *named_in(order)]),
        category_order=order,
        weight_scale=weight_scale,
        rare=rare,
        left_out={} if is_chosen else columns_left_out(source, [target, weight], True),
    )
    directory = directory_of(temp_dir)
    settings = RunSettings(n_bins, max_distinct, small_bin_ratio, smoothing, closed == "right", round, directory)
    plan, bins = run(plan, settings, reducing, progress)
    return make_result(bins, plan.left_out)


def equal_frequency_bins(
    data: Any,
    attributes: Sequence[Any] | None = None,
    weight: Any = None,
    missing: Missing | None = None,
    *,
    category_order: Mapping[Any, Sequence[str]] | None = None,
    rare: float = 0.0,
    n_bins: int = 10,
    closed: Closed = "right",
    round: Round | None = None,
    rounding: Rounding = "none",
    weight_scale: WeightScale | None = None,
    reduce: Reduce | None = None,
    max_groups: int = 20_000_000,
    distinct: Distinct = "exact",
    memory_limit: MemoryLimit | None = None,
    threads: int | None = None,
    temp_dir: str | os.PathLike[str] | None = None,
    progress: Progress = False,
) -> BinningResult:
    """Cuts each attribute into bins of equal weight; fewer than asked for, where equal values stay together.

    Parameters
    ----------
    data : table, stream, path or list of paths
        A pandas or polars frame, a polars LazyFrame, a DuckDB relation, anything of pyarrow's or with
        `__arrow_c_stream__`; or the path of a CSV, JSON, Parquet or Arrow IPC file, which may be a pattern such as
        "data/*.parquet", or several paths of files of one form; or a Spark frame, or what `query_source` gives.
    attributes : sequence of str, default=None
        The columns to cut. None: all of numbers, booleans, dates and timestamps; other ones are left out, and the
        result's `left_out` names them. A column of text that is named is cut between sets of its categories.
    weight : str, default=None
        The column with the weight of each record, a finite number from 0, which may be fractional. None: each record
        weighs 1. A record without a weight is left out, and counted in the result.
    missing : dict, default=None
        By column: a value that stands for a missing one, or a list of such values. A tuple of two numbers among them is
        an interval, both ends included; there is at most one. `{"age": [9, 99, (900, 999)]}`
    category_order : dict, default=None
        By column: all its categories in the order in which they are cut. The others are cut in the order of their
        bytes, or in the one that an ordered categorical declares.
    rare : float, default=0.0
        Categories with less than this share of the weight, 0 to 1, that have no order of their own become one,
        "(rare)", to which `transform` and SQL count categories that were never seen, too.
    n_bins : int, default=10
        The number of bins, at least 2.
    closed : {"right", "left"}, default="right"
        The side of a bin that belongs to it: (a, b] or [a, b).
    round : {"auto"}, default=None
        "auto": each cut point between numbers becomes the shortest decimal between the values that it parts.
    rounding : {"none", "truncate", "closest"}, default="none"
        Whether weights become whole numbers, and how. "none": they count with their fractions, but for a last digit or
        two, as they are put on a grid on which every sum is exact. So the order of the records makes no difference.
        Among a million records a weight moves by less than one part in 10^9 of the largest.
    weight_scale : {"rows"}, default=None
        "rows": the weights are scaled to sum to the number of records that have one above 0.
    reduce : {"rows", "engine", "auto"}, default=None
        Whether an engine reduces the records; see `supervised_bins`.
    max_groups : int, default=20000000
        The most groups that may come from an engine for one attribute, which may have any number of values.
    distinct : {"exact", "approximate"}, default="exact"
        How an engine counts the values of an attribute with more than `max_groups`.
    memory_limit : int or str, default=None
        The most memory that the reading of a file may take, in bytes, or as a text such as "512MB" or "2GiB". None:
        what the machine has. Only with a path; see `supervised_bins`.
    threads : int, default=None
        Those of DuckDB, where it reduces files. None: as many as the process may use.
    temp_dir : path, default=None
        The directory of the temporary files, 8 bytes for each row and column. None: TMPDIR, else /tmp.
    progress : bool or callable, default=False
        Whether to show progress bars; or a function that is called with the phase and a number: "records" and how many
        were read, "attributes" and the index of the variable that is done, or "query" and how much of an engine's query
        is done, in percent.

    Returns
    -------
    BinningResult
        A mapping from each attribute to its `AttributeBins`.

    Raises
    ------
    DataError, FileNotFoundError, StreamError, BinningError, ValueError, TypeError
        As by `supervised_bins`.

    Warns
    -----
    BinningWarning
        Something is odd about one attribute: all its values are equal, or no bins could be made.

    Examples
    --------
    >>> import mcbinning as mb
    >>> import pandas as pd
    >>> bins = mb.equal_frequency_bins(pd.DataFrame({"income": range(100)}), n_bins=4)
    >>> bins["income"].cut_points.tolist()
    [24.5, 49.5, 74.5]
    >>> bins["income"].weights.tolist()
    [25.0, 25.0, 25.0, 25.0]
    """
    check_settings(closed, n_bins, rounding=rounding, round=round, weight_scale=weight_scale)
    check_share("rare", rare)
    reducing = Reducing(reduce, max_groups, distinct)
    source = open_source(data, Reading(memory_limit=memory_limit, threads=threads, temp_dir=temp_dir))
    weight = None if weight is None else name_of(weight)
    names = names_to_bin(source, attributes, [weight], False)
    plan = Plan(
        source,
        [(name, None) for name in names],
        None,
        weight,
        name_missing(missing),
        rounding,
        category_order="text" if category_order is None else name_orders(category_order),
        weight_scale=weight_scale,
        rare=rare,
        left_out=columns_left_out(source, [weight], False) if attributes is None else {},
    )
    settings = RunSettings(n_bins, None, None, 0.5, closed == "right", round, directory_of(temp_dir))
    plan, bins = run(plan, settings, reducing, progress)
    return make_result(bins, plan.left_out)

"""One run: row by row, or with what an engine has reduced the rows to."""

from __future__ import annotations

from . import _core
from ._plan import Plan
from ._progress import Progress, reporting
from ._rows import bin_rows
from ._settings import Reducing, RunSettings


def run(plan: Plan, settings: RunSettings, reducing: Reducing, progress: Progress) -> _core.Bins:
    source = plan.source
    is_reduced = source.is_reduced if reducing.reduce is None else reducing.reduce != "rows"
    if reducing.reduce == "engine" and source.open_engine is None:
        raise ValueError(
            "reduce='engine' needs data that an engine has: files that DuckDB reads, a relation of DuckDB's, a Spark "
            "frame, or what query_source gives"
        )
    with reporting(progress, plan.names, len(plan.pairs), source.rows, not is_reduced) as report:
        if is_reduced and source.open_engine is not None:
            from ._reduction import bin_reduced

            return bin_reduced(plan, settings, reducing, report)
        bins = bin_rows(plan, settings, report)
        if reducing.reduce == "auto":
            bins.reduction = _core.Reduction("", "no engine has the data", 0, True, [])
        return bins

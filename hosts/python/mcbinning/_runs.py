"""One run: row by row, or with what an engine has reduced the rows to."""

from __future__ import annotations

from . import _core
from ._plan import Plan
from ._progress import Progress, reporting
from ._rows import bin_rows
from ._settings import Reducing, RunSettings


def run(plan: Plan, settings: RunSettings, reducing: Reducing, progress: Progress) -> tuple[Plan, _core.Bins]:
    """The plan without the columns that turned out not to be categories, and its bins."""
    source = plan.source
    is_reduced = source.is_reduced if reducing.reduce is None else reducing.reduce != "rows"
    if reducing.reduce == "engine" and source.open_engine is None:
        raise ValueError(
            "reduce='engine' needs data that an engine has: files that DuckDB reads, a relation of DuckDB's, a Spark "
            "frame, or what query_source gives"
        )
    if is_reduced and source.open_engine is not None:
        from ._reduction import bin_reduced

        plan, bins = bin_reduced(plan, settings, reducing, progress)
        return plan, bins if settings.round is None else _round(plan, bins, None, settings.temp_dir)
    plan, feed = plan.open_feed(settings.temp_dir, is_read_again=settings.round is not None)
    with reporting(progress, plan.names, len(plan.pairs), source.rows) as report:
        bins = bin_rows(plan, feed, settings, report)
    if reducing.reduce == "auto":
        bins.reduction = _core.Reduction("", "no engine has the data", 0, True, [])
    if settings.round is not None:
        bins = _round(plan, bins, feed if source.is_once else None, settings.temp_dir)
    return plan, bins


def _round(plan: Plan, bins: _core.Bins, feed: _core.Feed | None, temp_dir: str) -> _core.Bins:
    from ._rounding import round_cut_points  # which needs pyarrow

    return round_cut_points(plan, bins, feed, temp_dir)

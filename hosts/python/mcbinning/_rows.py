"""A run over the rows."""

from __future__ import annotations

from . import _core
from ._plan import Plan
from ._progress import Report
from ._settings import RunSettings


def bin_rows(plan: Plan, feed: _core.Feed, settings: RunSettings, report: Report | None) -> _core.Bins:
    """`plan.open_feed` has given the plan and the feed."""
    return feed.bin(
        [plan.names.index(attribute) for attribute, _ in plan.pairs],
        [plan.names.index(target) for _, target in plan.pairs if target is not None] or None,
        target=None if plan.target is None else plan.names.index(plan.target),
        **settings.keywords,
        data_name=plan.source.name,
        temp_dir=settings.temp_dir,
        progress=report,
    )

"""Cut points that are short to write."""

from __future__ import annotations

from . import _core
from ._counting import count
from ._plan import Plan
from ._result import BinningResult


def round_cut_points(plan: Plan, bins: _core.Bins, feed: _core.Feed | None, temp_dir: str) -> _core.Bins:
    """The bins with the shortest decimals between the values of the data as cut points. `feed` has them if they can be
    read only once."""
    result = BinningResult(bins)
    chosen = [index for index, found in enumerate(result.bins) if len(found.weights)]
    if not chosen:
        return bins
    if feed is None:
        return count(result, chosen, plan.source, temp_dir=temp_dir).round_cut_points()
    counted = []
    for index in chosen:
        found = result.bins[index]
        target = None if found.target is None else plan.names.index(found.target.name)
        counted.append((index, plan.names.index(found.attribute), target))
    return feed.count(bins, counted, plan.source.name).round_cut_points()

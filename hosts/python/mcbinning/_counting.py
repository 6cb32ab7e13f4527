"""Records that are counted in bins that are there already."""

from __future__ import annotations

import os
import warnings
from collections.abc import Sequence
from typing import TYPE_CHECKING, Any

from . import _core
from ._bins import Variable
from ._files import Reading
from ._opening import open_source
from ._settings import directory_of
from ._sources import Source, check_names, name_of
from ._transform import add_variable
from ._types import MemoryLimit

if TYPE_CHECKING:
    from ._result import BinningResult

WEIGHT = Variable("", "weight", "float", "", None, (), None, "", "none", (), None)
"""One that the bins did not have."""


def count(
    result: BinningResult,
    chosen: Sequence[int],
    data: Any,
    target: Any = None,
    weight: Any = None,
    memory_limit: MemoryLimit | None = None,
    temp_dir: str | os.PathLike[str] | None = None,
) -> _core.Evaluation:
    """Counts the data in the bins with these indices. `target` and `weight` name the columns that are called otherwise
    than they were."""
    texts = {variable.name: variable.missing_texts for variable in result.variables if variable.missing_texts}
    source = open_source(data, Reading(result.missing_text, texts, memory_limit, temp_dir=temp_dir))
    fields = _Fields(result, source)
    counted = []
    for index in chosen:
        found = result.bins[index]
        attribute = fields.add(found.variable, found.attribute)
        counted.append((index, attribute, fields.add_target(found.target, target)))
    fields.add_weight(weight)
    check_names(source, fields.names)
    if source.is_reduced and source.open_engine is not None:
        from ._enginecounting import count_in_engine

        return count_in_engine(result, source, counted, fields.columns)
    feed = fields.open(directory_of(temp_dir))
    return feed.count(result._core, counted, source.name)


class _Fields:
    """The columns that are counted, each once."""

    def __init__(self, result: BinningResult, source: Source) -> None:
        self._result = result
        self._source = source
        self._known = [column.name for column in source.columns]
        self._fields: dict[tuple[str, str], Variable] = {}
        """By what the column is for, and its name."""

    @property
    def columns(self) -> list[tuple[Variable, str]]:
        """Each variable and the name of its column."""
        return [(variable, name) for (_, name), variable in self._fields.items()]

    @property
    def names(self) -> list[str]:
        return list(dict.fromkeys(name for _, name in self._fields))

    def add(self, variable: Variable, name: str) -> int:
        key = (variable.role, name)
        self._fields.setdefault(key, variable)
        return list(self._fields).index(key)

    def add_target(self, variable: Variable | None, named: Any) -> int | None:
        """None where the data have no such column, and it was not asked for."""
        if variable is None:
            return None
        targets = {found.target.name for found in self._result.bins if found.target}
        if named is not None and len(targets) > 1:
            raise ValueError("target names one column, and the bins have several targets")
        name = variable.name if named is None else name_of(named)
        return self.add(variable, name) if named is not None or name in self._known else None

    def add_weight(self, named: Any) -> None:
        variable = next((variable for variable in self._result.variables if variable.role == "weight"), None)
        if named is not None:
            self.add(variable or WEIGHT, name_of(named))
        elif variable is not None and variable.name in self._known:
            self.add(variable, variable.name)
        elif variable is not None:
            words = f"there is no column {variable.name!r}, the weight of the bins, so each record weighs 1"
            warnings.warn(words, UserWarning, stacklevel=4)

    def open(self, directory: str) -> _core.Feed:
        """A feed that knows what the weights are like."""
        weight = next((key for key in self._fields if key[0] == "weight"), None)
        if weight is None:
            return self._make_feed(self._fields)
        is_scaled = self._fields[weight].weight_scale is not None
        if self._source.is_once:
            feed = self._make_feed(self._fields)
            feed.spool(directory)
            if is_scaled:
                feed.scale_weights()
            return feed
        weights = self._make_feed([weight])
        weights.learn()
        scale = self._find_scale(weight, weights.weights()) if is_scaled else 1.0
        feed = self._make_feed(self._fields)
        feed.set_weights(weights.weights(), scale)
        return feed

    def _find_scale(self, weight: tuple[str, str], known: tuple[int, float]) -> float:
        feed = self._make_feed([weight])
        feed.set_weights(known)
        return feed.scale_weights()

    def _make_feed(self, keys: Any) -> _core.Feed:
        table = self._source.open(list(dict.fromkeys(name for _, name in keys)))
        feed = _core.Feed(table)
        for use, name in keys:
            add_variable(feed, table, self._fields[use, name], name, self._result.missing_text, "kept")
        return feed

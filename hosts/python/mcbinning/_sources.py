"""What the records come from: any table, stream or file, as one kind of thing."""

from __future__ import annotations

from collections.abc import Callable, Sequence
from dataclasses import dataclass
from functools import cached_property
from typing import TYPE_CHECKING, Any

from . import _core
from ._errors import DataError

if TYPE_CHECKING:
    from ._engines import Engine


@dataclass(frozen=True)
class Column:
    name: str
    kind: str
    """`"float"`, `"integer"`, `"decimal"`, `"boolean"`, `"date"`, `"timestamp"`, `"text"` or `"null"`; of a column that
    can't be used, what it holds in words."""
    time_zone: str = ""
    is_usable: bool = True
    is_ordered: bool = False
    """Its values are categories with an order of their own."""


@dataclass(frozen=True)
class Source:
    """Data to read."""

    open: Callable[[Sequence[str] | None], _core.Table]
    """Begins to read the named columns, or all; the table may have further ones."""
    is_once: bool
    """`open` returns the same table each time, which can be read once."""
    name: str | None = None
    rows: int | None = None
    """How many there are, where that is known."""
    describe: Callable[[], Sequence[Column]] | None = None
    """Returns the columns, where that is cheaper than to open them all."""
    open_engine: Callable[[], Engine] | None = None
    """Returns what can reduce the data where they are, if there is such a thing."""
    is_reduced: bool = False
    """It is, unless rows are asked for."""

    @cached_property
    def columns(self) -> tuple[Column, ...]:
        return tuple(self.describe() if self.describe else columns_of(self.open(None)))


def check_names(source: Source, names: Sequence[str]) -> None:
    """Each is that of one column."""
    known = [column.name for column in source.columns]
    for name in names:
        if name not in known:
            raise DataError("there is no such column", name)
        if known.count(name) > 1:
            raise DataError("there are several columns of this name", name)


def name_of(label: Any) -> str:
    """The name of a column. A pandas frame may have labels that are no texts, such as numbers."""
    return label if isinstance(label, str) else str(label)


def columns_of(table: _core.Table) -> tuple[Column, ...]:
    return tuple(Column(*fields) for fields in table.columns)


def open_stream(data: Any, explain: Callable[[str], str] | None = None) -> _core.Table:
    """Any object with the Arrow stream protocol. `explain` makes a message of the stream one for the user."""
    return _core.Table.from_stream(data.__arrow_c_stream__(), explain)


def open_batches(schema: Any, batches: Any) -> _core.Table:
    """An iterator over `pyarrow.RecordBatch`. What Python code behind it raises comes through as it is; a stream would
    keep its text alone."""
    return _core.Table.from_iterator(schema.__arrow_c_schema__(), batches)


def once(table: _core.Table) -> Source:
    return Source(lambda names: table, True)

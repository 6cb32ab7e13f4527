"""What the package raises, and what it warns of."""

from __future__ import annotations

from . import _status
from ._status import Status


class BinningError(RuntimeError):
    """A run failed as a whole; `status` tells why."""

    def __init__(self, status: Status, message: str | None = None) -> None:
        super().__init__(message or str(status))
        self.status = status

    def __reduce__(self) -> tuple[type[BinningError], tuple[Status, str]]:
        return type(self), (self.status, str(self))


class DataError(ValueError):
    """The data can't be binned. `column` names the column, `row` counts from 0; None where there is no such thing."""

    def __init__(self, message: str, column: str | None = None, row: int | None = None) -> None:
        self.message = message
        self.column = column
        self.row = row if row is not None and row >= 0 else None
        where = [] if self.column is None else [f"column {self.column!r}"]
        if self.row is not None:
            where.append(f"row {self.row}")
        super().__init__(", ".join(where) + (": " if where else "") + message)

    def __reduce__(self) -> tuple[type[DataError], tuple[str, str | None, int | None]]:
        return type(self), (self.message, self.column, self.row)


class StreamError(RuntimeError):
    """The stream or the engine of the data failed. `row` rows had come by then; None if that is not known."""

    def __init__(self, message: str, row: int | None = None) -> None:
        super().__init__(message if row is None else f"the stream failed behind {row} rows: {message}")
        self.message = message
        self.row = row

    def __reduce__(self) -> tuple[type[StreamError], tuple[str, int | None]]:
        return type(self), (self.message, self.row)


class BinningWarning(UserWarning):
    """There is something to say about one attribute: `attribute` and `status` tell what."""

    def __init__(self, attribute: str, status: Status) -> None:
        super().__init__(f"attribute {attribute!r}: {status.words}")
        self.attribute = attribute
        self.status = status

    def __reduce__(self) -> tuple[type[BinningWarning], tuple[str, Status]]:
        return type(self), (self.attribute, self.status)


class SingleValueWarning(BinningWarning):
    """All its valid values are equal."""


class NoValidValuesWarning(BinningWarning):
    """No record has a valid value."""


class SingleCategoryWarning(BinningWarning):
    """The records with a valid value have a single category of the target."""


class NoCutPointsWarning(BinningWarning):
    """It is one bin, as no cut point was found."""


class BadBinTableWarning(BinningWarning):
    """Its values fit no bins."""


class NotBinnedWarning(BinningWarning):
    """It could not be binned; the others were."""


_CLASSES: dict[int, type[BinningWarning]] = {
    _status.SINGLE_VALUE: SingleValueWarning,
    _status.NO_VALID_VALUES: NoValidValuesWarning,
    _status.SINGLE_CATEGORY: SingleCategoryWarning,
    _status.NO_CUT_POINTS: NoCutPointsWarning,
    _status.NO_EF_CUT_POINTS: NoCutPointsWarning,
    _status.BAD_BIN_TABLE: BadBinTableWarning,
}


def warning_of(attribute: str, status: Status) -> BinningWarning:
    """The warning that tells of a status that is not OK."""
    kind = NotBinnedWarning if status.is_error else _CLASSES.get(status.code, BinningWarning)
    return kind(attribute, status)

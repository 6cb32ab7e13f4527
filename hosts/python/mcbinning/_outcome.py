"""What a run found, as a result of the package."""

from __future__ import annotations

import warnings
from collections.abc import Mapping

from . import _core
from ._errors import BinningError, DataError, warning_of
from ._result import BinningResult
from ._status import NO_RECORDS, Status


def make_result(core: _core.Bins, left_out: Mapping[str, str] | None = None, stacklevel: int = 3) -> BinningResult:
    """The result of a run, whose warnings become Python's. \\raise BinningError if it failed as a whole."""
    status = Status.from_core(core.status)
    if status.code == NO_RECORDS and core.records == 0:
        raise DataError("the data have no rows")
    if status.is_error:
        raise BinningError(status)
    result = BinningResult(core, left_out)
    for found in result.bins:
        if not found.status.ok:
            warnings.warn(warning_of(found.attribute, found.status), stacklevel=stacklevel)
    return result

"""Checks of the settings of a run."""

from __future__ import annotations

import math
import numbers
import os
from dataclasses import dataclass
from typing import Any

from . import _core
from ._errors import BinningError
from ._status import TEMP_DIR_NOT_FOUND, Status
from ._types import Distinct, Reduce, Round

_LARGEST_INT = 2**31 - 1


@dataclass(frozen=True)
class RunSettings:
    """How the attributes are binned."""

    n_bins: int
    max_distinct: int | None
    small_bin_ratio: float | None
    smoothing: float
    right_closed: bool
    round: Round | None
    temp_dir: str

    @property
    def keywords(self) -> dict[str, Any]:
        """Of the core's operations."""
        names = ("n_bins", "max_distinct", "small_bin_ratio", "smoothing", "right_closed")
        return {name: getattr(self, name) for name in names}


@dataclass(frozen=True)
class Reducing:
    """Whether the rows are reduced, and how far."""

    reduce: Reduce | None
    max_groups: int
    distinct: Distinct

    def __post_init__(self) -> None:
        if self.reduce not in (None, "rows", "engine", "auto"):
            raise ValueError(f"reduce must be 'rows', 'engine' or 'auto', not {self.reduce!r}")
        if self.distinct not in ("exact", "approximate"):
            raise ValueError(f"distinct must be 'exact' or 'approximate', not {self.distinct!r}")
        check_whole("max_groups", self.max_groups, 1)


def check_settings(
    closed: str,
    n_bins: int,
    max_distinct: int | None = None,
    small_bin_ratio: float = 0.0,
    *,
    rounding: str = "none",
    smoothing: float = 0.5,
    round: str | None = None,
    weight_scale: str | None = None,
) -> None:
    if closed not in ("right", "left"):
        raise ValueError(f"closed must be 'right' or 'left', not {closed!r}")
    check_whole("n_bins", n_bins, 2)
    if max_distinct is not None:
        check_whole("max_distinct", max_distinct, 1)
    check_share("small_bin_ratio", small_bin_ratio)
    if not 0.0 <= smoothing < math.inf:
        raise ValueError(f"smoothing must be a finite number of at least 0, not {smoothing}")
    if round not in (None, "auto"):
        raise ValueError(f"round must be 'auto' or None, not {round!r}")
    if weight_scale not in (None, "rows"):
        raise ValueError(f"weight_scale must be 'rows' or None, not {weight_scale!r}")
    if rounding not in ("none", "truncate", "closest"):
        raise ValueError(f"rounding must be 'none', 'truncate' or 'closest', not {rounding!r}")


def check_share(name: str, value: float) -> None:
    if not 0.0 <= value <= 1.0:
        raise ValueError(f"{name} must be from 0 to 1, not {value}")


def check_whole(name: str, value: Any, least: int) -> None:
    if not isinstance(value, numbers.Integral) or not least <= int(value) <= _LARGEST_INT:
        raise ValueError(f"{name} must be a whole number of at least {least}, not {value!r}")


def directory_of(temp_dir: str | os.PathLike[str] | None) -> str:
    """The directory for temporary files. Refuses a TMPDIR that is set and can't be used."""
    try:
        return _core.temp_directory("" if temp_dir is None else os.fspath(temp_dir))
    except RuntimeError as error:
        raise BinningError(Status(TEMP_DIR_NOT_FOUND, "error"), str(error)) from None

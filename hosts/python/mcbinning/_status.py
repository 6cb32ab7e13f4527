"""The library's outcomes."""

from __future__ import annotations

from collections.abc import Sequence
from dataclasses import dataclass
from typing import cast

from . import _core
from ._types import Severity

TEMP_DIR_NOT_FOUND = 120001
BAD_BIN_TABLE = 120002
NO_RECORDS = 120004
SINGLE_VALUE = 120014
NO_VALID_VALUES = 120015
SINGLE_CATEGORY = 120016
NO_CUT_POINTS = 120017
NO_EF_CUT_POINTS = 120019


@dataclass(frozen=True)
class Status:
    """How a run, or the binning of one attribute, ended."""

    code: int = 0
    severity: Severity = "ok"
    """`"ok"`, `"warning"` or `"error"`. An error means that there are no bins; a warning, that there are."""
    discrete: tuple[int, ...] = (0, 0, 0)
    scale: tuple[float, ...] = (0.0, 0.0, 0.0)

    @classmethod
    def from_core(cls, fields: tuple[int, str, Sequence[int], Sequence[float]]) -> Status:
        code, severity, discrete, scale = fields
        return cls(code, cast(Severity, severity), tuple(discrete), tuple(scale))

    @property
    def ok(self) -> bool:
        return self.severity == "ok"

    @property
    def is_error(self) -> bool:
        return self.severity == "error"

    @property
    def words(self) -> str:
        return "OK" if self.ok else _core.status_words(self.code, self.severity == "warning")

    def __str__(self) -> str:
        return "OK" if self.ok else f"{self.severity} {self.code}: {self.words}"

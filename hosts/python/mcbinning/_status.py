"""The library's outcomes, and their words."""

from __future__ import annotations

from collections.abc import Sequence
from dataclasses import dataclass
from typing import cast

from ._types import Severity

CANCELLED = 1
TEMP_DIR_NOT_FOUND = 120001
BAD_BIN_TABLE = 120002
NO_RECORDS = 120004
SINGLE_VALUE = 120014
NO_VALID_VALUES = 120015
SINGLE_CATEGORY = 120016
NO_CUT_POINTS = 120017
NO_EF_CUT_POINTS = 120019

_WORDS = {
    CANCELLED: "cancelled",
    3: "out of memory",
    TEMP_DIR_NOT_FOUND: "the directory for temporary files does not exist, or no file can be made in it",
    BAD_BIN_TABLE: "the values lie outside all bins",
    120003: "these variables cannot be analysed: there is no attribute, or one has fewer than 2 categories or no role",
    NO_RECORDS: "there is no record of positive weight",
    120005: "the variable is the target or the weight, or attribute and target at once",
    120006: "the target is not categorical",
    120008: "there is no pair of an attribute and a target that can be binned",
    120009: "the number of bins is not set",
    120010: "there is no target, or its categories cannot be used",
    120011: "there is no such attribute",
    120012: "the variable has more than 256 categories",
    120013: "there is no such variable or result",
    SINGLE_VALUE: "all valid values are equal",
    NO_VALID_VALUES: "no record has a valid value",
    SINGLE_CATEGORY: "the records with a valid value have a single category of the target",
    NO_CUT_POINTS: "no cut point separates the categories of the target well enough",
    120018: "some results carry a warning or an error",
    NO_EF_CUT_POINTS: "no cut point was found: too few different values for the number of bins",
    120020: "there are no results",
    120021: "a temporary file cannot be opened, written or read; the disk may be full",
}


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
        if self.ok:
            return "OK"
        return _WORDS.get(self.code, "a status that this package does not know")

    def __str__(self) -> str:
        return "OK" if self.ok else f"{self.severity} {self.code}: {self.words}"

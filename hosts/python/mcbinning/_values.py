"""Numbers, as the library works on them, and what they stand for."""

from __future__ import annotations

import datetime
import math
from collections.abc import Callable
from typing import Any

import numpy as np
import numpy.typing as npt
import pandas as pd

from ._core import MISSING

Floats = npt.NDArray[np.float64]
Codes = npt.NDArray[np.intp]

_FEW_CUTS = 32
_ROWS_IN_CACHE = 1 << 14

LARGEST = float(np.finfo(np.float64).max)
"""What stands for an infinite end in the library."""


def figure(value: float) -> float:
    """A figure of the library's, NaN where it found none."""
    return math.nan if value == MISSING else value


def decode(value: float, kind: str, time_zone: str = "") -> Any:
    """What the number stands for in a column of this kind: a date, say."""
    if not math.isfinite(value):
        return value
    if kind == "boolean":
        return bool(value)
    if kind == "integer":
        return int(value) if value.is_integer() else value
    try:
        if kind == "date":
            return datetime.date(1970, 1, 1) + datetime.timedelta(days=math.floor(value))
        if kind == "timestamp":
            stamp = pd.Timestamp(math.floor(value), unit="us")
            return stamp.tz_localize("UTC").tz_convert(time_zone) if time_zone else stamp
    except (OverflowError, pd.errors.OutOfBoundsDatetime):
        pass  # beyond all calendars, as DuckDB's "infinity" is: it stays a number
    return value


def encode(value: Any, kind: str) -> float:
    """The number of a value given by the user, such as one that stands for missing."""
    if kind == "date":
        return float((pd.Timestamp(value).normalize() - pd.Timestamp(1970, 1, 1)).days)
    if kind == "timestamp":
        stamp = pd.Timestamp(value)
        utc = stamp.tz_convert("UTC").tz_localize(None) if stamp.tzinfo else stamp
        return float((utc - pd.Timestamp(1970, 1, 1)) / pd.Timedelta(1, "us"))
    return float(value)


def parse(text: str) -> float | None:
    """The number that a field of a text file stands for; None if it is no finite number."""
    try:
        value = float(text)
    except ValueError:
        return None
    return value if math.isfinite(value) and "_" not in text else None


def plain(value: float) -> float | int:
    """A whole number as an int, so that it is written without a point."""
    is_whole = math.isfinite(value) and value.is_integer() and abs(value) < 1e15
    return int(value) if is_whole and not (value == 0 and math.copysign(1, value) < 0) else value


def format_value(value: float, kind: str = "float", time_zone: str = "") -> str:
    """The value in as few digits as read back to the same double; of a date, the date."""
    if math.isinf(value):
        return "+inf" if value > 0 else "-inf"
    if kind in ("date", "timestamp") and not math.isnan(value):
        return str(decode(value, kind, time_zone))
    return repr(whole(value, kind))


def whole(value: float, kind: str) -> float | int:
    """A whole number as an int, so that it reads as one: of a column of whole numbers, or of decimals, whatever its
    size; of others as long as all its digits say something."""
    is_whole = math.isfinite(value) and value.is_integer() and (kind in ("integer", "decimal") or abs(value) < 1e16)
    return int(value) if is_whole and not (value == 0 and math.copysign(1, value) < 0) else value


def intervals(cut_points: Floats, closed: str, write: Callable[[float], str]) -> list[str]:
    """The bins in the usual notation, the bracket on the closed side. Infinite ends are open, and the outer bins hold
    the infinities; but one that is a cut point has a bin for itself, as in "[-inf, -inf]"."""
    ends = ["-inf", *(write(float(cut)) for cut in cut_points), "+inf"]
    left, right = ("(", "]") if closed == "right" else ("[", ")")
    labels = [
        f"{'(' if a == '-inf' else left}{a}, {b}{')' if b == '+inf' else right}" for a, b in zip(ends, ends[1:])
    ]
    if ends[1] == "-inf":
        labels[0] = "[-inf, -inf]"
    if ends[-2] == "+inf":
        labels[-1] = "[+inf, +inf]"
    return labels


def bin_numbers(values: Floats, cut_points: Floats, closed: str) -> Codes:
    """The bin of each value, from 0; one past the last bin for a NaN."""
    if len(cut_points) <= _FEW_CUTS:
        bins = _count_cuts(values, cut_points, closed)
    else:
        bins = np.searchsorted(cut_points, values, side="left" if closed == "right" else "right")
    missing = np.isnan(values)
    if missing.any():
        bins[missing] = len(cut_points) + 1
    return bins


def _count_cuts(values: Floats, cut_points: Floats, closed: str) -> Codes:
    """How many cut points each value is beyond. Without a branch for each value this is several times as fast as a
    search, as long as there are few of them and the rows at hand stay in the cache."""
    is_beyond = np.greater if closed == "right" else np.greater_equal
    bins: Codes = np.empty(len(values), dtype=np.intp)
    for first in range(0, len(values), _ROWS_IN_CACHE):
        part = np.ascontiguousarray(values[first : first + _ROWS_IN_CACHE])
        count = np.zeros(len(part), dtype=np.uint8)
        for cut in cut_points:
            count += is_beyond(part, cut)
        bins[first : first + _ROWS_IN_CACHE] = count
    return bins


def entropy(weights: Floats) -> float:
    """Of a distribution over categories, in bits; NaN without weight. Summed in the order of the categories."""
    parts = [weight for weight in weights.tolist() if weight > 0]
    total = sum(parts)
    bits = 0.0
    for weight in parts:
        bits -= weight / total * math.log2(weight / total)
    return bits if parts else math.nan

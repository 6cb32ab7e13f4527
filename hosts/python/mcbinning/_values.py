"""Numbers, as the library works on them, and what they stand for."""

from __future__ import annotations

import datetime
import math
import zoneinfo
from typing import Any

import numpy as np
import numpy.typing as npt

from ._features import require

Floats = npt.NDArray[np.float64]
Codes = npt.NDArray[np.intp]

_FEW_CUTS = 32
_ROWS_IN_CACHE = 1 << 14


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
            return _decode_time(math.floor(value), time_zone)
    except OverflowError:
        pass  # beyond all calendars, as DuckDB's "infinity" is: it stays a number
    return value


def _decode_time(microseconds: int, time_zone: str) -> datetime.datetime:
    stamp = datetime.datetime(1970, 1, 1) + datetime.timedelta(microseconds=microseconds)
    if not time_zone:
        return stamp
    zone: datetime.tzinfo | None
    try:
        zone = zoneinfo.ZoneInfo(time_zone)
    except (zoneinfo.ZoneInfoNotFoundError, ValueError):
        try:
            zone = datetime.datetime.strptime(time_zone, "%z").tzinfo  # an offset, such as "+02:00"
        except ValueError:
            zone = datetime.timezone.utc  # a zone that this machine does not know
    return stamp.replace(tzinfo=datetime.timezone.utc).astimezone(zone)


def encode(value: Any, kind: str) -> float:
    """The number of a value given by the user, such as one that stands for missing."""
    if kind not in ("date", "timestamp"):
        return float(value)
    pd = require("pandas", "dates that are declared missing", "pandas")
    stamp = pd.Timestamp(value)
    if kind == "date":
        return float((stamp.normalize() - pd.Timestamp(1970, 1, 1)).days)
    utc = stamp.tz_convert("UTC").tz_localize(None) if stamp.tzinfo else stamp
    return float((utc - pd.Timestamp(1970, 1, 1)) / pd.Timedelta(1, "us"))


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

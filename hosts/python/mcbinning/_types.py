"""The words that options and results are told in."""

from __future__ import annotations

from collections.abc import Mapping, Sequence
from typing import Any, Literal

CategoryOrder = Literal["rate", "text"] | Mapping[Any, Sequence[str]]
"""How categories that have no order of their own are ordered; or by column their order."""
Closed = Literal["right", "left"]
Distinct = Literal["exact", "approximate"]
Encoding = Literal["number", "label", "woe", "rate"]
Encode = Literal["ordinal", "onehot", "interval", "woe", "rate"]
Drop = Literal["first"]
Favoured = Literal["others", "event"]
MissingOutput = Literal["code", "keep"]
Reduce = Literal["rows", "engine", "auto"]
Round = Literal["auto"]
Rounding = Literal["none", "truncate", "closest"]
WeightScale = Literal["rows"]
Unseen = Literal["error", "missing"]
Method = Literal["supervised", "equal-frequency"]
Role = Literal["attribute", "target", "weight"]
Severity = Literal["ok", "warning", "error"]

Missing = Mapping[Any, Any]
"""By column: the value that stands for missing, or a list of such values. A tuple of two numbers among them is an
interval, both ends included; there is at most one."""

MemoryLimit = int | str
"""Bytes, as a number or as a text such as "512MB"."""

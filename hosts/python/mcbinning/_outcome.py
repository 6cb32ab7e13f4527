"""What the library found, as a result of the package."""

from __future__ import annotations

import warnings
from collections.abc import Mapping, Sequence
from dataclasses import replace
from typing import Any

import numpy as np

from . import _values
from ._errors import BinningError, DataError, warning_of
from ._result import AttributeBins, BinningResult, Settings, Variable
from ._status import NO_RECORDS, Status
from ._types import Closed, Method


def make_result(
    outcome: Any,
    variables: Sequence[Variable],
    settings: Settings,
    method: Method,
    data_name: str | None = None,
    left_out: Mapping[str, str] | None = None,
    stacklevel: int = 3,
) -> BinningResult:
    """The result of a run, whose warnings become Python's. \\raise BinningError if it failed as a whole."""
    fields, entries, records, version, without_weight, grid = outcome
    status = Status.from_core(fields)
    if status.code == NO_RECORDS and records == 0:
        raise DataError("the data have no rows")
    if status.is_error:
        raise BinningError(status)
    variables = [replace(variable, grid=grid) if variable.role == "weight" else variable for variable in variables]
    bins = tuple(_attribute_bins(entry, variables, settings.closed) for entry in entries)
    result = BinningResult(
        method,
        settings,
        tuple(variables),
        status,
        bins,
        dict(left_out or {}),
        data_name,
        records,
        version,
        records_without_weight=without_weight,
    )
    for found in bins:
        if not found.status.ok:
            warnings.warn(warning_of(found.attribute, found.status), stacklevel=stacklevel)
    return result


def _attribute_bins(entry: dict[str, Any], variables: Sequence[Variable], closed: Closed) -> AttributeBins:
    target = variables[entry["target"]] if "target" in entry else None
    counts = entry["counts"]
    n_bins = len(entry["cut_points"]) + 1
    if len(counts) != n_bins or (target is not None and counts.shape[1] < 2):
        counts = np.empty((0, 1))  # nothing was binned: the rows that there are have no weights
    target_weights = None
    if target is not None:
        # The last categories have no column where no record has them.
        target_weights = np.zeros((len(counts), len(target.categories or ())))
        target_weights[:, : counts.shape[1] - 1] = counts[:, 1:]
    return AttributeBins(
        variable=variables[entry["attribute"]],
        target=target,
        status=Status.from_core(entry["status"]),
        closed=closed,
        cut_points=entry["cut_points"],
        weights=np.ascontiguousarray(counts[:, 0]),
        target_weights=target_weights,
        n_distinct=entry["n_distinct"],
        weight=entry["weight"],
        weight_with_missing=entry["weight_with_missing"],
        minimum=entry["minimum"],
        maximum=entry["maximum"],
        model_entropy=_values.figure(entry["model_entropy"]) if target else float("nan"),
    )

"""Bins as JSON, in the form that `docs/json.md` describes and `mcbin` shares."""

from __future__ import annotations

import json
import math
from typing import Any

import numpy as np

from . import _values
from ._result import AttributeBins, BinningResult, Settings, Variable
from ._status import Status
from ._types import Closed

_SCHEMA = "mcobnqrt-bins"
_SCHEMA_VERSION = 2


def dump(result: BinningResult) -> str:
    document = {
        "schema": _SCHEMA,
        "schema_version": _SCHEMA_VERSION,
        "component_version": result.component_version,
        "method": result.method,
        "settings": {
            "closed": result.settings.closed,
            "bins": int(result.settings.n_bins),
            "distinct_threshold": _int_or_none(result.settings.max_distinct),
            "small_bins": _number_or_none(result.settings.small_bin_ratio),
        },
        "data": {
            "name": result.data_name,
            "records": result.records,
            "records_without_weight": result.records_without_weight,
            "missing_text": list(result.missing_text),
        },
        "variables": [_dump_variable(variable) for variable in result.variables],
        "status": _dump_status(result.status),
        "results": [_dump_bins(found) for found in result.bins],
    }
    return json.dumps(document, ensure_ascii=False, allow_nan=False, indent=2) + "\n"


def _upgrade(document: dict[str, Any]) -> None:
    """Makes a document of version 1 one of version 2. In the former the missing texts of each column are among those of
    all columns, which are not declared as numbers, too; and the bins lack the weights of the target's last categories if
    no record that counts is of them."""
    numbers = [number for number in map(_values.parse, document["data"]["missing_text"]) if number is not None]
    for variable in document["variables"]:
        missing = variable["missing"]
        missing["texts"] = []
        if variable["kind"] != "string-categorical":
            missing["values"] += [number for number in numbers if number not in map(float, missing["values"])]
    n_categories = {
        variable["name"]: len(variable["categories"]) for variable in document["variables"] if variable["categories"]
    }
    for result in document["results"]:
        if result["target"] is not None:
            for row in result["bins"]:
                row["weights"] += [0] * (n_categories[result["target"]] - len(row["weights"]))


def load(text: str) -> BinningResult:
    document = json.loads(text)
    if not isinstance(document, dict) or document.get("schema") != _SCHEMA:
        raise ValueError(f"the text is no JSON of bins: its schema is not {_SCHEMA!r}")
    if document["schema_version"] > _SCHEMA_VERSION:
        raise ValueError(f"the bins have schema version {document['schema_version']}, which is newer than this package")
    if document["schema_version"] == 1:
        _upgrade(document)
    settings = document["settings"]
    variables = tuple(_load_variable(member) for member in document["variables"])
    by_name = {variable.name: variable for variable in variables if variable.role != "weight"}
    small_bins = settings["small_bins"]
    return BinningResult(
        method=document["method"],
        settings=Settings(
            settings["closed"],
            settings["bins"],
            settings["distinct_threshold"],
            None if small_bins is None else float(small_bins),
        ),
        variables=variables,
        status=_load_status(document["status"]),
        bins=tuple(_load_bins(member, by_name, settings["closed"]) for member in document["results"]),
        data_name=document["data"]["name"],
        records=document["data"]["records"],
        missing_text=tuple(document["data"]["missing_text"]),
        component_version=document["component_version"],
        records_without_weight=document["data"].get("records_without_weight"),
    )


def _number(value: float) -> float | int | str:
    """JSON has no infinities; they are texts."""
    if math.isnan(value):
        return "nan"
    return _values.plain(value) if math.isfinite(value) else "inf" if value > 0 else "-inf"


def _number_or_none(value: float | None) -> float | int | str | None:
    """None for a figure that was not found."""
    return None if value is None or math.isnan(value) else _number(float(value))


def _int_or_none(value: int | None) -> int | None:
    return None if value is None else int(value)


def _end(value: float) -> float | int | str:
    """The end of an interval, which is infinite as the largest double."""
    return _number(value if abs(value) < _values.LARGEST else math.copysign(math.inf, value))


def _float(member: Any) -> float:
    return math.nan if member is None else float(member)


def _dump_status(status: Status) -> dict[str, Any]:
    return {
        "code": status.code,
        "severity": status.severity,
        "words": status.words,
        "discrete": list(status.discrete),
        "scale": [_number(value) for value in status.scale],
    }


def _load_status(member: dict[str, Any]) -> Status:
    return Status(
        member["code"], member["severity"], tuple(member["discrete"]), tuple(map(float, member["scale"]))
    )


def _json_kind(variable: Variable) -> str:
    if variable.role == "weight":
        return "weight"
    if variable.categories is None:
        return "continuous"
    return "string-categorical" if variable.kind == "text" else "numeric-categorical"


def _dump_variable(variable: Variable) -> dict[str, Any]:
    interval = variable.missing_interval
    return {
        "name": variable.name,
        "label": variable.label,
        "kind": _json_kind(variable),
        "role": variable.role,
        "categories": None if variable.categories is None else _dump_list(variable.categories),
        "rounding": variable.rounding,
        "grid": _number_or_none(variable.grid),
        "missing": {
            "values": _dump_list(variable.missing_values),
            "texts": list(variable.missing_texts),
            "interval": None if interval is None else [_end(end) for end in interval],
        },
        # Beyond what mcbin knows: what the numbers stand for.
        "value_kind": variable.kind,
        "time_zone": variable.time_zone,
    }


def _dump_list(values: tuple[Any, ...]) -> list[Any]:
    return [value if isinstance(value, str) else _number(value) for value in values]


def _load_variable(member: dict[str, Any]) -> Variable:
    is_text = member["kind"] == "string-categorical"
    convert = str if is_text else float
    interval = member["missing"]["interval"]
    return Variable(
        name=member["name"],
        role=member["role"],
        kind=member.get("value_kind", "text" if is_text else "float"),
        time_zone=member.get("time_zone", ""),
        categories=None if member["categories"] is None else tuple(map(convert, member["categories"])),
        missing_values=tuple(map(convert, member["missing"]["values"])),
        missing_interval=None if interval is None else (float(interval[0]), float(interval[1])),
        label=member["label"],
        rounding=member["rounding"],
        missing_texts=tuple(member["missing"]["texts"]),
        grid=None if member.get("grid") is None else float(member["grid"]),
    )


def _dump_bins(found: AttributeBins) -> dict[str, Any]:
    ends = [-math.inf, *found.cut_points.tolist(), math.inf]
    bins = [
        {
            "left": _number(ends[i]),
            "right": _number(ends[i + 1]),
            "weight": _number(weight),
            "weights": None
            if found.target_weights is None
            else [_number(part) for part in found.target_weights[i].tolist()],
        }
        for i, weight in enumerate(found.weights.tolist())
    ]
    return {
        "attribute": found.attribute,
        "target": found.target.name if found.target else None,
        "status": _dump_status(found.status),
        "distinct_values": found.n_distinct,
        "weight": _number(found.weight),
        "weight_with_missing": _number(found.weight_with_missing),
        "minimum": _number_or_none(found.minimum),
        "maximum": _number_or_none(found.maximum),
        "target_entropy": _number_or_none(found.target_entropy),
        "model_entropy": _number_or_none(found.model_entropy),
        "cut_points": [_number(cut) for cut in found.cut_points.tolist()],
        "bins": bins,
    }


def _load_bins(member: dict[str, Any], variables: dict[str, Variable], closed: Closed) -> AttributeBins:
    target = None if member["target"] is None else variables[member["target"]]
    target_weights = None
    if target is not None:
        n_categories = len(target.categories or ())
        target_weights = np.array([[float(w) for w in row["weights"]] for row in member["bins"]], dtype=np.float64)
        target_weights = target_weights.reshape(len(member["bins"]), n_categories)
    return AttributeBins(
        variable=variables[member["attribute"]],
        target=target,
        status=_load_status(member["status"]),
        closed=closed,
        cut_points=np.array([float(cut) for cut in member["cut_points"]], dtype=np.float64),
        weights=np.array([float(row["weight"]) for row in member["bins"]], dtype=np.float64),
        target_weights=target_weights,
        n_distinct=member["distinct_values"],
        weight=_float(member["weight"]),
        weight_with_missing=_float(member["weight_with_missing"]),
        minimum=_float(member["minimum"]),
        maximum=_float(member["maximum"]),
        model_entropy=_float(member["model_entropy"]),
    )

"""The bins of a Spark frame's values, computed in Spark."""

from __future__ import annotations

from collections.abc import Sequence
from typing import TYPE_CHECKING, Any

from ._errors import DataError
from ._features import require
from ._sources import Column, Source, check_names
from ._spark import refuse_collations
from ._sql import parse
from ._types import Encoding, Unseen

if TYPE_CHECKING:
    from ._bins import AttributeBins, Variable
    from ._result import BinningResult

_NUMBERS = ("float", "integer", "decimal")


def add_bins(
    frame: Any,
    source: Source,
    result: BinningResult,
    named: Sequence[tuple[int, str]],
    encode: Encoding,
    unseen: Unseen,
) -> Any:
    """The frame with the columns of bins behind its own: its rows have no order by which others could be joined.
    `named` are the indices of results and the names of their columns."""
    chosen = [(result.bins[index], name) for index, name in named]
    attributes = list(dict.fromkeys(bins.attribute for bins, _ in chosen))
    check_names(source, attributes)
    refuse_collations(frame, attributes)
    by_name = {column.name: column for column in source.columns}
    functions = require("pyspark.sql.functions", "Spark frames", "spark")
    columns = []
    numbers = parse(result._core, "spark", "number")
    for (bins, name), tree, number in zip(chosen, parse(result._core, "spark", encode), numbers):
        _check_kind(by_name[bins.attribute], bins.variable)
        case, bin_number = (
            functions.expr(_compare_doubles(column.this, bins.variable).sql(dialect="spark"))
            for column in (tree, number)
        )
        if bins.variable.is_categorical:
            missing = bins.codes(encode)[-1] if encode in ("woe", "rate") else None
            case = _tell_unseen(functions, case, bin_number, missing, bins, result.missing_text, unseen)
        columns.append(case.alias(name))
    return frame.select("*", *columns)


def _check_kind(column: Column, variable: Variable) -> None:
    """Refuses what SQL compares in another way than the library, or not at all. A column without a type has no values
    to compare."""
    are_numbers = variable.kind in _NUMBERS and column.kind in (*_NUMBERS, "boolean")
    is_alike = column.kind == variable.kind and bool(column.time_zone) == bool(variable.time_zone)
    if not (are_numbers or is_alike or column.kind == "null"):
        held = _describe(column.kind, column.time_zone)
        raise DataError(
            f"the column holds {held}, and the bins are of {_describe(variable.kind, variable.time_zone)}: cast it in "
            "Spark",
            column.name,
        )


def _describe(kind: str, time_zone: str) -> str:
    return kind if kind != "timestamp" else f"timestamp {'with' if time_zone else 'without'} a time zone"


def _compare_doubles(case: Any, variable: Variable) -> Any:
    """As the reader of columns does: left to itself, SQL compares numbers of 64 bits and decimals digit by digit."""
    if variable.kind not in _NUMBERS:
        return case
    from sqlglot import exp

    return case.transform(lambda node: exp.cast(node, "DOUBLE") if isinstance(node, exp.Column) else node)


def _tell_unseen(
    functions: Any,
    case: Any,
    bin_number: Any,
    missing: float | None,
    bins: AttributeBins,
    missing_text: Sequence[str],
    unseen: Unseen,
) -> Any:
    """The case, which gives `missing` for a category that is declared missing as well as for an unseen one; the number
    of the bin tells that there is one."""
    variable = bins.variable
    declared = list(variable.missing_values)
    if variable.kind == "text":
        declared = [*map(str, declared), *missing_text]
    value = functions.col(f"`{bins.attribute.replace('`', '``')}`")
    if unseen == "error":
        words = [f"column {bins.attribute!r}: ", " is not among the categories that the bins were made of"]
        message = functions.concat(functions.lit(words[0]), value.cast("string"), functions.lit(words[1]))
        is_unseen = value.isNotNull() & bin_number.isNull()
        case = functions.when(is_unseen, functions.raise_error(message)).otherwise(case)
    is_missing = value.isin([functions.lit(code) for code in declared])
    return functions.when(is_missing, functions.lit(None if missing is None else float(missing))).otherwise(case)

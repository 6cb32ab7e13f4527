"""Bins as SQL."""

from __future__ import annotations

import math
from collections.abc import Iterator

import numpy as np
import sqlglot.expressions as exp
from sqlglot import Dialect

from . import _values
from ._result import AttributeBins, BinningResult, Variable

# How a dialect tells a NaN, which would fall into the last bin where it is greater than all other numbers.
_WITH_FUNCTION = (
    *("athena", "bigquery", "clickhouse", "databricks", "duckdb"),
    *("dune", "presto", "spark", "spark2", "trino"),
)
_WITH_PREDICATE = ("oracle",)
_WITH_EQUAL_NAN = ("materialize", "postgres", "redshift", "risingwave", "snowflake")
"""They have no function for it, but there NaN equals itself."""
_WITH_UNCERTAIN_NAN = ("doris", "dremio", "drill", "druid", "hive", "starrocks")
"""They have no function in all versions. NaN equals itself or differs from itself, depending on the version."""
WITHOUT_NAN = (
    *("", "dax", "exasol", "fabric", "mysql", "prql", "singlestore"),
    *("solr", "sqlite", "tableau", "teradata", "tsql"),
)


def write(result: BinningResult, dialect: str, table: str | None, labels: bool) -> str:
    dialect = _name_of(Dialect.get_or_raise(dialect))
    binned = [found for found in result.bins if not found.status.is_error]
    columns = [exp.alias_(_case(found, dialect, labels), f"{found.attribute}_bin", quoted=True) for found in binned]
    if table is None:
        return ",\n".join(column.sql(dialect=dialect, pretty=True) for column in columns)
    return exp.select("*", *columns).from_(exp.to_table(table)).sql(dialect=dialect, pretty=True)


def _name_of(dialect: Dialect) -> str:
    names: Iterator[str] = (name for name, kind in Dialect.classes.items() if kind is type(dialect))
    return next(names)


def _case(found: AttributeBins, dialect: str, labels: bool) -> exp.Case:
    variable = found.variable
    column = exp.column(variable.name, quoted=True)
    case = exp.Case()
    for condition in _missing_conditions(variable, column, dialect):
        case = case.when(condition, exp.null())
    names: list[exp.Expression] = [
        exp.Literal.string(label) if labels else exp.Literal.number(i) for i, label in enumerate(found.labels)
    ]
    # A flag can be compared with a number only in some dialects; its numbers are the codes of its two values.
    categories = (0.0, 1.0) if variable.kind == "boolean" else variable.categories
    if categories is not None:
        codes = np.arange(len(categories), dtype=np.float64)
        for category, bin_number in zip(categories, found.bin_numbers(codes).tolist()):
            case = case.when(column.copy().eq(_literal(category, variable)), names[bin_number].copy())
        return case
    compare = exp.LTE if found.closed == "right" else exp.LT
    for cut, name in zip(found.borders.tolist(), names):
        if math.isinf(cut):
            # The negative one is a cut point with the right side closed, and the positive one with the left side.
            beyond = exp.LT if found.closed == "right" else exp.LTE
            case = case.when(beyond(this=column.copy(), expression=_literal(cut, variable)), name)
        else:
            case = case.when(compare(this=column.copy(), expression=_literal(cut, variable)), name)
    return case.else_(names[-1])


def _missing_conditions(variable: Variable, column: exp.Column, dialect: str) -> list[exp.Expression]:
    conditions: list[exp.Expression] = [column.copy().is_(exp.null())]
    if variable.kind == "float":
        conditions += _nan_conditions(column, dialect)
    infinities = [value for value in variable.missing_values if isinstance(value, float) and math.isinf(value)]
    values = [value for value in variable.missing_values if value not in infinities]
    if values:
        conditions.append(column.copy().isin(*[_literal(value, variable) for value in values]))
    for infinity in infinities:
        beyond = exp.GT if infinity > 0 else exp.LT
        conditions.append(beyond(this=column.copy(), expression=_literal(infinity, variable)))
    if variable.missing_interval is not None:
        conditions.append(_interval_condition(variable.missing_interval, variable, column))
    return conditions


def _interval_condition(interval: tuple[float, float], variable: Variable, column: exp.Column) -> exp.Expression:
    """An infinite end takes in the infinity, too."""
    left, right = interval
    if math.isinf(left) and math.isinf(right):
        return exp.true()
    if math.isinf(left):
        return exp.LTE(this=column.copy(), expression=_literal(right, variable))
    if math.isinf(right):
        return exp.GTE(this=column.copy(), expression=_literal(left, variable))
    return column.copy().between(_literal(left, variable), _literal(right, variable))


def _nan_conditions(column: exp.Column, dialect: str) -> list[exp.Expression]:
    equals_nan = column.copy().eq(exp.cast(exp.Literal.string("NaN"), exp.DataType.Type.DOUBLE))
    if dialect in _WITH_FUNCTION:
        return [exp.IsNan(this=column.copy())]
    if dialect in _WITH_PREDICATE:
        return [exp.Is(this=column.copy(), expression=exp.var("NAN"))]
    if dialect in _WITH_EQUAL_NAN:
        return [equals_nan]
    if dialect in _WITH_UNCERTAIN_NAN:
        return [column.copy().neq(column.copy()), equals_nan]
    return []


def _literal(value: float | str, variable: Variable) -> exp.Expression:
    """The value as the column has it. A number is written in as few digits as read back to the same double. Not every
    database has a literal for an infinity: it is the largest finite number, beyond which it lies for all of them."""
    if isinstance(value, str):
        return exp.Literal.string(value)
    if variable.kind == "boolean":
        return exp.Boolean(this=bool(value))
    if variable.kind == "date":
        return exp.cast(exp.Literal.string(variable.format(value)), exp.DataType.Type.DATE)
    if variable.kind == "timestamp":
        kind = exp.DataType.Type.TIMESTAMPTZ if variable.time_zone else exp.DataType.Type.TIMESTAMP
        return exp.cast(exp.Literal.string(variable.format(value)), kind)
    if math.isinf(value):
        value = math.copysign(_values.LARGEST, value)
    digits = repr(_values.plain(abs(value)))
    # A number with an exponent is a double in every dialect; one without may be an exact decimal, which is as good.
    number = exp.Literal.number(digits)
    return exp.Neg(this=number) if math.copysign(1.0, value) < 0 else number

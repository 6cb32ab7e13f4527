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
        if math.isinf(cut) and cut > 0:
            return case.else_(name)
        case = case.when(compare(this=column.copy(), expression=_literal(cut, variable)), name)
    return case.else_(names[-1])


def _missing_conditions(variable: Variable, column: exp.Column, dialect: str) -> list[exp.Expression]:
    conditions: list[exp.Expression] = [column.copy().is_(exp.null())]
    if variable.kind == "float":
        conditions += _nan_conditions(column, dialect)
    if variable.missing_values:
        conditions.append(column.copy().isin(*[_literal(value, variable) for value in variable.missing_values]))
    if variable.missing_interval is not None:
        left, right = variable.missing_interval
        conditions.append(column.copy().between(_literal(left, variable), _literal(right, variable)))
    return conditions


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
    """The value as the column has it. A number is written in as few digits as read back to the same double."""
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

"""The core's SQL in the dialects of databases."""

from __future__ import annotations

from typing import Any

from . import _core
from ._features import require

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


def write(core: _core.Bins, dialect: str, table: str | None, encode: str, cast: bool) -> str:
    if dialect in ("", "duckdb"):
        return core.to_sql(dialect == "duckdb", encode, cast, table or "")
    found = parse(core, dialect, encode, cast)
    if table is None:
        return ",\n".join(column.sql(dialect=dialect, pretty=True) for column in found) + "\n"
    sqlglot = require("sqlglot", "dialects of SQL", "sql")
    tree = sqlglot.select("*", *found).from_(sqlglot.exp.to_table(table))
    return str(tree.sql(dialect=dialect, pretty=True)) + "\n"


def parse(core: _core.Bins, dialect: str, encode: str, cast: bool = False) -> list[Any]:
    """The columns of bins as trees of sqlglot's, for a dialect."""
    sqlglot = require("sqlglot", "dialects of SQL", "sql")
    known = sqlglot.Dialect.get_or_raise(dialect)
    name = next(name for name, kind in sqlglot.Dialect.classes.items() if kind is type(known))
    tree = sqlglot.parse_one(core.to_sql(True, encode, cast, "rows"), read="duckdb")
    return [tell_nan(column, name) for column in tree.expressions[1:]]


def tell_nan(tree: Any, dialect: str) -> Any:
    """SQL with the dialect's own conditions for a NaN. Where it can't tell one, no value is a NaN."""
    from sqlglot import exp

    for node in list(tree.find_all(exp.IsNan)):
        condition = _nan_condition(node.this, dialect)
        if condition is not None:
            node.replace(condition)
        elif isinstance(node.parent, exp.Or):
            node.parent.replace(node.parent.this)  # "x IS NULL" is what stands before it
        else:
            node.replace(exp.false())
    return tree


def _nan_condition(column: Any, dialect: str) -> Any:
    from sqlglot import exp

    equals_nan = exp.EQ(this=column.copy(), expression=exp.cast(exp.Literal.string("NaN"), exp.DataType.Type.DOUBLE))
    if dialect in _WITH_FUNCTION:
        return exp.IsNan(this=column.copy())
    if dialect in _WITH_PREDICATE:
        return exp.Is(this=column.copy(), expression=exp.var("NAN"))
    if dialect in _WITH_EQUAL_NAN:
        return equals_nan
    if dialect in _WITH_UNCERTAIN_NAN:
        return exp.or_(exp.NEQ(this=column.copy(), expression=column.copy()), equals_nan, wrap=False)
    return None

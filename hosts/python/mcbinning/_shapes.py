"""The SQL of the queries that reduce a table, in DuckDB's words, of which every engine gets a translation.

The table itself is called `ROWS` in them. A number is written with an exponent, as a double: without one it would be a
decimal in some engines.
"""

from __future__ import annotations

from collections.abc import Sequence
from dataclasses import dataclass
from typing import Any

from ._types import Rounding

ROWS = "rows_"
LARGEST = 1.7976931348623157e308


def quote_name(name: str) -> str:
    return '"' + name.replace('"', '""') + '"'


def quote_text(text: str) -> str:
    return "'" + text.replace("'", "''") + "'"


def double(value: float) -> str:
    """The shortest literal of a double that reads back as this very number."""
    text = repr(float(value))
    return text if "e" in text else f"{text}e0"


def as_double(column: str) -> str:
    return f"CAST({quote_name(column)} AS DOUBLE)"


def is_declared_missing(value: str, values: Sequence[float], interval: tuple[float, float] | None) -> str:
    """Whether an expression, a double, is one of the numbers or in the interval, both ends included."""
    conditions = [f"{value} = {double(number)}" for number in values]
    if interval is not None:
        ends = [(">=", interval[0]), ("<=", interval[1])]
        finite = [f"{value} {sign} {double(end)}" for sign, end in ends if abs(end) <= LARGEST]
        conditions.append(f"({' AND '.join(finite) or 'TRUE'})")
    return f"({' OR '.join(conditions)})" if conditions else "FALSE"


def is_negative_zero(column: str) -> str:
    """Engines take both zeros for one key, and the library does not. The text is the one way to the sign that all
    engines have."""
    name = quote_name(column)
    return f"CASE WHEN {name} = 0 THEN CAST({name} AS VARCHAR) LIKE '-%' ELSE FALSE END"


@dataclass(frozen=True)
class Weights:
    """How the weight of a row is worked out before anything is summed."""

    column: str | None
    """None where each row weighs 1."""
    rounding: Rounding = "none"
    missing_values: Sequence[float] = ()
    missing_interval: tuple[float, float] | None = None
    is_scaled: bool = False
    """To sum to the number of rows that count."""
    scale: float = 1.0
    """By which they are, once it is known."""
    grid: tuple[float, float] | None = None
    """The step of the grid as the product of two powers of two; None where no weight has to move."""

    @property
    def is_present(self) -> str:
        """Whether a row has a weight."""
        if self.column is None:
            return "TRUE"
        missing = is_declared_missing(self.raw, self.missing_values, self.missing_interval)
        return f"{quote_name(self.column)} IS NOT NULL AND NOT {missing}"

    @property
    def raw(self) -> str:
        return "1e0" if self.column is None else as_double(self.column)

    @property
    def rounded(self) -> str:
        if self.rounding == "none":
            return self.raw
        down = self.raw if self.rounding == "truncate" else f"{self.raw} + {double(0.5)}"
        # From 2^52 on all doubles are whole, and some engines have the floor as a whole number of 64 bits.
        return f"CASE WHEN {self.raw} < {double(2.0**52)} THEN CAST(FLOOR({down}) AS DOUBLE) ELSE {self.raw} END"

    @property
    def scaled(self) -> str:
        return self.rounded if self.scale == 1.0 else f"({self.rounded}) * {double(self.scale)}"

    @property
    def on_grid(self) -> str:
        """As WeightGrid::Round() in C++ has it: the nearest multiple of the step, of two the even one, and never 0."""
        if self.grid is None:
            return self.scaled
        coarse, fine = self.grid
        whole_from = double(2.0**52)
        units = f"({self.scaled}) * {double(1.0 / coarse)} * {double(1.0 / fine)} + {whole_from} - {whole_from}"
        # The largest doubles lie nearest to 2^1024, which is none.
        most = 2.0**52 if 2.0**52 * coarse * fine <= LARGEST else 2.0**52 - 1.0
        return f"LEAST(GREATEST({units}, {double(1.0)}), {double(most)}) * {double(coarse)} * {double(fine)}"

    @property
    def counts(self) -> str:
        """Whether the library counts a row."""
        return "TRUE" if self.column is None else f"({self.is_present} AND {self.rounded} > {double(0.0)})"

    @property
    def sum(self) -> str:
        """Of a group, exact; 0 where no row counts."""
        if self.column is None:
            return "COUNT(*)"
        return f"SUM(CASE WHEN {self.counts} THEN {self.on_grid} ELSE {double(0.0)} END)"


def check_weights(weights: Weights) -> str:
    """A row with the numbers of rows: all, and those whose weight is missing or faulty or counts; and with the largest
    weight."""
    numbers = ["COUNT(*) AS records"]
    if weights.column is not None:
        is_nan = f"ISNAN({weights.raw})"
        conditions = {
            "without_weight": f"NOT ({weights.is_present})",
            "nan": f"{weights.is_present} AND {is_nan}",
            "negative": f"{weights.is_present} AND {weights.raw} < {double(0.0)} AND NOT {is_nan}",
            "infinite": f"{weights.is_present} AND {weights.raw} > {double(LARGEST)} AND NOT {is_nan}",
            "positive": weights.counts,
        }
        numbers += [f"SUM(CASE WHEN {test} THEN 1 ELSE 0 END) AS {name}" for name, test in conditions.items()]
        numbers.append(f"MAX(CASE WHEN {weights.counts} THEN {weights.rounded} END) AS largest")
    return f"SELECT {', '.join(numbers)} FROM {ROWS}"


def sum_weights(weights: Weights) -> str:
    """A row with the sum of all weights, and the number of those that the grid has moved."""
    moved = f"SUM(CASE WHEN {weights.on_grid} <> {weights.scaled} THEN 1 ELSE 0 END)"
    return f"SELECT SUM({weights.on_grid}) AS total, {moved} AS moved FROM {ROWS} WHERE {weights.counts}"


def list_values(column: str, limit: int) -> str:
    """All values of a column, whatever the weights of their rows, and the number of these."""
    name = quote_name(column)
    return f"SELECT {name} AS value_, COUNT(*) AS rows_ FROM {ROWS} GROUP BY {name} LIMIT {limit}"


def count_rows() -> str:
    return f"SELECT COUNT(*) AS records FROM {ROWS}"


def count_values_roughly(column: str) -> str:
    return f"SELECT APPROX_COUNT_DISTINCT({quote_name(column)}) AS n FROM {ROWS}"


def count_values_of_sample(columns: Sequence[str], percent: float) -> str:
    """For DuckDB alone, whose samples are of whole vectors, so that the other rows cost next to nothing."""
    counts = [f"APPROX_COUNT_DISTINCT({quote_name(column)}) AS n{i}" for i, column in enumerate(columns)]
    sample = f"(SELECT * FROM {ROWS} USING SAMPLE {percent:.6f}% (system)) AS sample_"
    return f"SELECT COUNT(*) AS records, {', '.join(counts)} FROM {sample}"


def group_pair(attribute: str, target: str | None, weights: Weights, has_zeros: bool, limit: int) -> str:
    """The weight of each value of a pair. The value is told as its column has it: the reader of columns alone makes
    numbers of all kinds of values. Rows that do not count keep their groups, as they tell of categories and extremes.
    """
    keys = [quote_name(attribute)]
    shown = [f"{keys[0]} AS value_"]
    if has_zeros:
        keys.append(is_negative_zero(attribute))
        shown.append(f"{keys[1]} AS zero_")
    if target is not None:
        keys.append(quote_name(target))
        shown.append(f"{keys[-1]} AS category_")
    columns = ", ".join([*shown, f"{weights.sum} AS weight_"])
    return f"SELECT {columns} FROM {ROWS} GROUP BY {', '.join(keys)} LIMIT {limit}"


def literal(value: Any) -> str:
    """A value of a column, as Python has it, in a condition."""
    if isinstance(value, bool):
        return "TRUE" if value else "FALSE"
    if isinstance(value, float):
        return double(value)
    if isinstance(value, str):
        return quote_text(value)
    return str(value) if isinstance(value, int) else f"CAST({quote_text(str(value))} AS {type_name(value)})"


def type_name(value: Any) -> str:
    return {"date": "DATE", "datetime": "TIMESTAMP"}.get(type(value).__name__, "DECIMAL(38, 18)")


def _compare(value: str, sign: str, border: float) -> str:
    """Not every engine has a literal for an infinity, but all have the numbers next to it."""
    if abs(border) <= LARGEST:
        return f"{value} {sign} {double(border)}"
    if sign == "<":
        return f"{value} <= {double(LARGEST)}" if border > 0 else "FALSE"
    if sign == ">":
        return "FALSE" if border > 0 else f"{value} >= {double(-LARGEST)}"
    return f"{value} > {double(LARGEST)}" if border > 0 else "TRUE"


@dataclass(frozen=True)
class Deal:
    """How the values of one attribute are dealt out into buckets. A bucket's number rises with the value, but for what
    an engine's logarithm may round, which whoever reads the buckets has to look for."""

    attribute: str
    number: str
    """The value as a double."""
    target: str | None
    weights: Weights
    missing_values: Sequence[float]
    missing_interval: tuple[float, float] | None
    invalid_categories: Sequence[Any]
    """What is declared missing of the target, as it stands in its column."""

    @property
    def is_valid(self) -> str:
        """Whether a row has a valid value of the attribute."""
        missing = is_declared_missing(self.number, self.missing_values, self.missing_interval)
        return f"{quote_name(self.attribute)} IS NOT NULL AND NOT ISNAN({self.number}) AND NOT {missing}"

    @property
    def is_counted(self) -> str:
        """Whether the library counts a row for this pair."""
        conditions = [self.is_valid, self.weights.counts]
        if self.target is not None:
            name = quote_name(self.target)
            conditions.append(f"{name} IS NOT NULL")
            for value in self.invalid_categories:
                is_nan = isinstance(value, float) and value != value
                conditions.append(f"NOT ISNAN({name})" if is_nan else f"{name} <> {literal(value)}")
        return " AND ".join(conditions)

    @property
    def category(self) -> str:
        return "0" if self.target is None else quote_name(self.target)

    def find_extremes(self) -> str:
        """A row with the least and the largest absolute value but 0 and infinity, and the lowest and highest finite
        value as they stand in the column."""
        is_finite = f"ABS({self.number}) <= {double(LARGEST)}"
        value = quote_name(self.attribute)
        columns = [
            f"MIN(CASE WHEN {is_finite} AND {self.number} <> 0 THEN ABS({self.number}) END) AS least_",
            f"MAX(CASE WHEN {is_finite} THEN ABS({self.number}) END) AS most_",
            f"MIN(CASE WHEN {is_finite} THEN {value} END) AS value_",
            f"MAX(CASE WHEN {is_finite} THEN {value} END) AS highest_",
        ]
        return f"SELECT {', '.join(columns)} FROM {ROWS} WHERE {self.is_valid}"

    def deal_by_logarithm(self, log_of_least: float, scale: float, most: int, has_zeros: bool) -> str:
        """The valid rows, each in a bucket from -most - 2 to most + 2: those of 0 and of the infinities are their own,
        and all others are alike in the share by which their values may differ."""
        v = self.number

        def piece(of: str) -> str:
            number = f"FLOOR((LN({of}) - {double(log_of_least)}) * {double(scale)})"
            return f"LEAST(GREATEST(CAST({number} AS DOUBLE), {double(0.0)}), {double(most)})"

        bucket = (
            f"CASE WHEN {v} > {double(LARGEST)} THEN {double(most + 2)} WHEN {v} < {double(-LARGEST)} "
            f"THEN {double(-most - 2)} WHEN {v} = 0 THEN {double(0.0)} "
            f"WHEN {v} > 0 THEN {double(1.0)} + {piece(v)} ELSE {double(-1.0)} - {piece('-' + v)} END"
        )
        weight = f"CASE WHEN {self.weights.counts} THEN {self.weights.on_grid} ELSE {double(0.0)} END"
        zero = is_negative_zero(self.attribute) if has_zeros else "FALSE"
        return (
            f"(SELECT {quote_name(self.attribute)} AS value_, {v} AS number_, {self.category} AS category_, "
            f"{zero} AS zero_, {weight} AS weight_, CAST({bucket} AS BIGINT) AS bucket_ "
            f"FROM {ROWS} WHERE {self.is_valid}) AS dealt_"
        )

    def sum_missing(self) -> str:
        """The weights of the rows without a valid value."""
        return (
            f"SELECT category_, SUM(weight_) AS weight_ FROM (SELECT {self.category} AS category_, "
            f"CASE WHEN {self.weights.counts} THEN {self.weights.on_grid} ELSE {double(0.0)} END AS weight_ "
            f"FROM {ROWS} WHERE NOT ({self.is_valid})) AS missing_ GROUP BY category_"
        )

    def count_bins(self, cut_points: Sequence[float], closed: str, extremes: tuple[float, float]) -> str:
        """The weights of the rows in bins, by category and by where the values lie to the extremes of the bins, each
        with its least and its largest value. The rows without a valid value are a bin, too."""
        v = self.number
        beyond = ">" if closed == "right" else ">="
        bins = " + ".join(f"CASE WHEN {_compare(v, beyond, cut)} THEN 1 ELSE 0 END" for cut in cut_points) or "0"
        low, high = extremes
        region = (
            f"CASE WHEN {_compare(v, '<', low)} THEN -1 WHEN {_compare(v, '>', high)} THEN 1 ELSE 0 END"
            if low <= high
            else "0"
        )
        return (
            "SELECT bin_, region_, category_, MIN(value_) AS low_, MAX(value_) AS high_, SUM(weight_) AS weight_ FROM ("
            f"SELECT CASE WHEN {self.is_valid} THEN {bins} ELSE -1 END AS bin_, "
            f"CASE WHEN {self.is_valid} THEN {region} ELSE 0 END AS region_, {self.category} AS category_, "
            f"{quote_name(self.attribute)} AS value_, {self.weights.on_grid} AS weight_ "
            f"FROM {ROWS} WHERE {self.weights.counts}) AS counted_ GROUP BY bin_, region_, category_"
        )

    def count_values(self, is_exact: bool) -> str:
        if not is_exact:
            return f"SELECT APPROX_COUNT_DISTINCT({self.number}) AS n FROM {ROWS} WHERE {self.is_counted}"
        return (
            f"SELECT COUNT(*) AS n FROM (SELECT {self.number} AS number_ FROM {ROWS} WHERE {self.is_counted} "
            f"GROUP BY {self.number}) AS values_"
        )


@dataclass(frozen=True)
class Piece:
    """A bucket of one deal, and how its values are dealt out in the next."""

    bucket: int
    first: int
    """The number of its first bucket there."""
    low: float
    high: float
    scale: float


def deal_again(dealt: str, pieces: Sequence[Piece]) -> str:
    """The rows of some buckets, in finer ones."""
    rows = ", ".join(
        f"({piece.bucket}, {piece.first}, {double(piece.low)}, {double(piece.high)}, {double(piece.scale)})"
        for piece in pieces
    )
    offset = "FLOOR((LEAST(GREATEST(number_, low_), high_) - low_) * scale_)"
    return (
        f"(SELECT value_, number_, category_, zero_, weight_, first_ + CAST({offset} AS BIGINT) AS bucket_ "
        f"FROM {dealt} JOIN (VALUES {rows}) AS pieces_(from_, first_, low_, high_, scale_) ON bucket_ = from_"
        ") AS dealt_"
    )


def sum_buckets(dealt: str) -> str:
    return (
        "SELECT bucket_, category_, MIN(number_) AS low_, MAX(number_) AS high_, MIN(value_) AS value_, "
        f"SUM(weight_) AS weight_, COUNT(*) AS rows_ FROM {dealt} GROUP BY bucket_, category_"
    )


def sum_values(dealt: str, buckets: Sequence[int], limit: int) -> str:
    """Each value in some buckets with its weight."""
    rows = ", ".join(f"({bucket})" for bucket in buckets)
    return (
        f"SELECT value_, zero_, category_, SUM(weight_) AS weight_ FROM {dealt} JOIN (VALUES {rows}) AS kept_(from_) "
        f"ON bucket_ = from_ GROUP BY value_, zero_, category_ LIMIT {limit}"
    )

"""Scorecards: points for each bin, out of a logistic regression over weights of evidence."""

from __future__ import annotations

import html
import json
import math
import os
from typing import TYPE_CHECKING, Any

import numpy as np
import pandas as pd
from sklearn.base import BaseEstimator, clone
from sklearn.linear_model import LogisticRegression
from sklearn.utils.validation import check_is_fitted

from ._estimators import SupervisedBinner
from ._json import read_text, write_text
from ._opening import is_table
from ._result import BinningResult
from ._shapes import double
from ._sql import tell_nan
from ._types import Favoured
from ._values import Floats

if TYPE_CHECKING:
    from ._bins import AttributeBins

_SCHEMA = "mcobnqrt-scorecard"
_VERSION = 1


class Scorecard(BaseEstimator):  # type: ignore[misc]
    """Points for each bin of each attribute, whose sum tells the odds of a record.

    A logistic regression over the weights of evidence of the bins gives the logarithm of the odds of the event, s = c +
    sum of b w. With factor = pdo / ln 2, a record has

        base_points + factor * (± s - ln(base_odds))

    points, where the sign is + if the event is favoured and - if the others are. So `base_points` stand for odds of
    `base_odds` to 1, and `pdo` more points for twice these odds. Each bin has ± factor * b * w of them, and the rest is
    the base of all records.

    Parameters
    ----------
    base_points : float, default=600
        The points of a record with the base odds.
    base_odds : float, default=50
        The odds of the favoured side to the other one that have the base points.
    pdo : float, default=20
        The points that double the odds.
    favoured : {"others", "event"}, default="others"
        What more points speak for. The event is the second class in ascending order, such as 1, "yes" or "default".
    rounded : bool, default=True
        Whether points are whole numbers, as people add them up. Otherwise they have all their digits.
    bins : BinningResult, default=None
        Bins that were made before, and perhaps changed. None: `binner` makes them.
    binner : SupervisedBinner, default=None
        What makes the bins. None: one with its own defaults.
    model : estimator, default=None
        A linear model with `coef_` and `intercept_` of the logarithm of the odds. None: scikit-learn's logistic
        regression without a penalty.

    Attributes
    ----------
    result_ : BinningResult
    model_ : estimator
    base_ : float
        The points that each record has.
    points_ : list of numpy.ndarray, by attribute
        By bin, and behind them for a missing value.
    coefficients_ : numpy.ndarray, by attribute
    intercept_ : float
    classes_ : list
        The others and the event.

    Raises
    ------
    ValueError, DataError
        There are not two classes, or a setting can't be used.

    Examples
    --------
    >>> import mcbinning as mb
    >>> import pandas as pd
    >>> ages = [21, 22, 23, 24, 25, 26, 41, 42, 43, 44, 45, 46]
    >>> late = [1, 1, 1, 1, 1, 0, 0, 0, 0, 0, 0, 1]
    >>> card = mb.Scorecard().fit(pd.DataFrame({"age": 4 * ages}), 4 * late)
    >>> card.to_pandas()[["interval", "points"]].values.tolist()
    [['base', 487.0], ['(-inf, 25]', -46.0], ['(25, +inf)', 52.0], ['missing', 0.0]]
    >>> card.score(pd.DataFrame({"age": [30, None]})).tolist()
    [539.0, 487.0]
    """

    result_: BinningResult
    model_: Any
    base_: float
    points_: list[Floats]
    coefficients_: Floats
    intercept_: float
    classes_: list[Any]

    def __init__(
        self,
        *,
        base_points: float = 600,
        base_odds: float = 50,
        pdo: float = 20,
        favoured: Favoured = "others",
        rounded: bool = True,
        bins: BinningResult | None = None,
        binner: SupervisedBinner | None = None,
        model: Any = None,
    ) -> None:
        self.base_points = base_points
        self.base_odds = base_odds
        self.pdo = pdo
        self.favoured = favoured
        self.rounded = rounded
        self.bins = bins
        self.binner = binner
        self.model = model

    def fit(self, X: Any, y: Any, sample_weight: Any = None) -> Scorecard:
        """Finds the points. `X` is a table with the attributes' columns, or an array; `y` has the two classes."""
        self._check()
        result = self.bins
        if result is None:
            binner = clone(self.binner) if self.binner is not None else SupervisedBinner()
            result = binner.fit(X, y, sample_weight).result_
        targets = {found.target.name: found.target for found in result.bins if found.target}
        if len(targets) != 1 or len(next(iter(targets.values())).category_names()) != 2:
            raise ValueError("a scorecard is of one target with two classes")
        self.classes_ = next(iter(targets.values())).category_names()
        self.result_ = result
        evidence = np.column_stack([found.codes("woe")[codes] for found, codes in zip(result.bins, self._find(X))])
        if not np.isfinite(evidence).all():
            raise ValueError("a weight of evidence is infinite; smoothing makes it finite")
        is_event = np.asarray(y, dtype=object) == self.classes_[1]
        if is_event.all() or not is_event.any():
            raise ValueError(f"y must have both classes, {self.classes_[0]!r} and {self.classes_[1]!r}")
        self.model_ = clone(self.model) if self.model is not None else LogisticRegression(C=np.inf, max_iter=1000)
        self.model_.fit(evidence, is_event, sample_weight=sample_weight)
        self._set_points(np.ravel(self.model_.coef_), float(np.ravel(self.model_.intercept_)[0]))
        return self

    def score(self, data: Any) -> Floats:
        """The points of each record; of a path or a stream in the order of its records."""
        check_is_fitted(self, "points_")
        codes = self._find(data)
        total = np.full(len(codes[0]), self.base_)
        for points, column in zip(self.points_, codes):
            total += points[column]
        return total

    def predict_proba(self, data: Any) -> Floats:
        """The probabilities of the others and the event, by the model, whose figures are not rounded."""
        check_is_fitted(self, "points_")
        codes = self._find(data)
        total = np.full(len(codes[0]), self.intercept_)
        for found, coefficient, column in zip(self.result_.bins, self.coefficients_, codes):
            total += coefficient * found.codes("woe")[column]
        event = 1.0 / (1.0 + np.exp(-total))
        return np.column_stack([1.0 - event, event])

    def to_pandas(self) -> pd.DataFrame:
        """A row for the base, and for each bin and the missing of each attribute."""
        check_is_fitted(self, "points_")
        rows = [{"attribute": None, "interval": "base", "points": self.base_}]
        for found, coefficient, points in zip(self.result_.bins, self.coefficients_, self.points_):
            evidence = found.codes("woe")
            weights = [*found.weights, found.missing.weight if found.missing else 0.0]
            for code, label in enumerate([*found.labels, "missing"]):
                rows.append(
                    {
                        "attribute": found.attribute,
                        "interval": label,
                        "weight": weights[code],
                        "woe": evidence[code],
                        "coefficient": coefficient,
                        "points": points[code],
                    }
                )
        return pd.DataFrame(rows, columns=["attribute", "interval", "weight", "woe", "coefficient", "points"])

    def to_html(self, path: str | os.PathLike[str] | None = None) -> str:
        """The table as a page, which is one file without script.

        Parameters
        ----------
        path : path, default=None
            The file that the page goes into as well. None: into none.

        Returns
        -------
        str
            The page.
        """
        favoured = self.classes_[0 if self.favoured == "others" else 1]
        table = self.to_pandas()
        parts = [
            "<!DOCTYPE html>\n<html lang='en'>\n<head>\n<meta charset='utf-8'>\n<title>Scorecard</title>\n"
            f"<style>{_STYLE}</style>\n</head>\n<body>\n<h1>Scorecard</h1>\n<p>More points speak for "
            f"{html.escape(repr(favoured))}: {self.base_points:g} points are odds of {self.base_odds:g} to 1, and "
            f"{self.pdo:g} more double them.</p>\n"
            f"<p>Each record has {self.base_:g} points, and those of its bins.</p>\n"
        ]
        for attribute, rows in table.iloc[1:].groupby("attribute", sort=False):
            body = rows.drop(columns="attribute").to_html(index=False, border=0, float_format="{:.4g}".format)
            parts.append(f"<h2>{html.escape(str(attribute))}</h2>\n{body}\n")
        return write_text("".join(parts) + "</body>\n</html>\n", path)

    def to_json(self, path: str | os.PathLike[str] | None = None) -> str:
        """Writes the scorecard with its bins.

        Parameters
        ----------
        path : path, default=None
            The file that the text goes into as well. None: into none.

        Returns
        -------
        str
            The text, from which `from_json` makes a scorecard with the same points, to the last bit.
        """
        check_is_fitted(self, "points_")
        document = {
            "schema": _SCHEMA,
            "schema_version": _VERSION,
            "settings": {name: getattr(self, name) for name in _SETTINGS},
            "base": self.base_,
            "intercept": self.intercept_,
            "attributes": [
                {"attribute": found.attribute, "coefficient": coefficient, "points": points.tolist()}
                for found, coefficient, points in zip(self.result_.bins, self.coefficients_.tolist(), self.points_)
            ],
            "bins": json.loads(self.result_.to_json()),
        }
        return write_text(json.dumps(document, indent=2, ensure_ascii=False) + "\n", path)

    @classmethod
    def from_json(cls, source: str | os.PathLike[str]) -> Scorecard:
        """Reads what `to_json` wrote.

        Parameters
        ----------
        source : str or path
            The text itself, or the path of a file.

        Returns
        -------
        Scorecard
            With the points as they were written, and without `model_`.

        Raises
        ------
        ValueError
            The text is no scorecard, or of a newer version.
        """
        document = json.loads(read_text(source))
        if not isinstance(document, dict) or document.get("schema") != _SCHEMA:
            raise ValueError("this is not a scorecard")
        if document.get("schema_version") != _VERSION:
            raise ValueError(f"version {document.get('schema_version')} is not known here, but {_VERSION} is")
        try:
            card = cls(**{name: document["settings"][name] for name in _SETTINGS})
            card.result_ = BinningResult.from_json(json.dumps(document["bins"]))
            card.classes_ = card.result_.bins[0].target.category_names()  # type: ignore[union-attr]
            card.base_ = float(document["base"])
            card.intercept_ = float(document["intercept"])
            card.coefficients_ = np.array([float(one["coefficient"]) for one in document["attributes"]])
            card.points_ = [np.array(one["points"], dtype=float) for one in document["attributes"]]
        except (KeyError, TypeError, AttributeError, IndexError) as error:
            raise ValueError(f"the scorecard is damaged: {error!r}") from error
        if [len(points) for points in card.points_] != [found.n_bins + 1 for found in card.result_.bins]:
            raise ValueError("the scorecard is damaged: there must be points for each bin and a missing value")
        return card

    def to_sql(self, dialect: str = "", table: str | None = None, *, cast: bool = False) -> str:
        """Writes SQL that gives each row its points, by additions in the order of `score`.

        Parameters
        ----------
        dialect : str, default=""
            As of `BinningResult.to_sql`.
        table : str, default=None
            The table of the SELECT around the expression, as it stands in SQL. None: the expression alone.
        cast : bool, default=False
            Whether the columns of numbers hold texts, and are cast.

        Returns
        -------
        str
            The SQL, whose column is "score". A category that the bins were made without has the points of a missing
            value.
        """
        check_is_fitted(self, "points_")
        core = self.result_._core
        points = [by_bin.tolist() for by_bin in self.points_]
        cases = [f"({core.to_case(index, by_bin, dialect != '', cast)})" for index, by_bin in enumerate(points)]
        expression = "\n+ ".join([double(self.base_), *cases])
        if dialect in ("", "duckdb"):
            column = f'{expression} AS "score"'
            return f"{column}\n" if table is None else f"SELECT *,\n{column}\nFROM {table}\n"
        import sqlglot

        known = sqlglot.Dialect.get_or_raise(dialect)
        name = next(name for name, kind in sqlglot.Dialect.classes.items() if kind is type(known))
        tree = tell_nan(sqlglot.parse_one(f'SELECT *, {expression} AS "score"', read="duckdb"), name)
        if table is None:
            return str(tree.expressions[1].sql(dialect=dialect, pretty=True)) + "\n"
        return str(tree.from_(sqlglot.exp.to_table(table)).sql(dialect=dialect, pretty=True)) + "\n"

    def _check(self) -> None:
        for name in ("base_points", "base_odds", "pdo"):
            if not math.isfinite(getattr(self, name)):
                raise ValueError(f"{name} must be finite, not {getattr(self, name)}")
        if self.base_odds <= 0 or self.pdo <= 0:
            raise ValueError("base_odds and pdo must be above 0")
        if self.favoured not in ("others", "event"):
            raise ValueError(f"favoured must be 'others' or 'event', not {self.favoured!r}")
        if self.bins is not None and self.binner is not None:
            raise ValueError("bins are there already, so binner can't be given, too")

    def _set_points(self, coefficients: Floats, intercept: float) -> None:
        factor = self.pdo / math.log(2.0) * (1.0 if self.favoured == "event" else -1.0)
        base = self.base_points - self.pdo / math.log(2.0) * math.log(self.base_odds) + factor * intercept
        points = [factor * b * found.codes("woe") for b, found in zip(coefficients, self.result_.bins)]
        self.coefficients_ = coefficients
        self.intercept_ = intercept
        self.base_ = float(round(base)) if self.rounded else base
        # Without a minus in front of what is nothing.
        self.points_ = [np.round(by_bin) + 0.0 if self.rounded else by_bin + 0.0 for by_bin in points]

    def _find(self, data: Any) -> list[Any]:
        """The code of each record in each attribute; that of a missing value is one past the last bin."""
        if not is_table(data) and not isinstance(data, (str, os.PathLike)):
            array = np.asarray(data)
            names = [found.attribute for found in self.result_.bins]
            if array.ndim != 2 or array.shape[1] != len(names):
                raise ValueError(f"data must have a column for each of {len(names)} attributes, not {array.shape}")
            data = pd.DataFrame(array, columns=names)
        found = self.result_.transform(data, unseen="missing")
        columns = found.read_all() if hasattr(found, "read_all") else found
        return [_as_codes(columns[name], bins) for name, bins in zip(_names(columns), self.result_.bins)]


def _names(columns: Any) -> list[str]:
    return list(getattr(columns, "column_names", None) or columns.columns)


def _as_codes(column: Any, bins: AttributeBins) -> Any:
    numbers = column.to_pandas() if hasattr(column, "to_pandas") else column
    return np.asarray(numbers.astype("Float64").fillna(float(bins.n_bins)), dtype=np.intp)


_SETTINGS = ("base_points", "base_odds", "pdo", "favoured", "rounded")

_STYLE = """
body { margin: 0 auto; padding: 1rem; max-width: 50rem; font: 16px/1.5 system-ui, sans-serif; color: #1b1f24; }
table { border-collapse: collapse; font-variant-numeric: tabular-nums; }
th, td { padding: .25rem .7rem; text-align: right; border-bottom: 1px solid #d8dde4; }
th:first-child, td:first-child { text-align: left; padding-left: 0; }
th { color: #667080; }
"""

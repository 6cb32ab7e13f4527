"""Supervised and equal-frequency binning of continuous variables, for notebooks and pipelines.

The estimators work in scikit-learn, on data in memory. The functions work on streams and files of any size.
"""

from __future__ import annotations

from importlib import import_module as _import_module
from typing import TYPE_CHECKING as _TYPE_CHECKING
from typing import Any as _Any

from ._bins import AttributeBins
from ._core import __version__
from ._engines import query_source
from ._errors import (
    BadBinTableWarning,
    BinningError,
    BinningWarning,
    DataError,
    NoCutPointsWarning,
    NotBinnedWarning,
    NoValidValuesWarning,
    SingleCategoryWarning,
    SingleValueWarning,
    StreamError,
)
from ._evaluation import AttributeEvaluation, Evaluation
from ._features import require as _require
from ._functions import equal_frequency_bins, supervised_bins
from ._result import BinningResult
from ._status import Status

if _TYPE_CHECKING:
    from ._estimators import EqualFrequencyBinner, SupervisedBinner
    from ._scorecard import Scorecard
    from ._scores import information_gain, information_value

__all__ = [
    "AttributeBins",
    "AttributeEvaluation",
    "BadBinTableWarning",
    "BinningError",
    "BinningResult",
    "BinningWarning",
    "DataError",
    "EqualFrequencyBinner",
    "Evaluation",
    "NoCutPointsWarning",
    "NoValidValuesWarning",
    "NotBinnedWarning",
    "Scorecard",
    "SingleCategoryWarning",
    "SingleValueWarning",
    "Status",
    "StreamError",
    "SupervisedBinner",
    "__version__",
    "equal_frequency_bins",
    "information_gain",
    "information_value",
    "query_source",
    "supervised_bins",
]


_OF_SKLEARN = {
    "EqualFrequencyBinner": "_estimators",
    "Scorecard": "_scorecard",
    "SupervisedBinner": "_estimators",
    "information_gain": "_scores",
    "information_value": "_scores",
}


def __getattr__(name: str) -> _Any:
    """The estimators and the scores, with which scikit-learn is loaded."""
    if name not in _OF_SKLEARN:
        raise AttributeError(f"module {__name__!r} has no attribute {name!r}")
    for package in ("sklearn", "pandas"):
        _require(package, "the estimators", "sklearn")
    return getattr(_import_module(f".{_OF_SKLEARN[name]}", __name__), name)


def __dir__() -> list[str]:
    return list(__all__)

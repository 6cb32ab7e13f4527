"""Supervised and equal-frequency binning of continuous variables, for notebooks and pipelines.

The estimators work in scikit-learn, on data in memory. The functions work on streams and files of any size.
"""

from __future__ import annotations

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
from ._features import require as _require
from ._functions import equal_frequency_bins, supervised_bins
from ._result import BinningResult
from ._status import Status

if _TYPE_CHECKING:
    from ._estimators import EqualFrequencyBinner, SupervisedBinner

__all__ = [
    "AttributeBins",
    "BadBinTableWarning",
    "BinningError",
    "BinningResult",
    "BinningWarning",
    "DataError",
    "EqualFrequencyBinner",
    "NoCutPointsWarning",
    "NoValidValuesWarning",
    "NotBinnedWarning",
    "SingleCategoryWarning",
    "SingleValueWarning",
    "Status",
    "StreamError",
    "SupervisedBinner",
    "__version__",
    "equal_frequency_bins",
    "query_source",
    "supervised_bins",
]


def __getattr__(name: str) -> _Any:
    """The estimators, with which scikit-learn is loaded."""
    if name not in ("EqualFrequencyBinner", "SupervisedBinner"):
        raise AttributeError(f"module {__name__!r} has no attribute {name!r}")
    for package in ("sklearn", "pandas"):
        _require(package, "the estimators", "sklearn")
    from . import _estimators

    return getattr(_estimators, name)


def __dir__() -> list[str]:
    return list(__all__)

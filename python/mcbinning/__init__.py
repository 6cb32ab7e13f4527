"""Supervised and equal-frequency binning of continuous variables, for notebooks and pipelines.

The estimators work in scikit-learn, on data in memory. The functions work on streams and files of any size.
"""

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
from ._estimators import EqualFrequencyBinner, SupervisedBinner
from ._functions import equal_frequency_bins, supervised_bins
from ._result import AttributeBins, BinningResult
from ._status import Status

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
    "equal_frequency_bins",
    "supervised_bins",
]

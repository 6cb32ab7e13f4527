"""Supervised and equal-frequency binning of continuous variables, for notebooks and pipelines.

The estimators work in scikit-learn, on data in memory. The functions work on streams and files of any size.
"""

from importlib.metadata import version as _version

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

__version__ = _version("mcbinning")

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
    "supervised_bins",
]

"""Scores of features, for scikit-learn's selection of features."""

from __future__ import annotations

import warnings
from typing import Any

import numpy as np

from ._errors import BinningWarning
from ._estimators import SupervisedBinner
from ._result import BinningResult
from ._values import Floats


def information_gain(X: Any, y: Any) -> Floats:
    """Scores features by how much their bins tell about the classes.

    Parameters
    ----------
    X : array-like or frame
        The features, as `SupervisedBinner` takes them.
    y : array-like
        The classes.

    Returns
    -------
    numpy.ndarray
        By feature: by how many bits its bins lower the entropy of the classes; 0 where nothing is cut.

    Examples
    --------
    >>> import mcbinning as mb
    >>> from sklearn.datasets import load_iris
    >>> from sklearn.feature_selection import SelectKBest
    >>> X, y = load_iris(return_X_y=True)
    >>> SelectKBest(mb.information_gain, k=2).fit(X, y).get_support().tolist()
    [False, False, True, True]
    """
    return _of_features(X, y, "gain")


def information_value(X: Any, y: Any) -> Floats:
    """Scores features by the information value of their bins, and of the missing.

    Parameters
    ----------
    X : array-like or frame
        The features, as `SupervisedBinner` takes them.
    y : array-like
        Two classes; the second of them in ascending order is the event.

    Returns
    -------
    numpy.ndarray
        By feature: the information value, with 0.5 added where a bin lacks a class; 0 where it has none.

    Raises
    ------
    ValueError
        There are not two classes.

    Examples
    --------
    >>> import mcbinning as mb
    >>> from sklearn.datasets import load_breast_cancer
    >>> from sklearn.feature_selection import SelectKBest
    >>> X, y = load_breast_cancer(return_X_y=True)
    >>> SelectKBest(mb.information_value, k=5).fit_transform(X, y).shape
    (569, 5)
    """
    if len(np.unique(np.asarray(y))) != 2:
        raise ValueError("an information value is one of two classes")
    return _of_features(X, y, "information_value")


def _of_features(X: Any, y: Any, figure: str) -> Floats:
    with warnings.catch_warnings():
        warnings.simplefilter("ignore", BinningWarning)  # a feature without cut points has a low score, which says it
        result: BinningResult = SupervisedBinner().fit(X, y).result_
    scores: Floats = np.nan_to_num(np.array([getattr(found, figure) for found in result.bins]), nan=0.0)
    return scores

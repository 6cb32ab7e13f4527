"""The forms that a transformer gives bins in, and the way back."""

from __future__ import annotations

from collections.abc import Sequence
from dataclasses import dataclass
from typing import Any

import numpy as np
import numpy.typing as npt

from ._bins import AttributeBins
from ._features import require
from ._types import Drop, Encode, MissingOutput
from ._values import Codes, Floats

_WITHOUT_A_WAY_BACK = ("woe", "rate")


@dataclass(frozen=True)
class Form:
    """What a user wants in the place of each bin. A bin's code is its number from 0, and that of a missing value is one
    past the last bin."""

    encode: Encode
    missing: MissingOutput
    dtype: Any
    sparse: bool
    drop: Drop | None

    def check(self) -> None:
        if self.encode not in ("ordinal", "onehot", "interval", "woe", "rate"):
            raise ValueError(f"encode must be 'ordinal', 'onehot', 'interval', 'woe' or 'rate', not {self.encode!r}")
        if self.missing not in ("code", "keep"):
            raise ValueError(f"missing must be 'code' or 'keep', not {self.missing!r}")
        if self.drop not in (None, "first"):
            raise ValueError(f"drop must be 'first' or None, not {self.drop!r}")
        if self.encode != "onehot" and (self.sparse or self.drop is not None):
            raise ValueError("sparse_output and drop are for encode='onehot'")
        kind = np.dtype(self.dtype).kind
        if kind not in "biuf":
            raise ValueError(f"dtype must be one of numbers, not {self.dtype!r}")
        if kind != "f" and (self.missing == "keep" or self.encode in ("woe", "rate")):
            raise ValueError(f"{np.dtype(self.dtype)} has no missing values and no fractions; dtype must be of floats")

    def write(self, codes: Sequence[Codes], bins: Sequence[AttributeBins]) -> Any:
        """The codes, feature by feature, in this form."""
        if self.encode == "onehot":
            return self._write_indicators(codes, bins)
        if self.encode == "interval":
            return self._write_intervals(codes, bins)
        out = np.empty((len(codes[0]), len(bins)), dtype=self.dtype)
        for i, (column, found) in enumerate(zip(codes, bins)):
            out[:, i] = column if self.encode == "ordinal" else found.codes(self.encode)[column]
            if self.missing == "keep":
                out[column == found.n_bins, i] = np.nan
        return out

    def names(self, names: Sequence[str], bins: Sequence[AttributeBins]) -> npt.NDArray[np.object_]:
        """Of the columns of what `write` gives."""
        if self.encode != "onehot":
            return np.asarray(names, dtype=object)
        pairs = [(name, label) for name, found in zip(names, bins) for label in self._labels(found)[self._first :]]
        return np.array([f"{name}_{label}" for name, label in pairs], dtype=object)

    def read(self, X: Any, bins: Sequence[AttributeBins]) -> list[Codes]:
        """The codes again."""
        if self.encode in _WITHOUT_A_WAY_BACK:
            raise ValueError(f"two bins may have one {self.encode}, so there is no way back from it")
        if self.encode == "onehot":
            return self._read_indicators(X, bins)
        X = np.asarray(X)
        if X.ndim != 2 or X.shape[1] != len(bins):
            raise ValueError(f"X must have a column for each of {len(bins)} features, not the shape {X.shape}")
        if self.encode == "interval":
            return [self._read_intervals(X[:, i], found) for i, found in enumerate(bins)]
        return [_as_codes(X[:, i].astype(float), found) for i, found in enumerate(bins)]

    @property
    def _first(self) -> int:
        return 0 if self.drop is None else 1

    def _labels(self, found: AttributeBins) -> list[str]:
        return [*found.labels, "missing"] if self.missing == "code" else found.labels

    def _write_indicators(self, codes: Sequence[Codes], bins: Sequence[AttributeBins]) -> Any:
        rows, columns, begin = [], [], 0
        kept: list[tuple[npt.NDArray[np.bool_], int, int]] = []
        for column, found in zip(codes, bins):
            width = len(self._labels(found)) - self._first
            shown = column - self._first
            is_shown = (shown >= 0) & (shown < width)
            rows.append(np.flatnonzero(is_shown))
            columns.append(begin + shown[is_shown])
            if self.missing == "keep":
                kept.append((column == found.n_bins, begin, width))
            begin += width
        shape = (len(codes[0]), begin)
        where = np.concatenate(rows), np.concatenate(columns)
        if self.sparse:
            if any(is_missing.any() for is_missing, _, _ in kept):
                raise ValueError("missing='keep' fills whole rows, so sparse_output needs missing='code'")
            scipy = require("scipy.sparse", "sparse output", "sklearn")
            return scipy.csr_matrix((np.ones(len(where[0]), dtype=self.dtype), where), shape=shape)
        out = np.zeros(shape, dtype=self.dtype)
        out[where] = 1
        for is_missing, first, width in kept:
            out[is_missing, first : first + width] = np.nan
        return out

    def _read_indicators(self, X: Any, bins: Sequence[AttributeBins]) -> list[Codes]:
        X = np.asarray(X.todense() if hasattr(X, "todense") else X, dtype=float)
        widths = [len(self._labels(found)) - self._first for found in bins]
        if X.ndim != 2 or X.shape[1] != sum(widths):
            raise ValueError(f"X must have {sum(widths)} columns, not the shape {X.shape}")
        codes = []
        for found, block in zip(bins, np.split(X, np.cumsum(widths)[:-1], axis=1)):
            is_missing = np.isnan(block).any(axis=1)
            has_one = (block == 1.0).any(axis=1)
            if not self._first and not (has_one | is_missing).all():
                raise ValueError(f"a row of {found.attribute!r} has no 1")
            column = np.zeros(len(block), dtype=np.intp)
            if has_one.any():  # a feature with one bin may have no column
                column[has_one] = block[has_one].argmax(axis=1) + self._first
            codes.append(np.where(is_missing, found.n_bins, column))
        return codes

    def _write_intervals(self, codes: Sequence[Codes], bins: Sequence[AttributeBins]) -> npt.NDArray[np.object_]:
        out = np.empty((len(codes[0]), len(bins)), dtype=object)
        for i, (column, found) in enumerate(zip(codes, bins)):
            names = [*found.labels, "missing" if self.missing == "code" else None]
            out[:, i] = np.array(names, dtype=object)[column]
        return out

    def _read_intervals(self, column: npt.NDArray[Any], found: AttributeBins) -> Codes:
        known: dict[Any, int] = {label: number for number, label in enumerate(found.labels)}
        known |= {None: found.n_bins, "missing": found.n_bins}
        try:
            return np.array([known[label if isinstance(label, str) else None] for label in column], dtype=np.intp)
        except KeyError as error:
            raise ValueError(f"{found.attribute!r} has no bin {error}") from None


def _as_codes(column: Floats, found: AttributeBins) -> Codes:
    codes = np.where(np.isnan(column), found.n_bins, column)
    if not ((codes >= 0) & (codes <= found.n_bins) & (codes == np.floor(codes))).all():
        raise ValueError(f"the bins of {found.attribute!r} have numbers from 0 to {found.n_bins - 1}")
    return codes.astype(np.intp)


def centres(found: AttributeBins) -> Floats:
    """A value for each bin: the middle of its ends, of which the outer ones are the least and the largest value seen;
    and NaN for a missing value."""
    if found.variable.is_categorical:
        raise ValueError(f"the bins of {found.attribute!r} are sets of categories, for which no value stands")
    borders = np.concatenate([[found.minimum], found.cut_points, [found.maximum]])
    return np.append((borders[:-1] + borders[1:]) / 2, np.nan)

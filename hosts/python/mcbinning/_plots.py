"""Bins as pictures."""

from __future__ import annotations

from typing import TYPE_CHECKING

import numpy as np

from ._features import require
from ._values import Floats

if TYPE_CHECKING:
    import matplotlib.axes
    import matplotlib.figure

    from ._bins import AttributeBins
    from ._evaluation import AttributeEvaluation
    from ._result import BinningResult


_GAP = 0.03
"""In front of the missing, as a share of the width of all."""


def plot_bins(found: AttributeBins, ax: matplotlib.axes.Axes | None = None) -> matplotlib.axes.Axes:
    plt = require("matplotlib.pyplot", "plots", "plot")

    if ax is None:
        ax = plt.subplots(layout="constrained")[1]
    ax.set_title(_title(found), fontsize="medium")
    ax.set_xlabel("share of the weight")
    if found.n_bins == 0:
        ax.text(0.5, 0.5, found.status.words, ha="center", wrap=True, transform=ax.transAxes)
        return ax
    weights, target_weights = found.weights, found.target_weights
    if found.missing is not None:
        weights = np.append(weights, found.missing.weight)
    widths = weights / weights.sum()
    lefts = np.cumsum(widths) - widths
    if found.missing is not None:
        lefts[-1] += _GAP
    if found.target is None or target_weights is None:
        ax.bar(lefts, weights, widths, align="edge", edgecolor="white", color="C0")
        ax.set_ylabel("weight")
    else:
        if found.missing is not None:
            target_weights = np.vstack([target_weights, found.missing.target_weights])
        with np.errstate(invalid="ignore", divide="ignore"):
            shares = np.nan_to_num(target_weights / weights[:, np.newaxis])
        bottoms = np.zeros(len(widths))
        for code, name in enumerate(found.target.category_names()):
            ax.bar(
                lefts, shares[:, code], widths, bottoms, align="edge", edgecolor="white", linewidth=0.5, label=str(name)
            )
            bottoms += shares[:, code]
        ax.set_ylim(0.0, 1.0)
        ax.set_ylabel(f"share of {found.target.name}")
        ax.legend(title=found.target.name, fontsize="small")
        _add_evidence(ax, found, lefts + widths / 2)
    ticks, texts = list(lefts[1 : found.n_bins]), list(found.border_texts)
    if found.missing is not None:
        ticks.append(lefts[-1] + widths[-1] / 2)
        texts.append("missing")
    ax.set_xlim(0.0, lefts[-1] + widths[-1])
    ax.set_xticks(ticks, texts, rotation=45, ha="right")
    ax.set_xlabel(f"{found.attribute}: cut points, over the share of the weight")
    return ax


def _add_evidence(ax: matplotlib.axes.Axes, found: AttributeBins, middles: Floats) -> None:
    """The weights of evidence as a line with an axis of its own, and that of the missing as a point beside it."""
    if found.woe is None or not np.isfinite(found.woe).all():
        return
    line = ax.twinx()
    line.plot(middles[: found.n_bins], found.woe, "o-", color="black", markersize=4, linewidth=1)
    if found.missing is not None and found.missing.woe is not None:
        line.plot(middles[-1:], [found.missing.woe], "o", color="black", markersize=4)
    line.axhline(0.0, color="black", linewidth=0.5, linestyle=":")
    line.set_ylabel("weight of evidence")


def plot_all(result: BinningResult, columns: int) -> matplotlib.figure.Figure:
    plt = require("matplotlib.pyplot", "plots", "plot")

    ordered = result.by_gain()
    columns = max(1, min(columns, len(ordered)))
    rows = max(1, -(-len(ordered) // columns))
    figure: matplotlib.figure.Figure
    figure, axes = plt.subplots(rows, columns, figsize=(4.5 * columns, 3.5 * rows), squeeze=False, layout="constrained")
    for ax, found in zip(axes.flat, ordered):
        plot_bins(found, ax)
    for ax in axes.flat[len(ordered) :]:
        ax.set_axis_off()
    return figure


def _title(found: AttributeBins) -> str:
    if found.target is None or np.isnan(found.gain):
        return found.attribute
    gain = round(found.gain, 4) + 0.0  # without a minus in front of what is nothing
    return f"{found.attribute}: gain {gain:.4f} bits"


def plot_evaluation(evaluation: AttributeEvaluation, ax: matplotlib.axes.Axes | None = None) -> matplotlib.axes.Axes:
    plt = require("matplotlib.pyplot", "plots", "plot")

    if ax is None:
        ax = plt.subplots(layout="constrained")[1]
    frame = evaluation.to_pandas().iloc[:-1]
    positions = np.arange(len(frame))
    rates = [name for name in ("first_rate", "second_rate") if name in frame]
    lines = ax.twinx() if rates else None
    for offset, colour, name, label in ((-0.2, "0.6", "first", "then"), (0.2, "C0", "second", "now")):
        ax.bar(positions + offset, frame[f"{name}_share"], 0.4, color=colour, label=label)
        if lines is not None and f"{name}_rate" in rates:
            figures, is_bin = frame[f"{name}_rate"].astype(float), frame["bin"].notna()
            for shown, style in ((is_bin, "o-"), (~is_bin, "o")):  # no line leads to the missing
                lines.plot(positions[shown], figures[shown], style, color=colour, markeredgecolor="white")
    if lines is not None:
        lines.set_ylim(bottom=0.0)
        lines.set_ylabel("rate")
    ax.set_xticks(positions, frame["interval"], rotation=45, ha="right")
    ax.set_ylabel("share of the weight")
    ax.set_title(f"{evaluation.attribute}: stability index {evaluation.stability:.4f}", fontsize="medium")
    ax.legend(fontsize="small")
    return ax

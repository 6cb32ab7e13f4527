#!/usr/bin/env python3
"""Draws the table that `growth` prints: the time of an attribute by the number of records.

    build/release/bench/growth | bench/growth_plot.py docs/images/growth.svg

The lines behind the points are n log n, through the point for a million records. Needs matplotlib.
"""

import math
import sys

import matplotlib

matplotlib.use("svg")
matplotlib.rcParams["svg.hashsalt"] = "growth"  # the same picture from the same table

import matplotlib.pyplot as plt


def read_table(lines):
    """The rows of numbers of a Markdown table."""
    rows = [[cell.strip() for cell in line.split("|")[1:-1]] for line in lines if line.startswith("|")]
    return [[float(cell) for cell in row] for row in rows if row[0].isdigit()]


def draw(axes, sizes, milliseconds, label):
    (points,) = axes.plot(sizes, milliseconds, "o", label=label)
    at_a_million = milliseconds[sizes.index(1e6)]
    n_log_n = [at_a_million * n * math.log(n) / (1e6 * math.log(1e6)) for n in sizes]
    axes.plot(sizes, n_log_n, "-", color=points.get_color(), linewidth=0.8)


def main():
    sizes, informative, _, _, noise, _, _ = (list(column) for column in zip(*read_table(sys.stdin)))
    figure, axes = plt.subplots(figsize=(6.4, 4.0), layout="constrained")
    draw(axes, sizes, informative, "informative")
    draw(axes, sizes, noise, "noise")
    axes.set(xscale="log", yscale="log", xlabel="records", ylabel="ms for one attribute")
    axes.legend()
    axes.grid(alpha=0.3)
    figure.savefig(sys.argv[1], metadata={"Date": None})


main()

"""Weights of evidence and information values as others have printed them for public data, to their last digit.

The figures of the German credit data are those that the README of the R package PDtoolkit prints for `bivariate`, and
those of the breast cancer data the README of the Python package OptBinning prints for `binning_table.build()`. The
first takes ln(share of good / share of bad), as here with "good" for the event; the second ln(share of non-events /
share of events), so that its signs are the other way round.
"""

from __future__ import annotations

import mcbinning as mb
import numpy as np
import pandas as pd
import pytest
from sklearn.datasets import load_breast_cancer

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")

# By category: good, bad, weight of evidence, information value; and the information value of the attribute.
NOMINAL = {
    "Account Balance": (
        {
            "1": (139, 135, "-0.8180987057", "0.2056933888604"),
            "2": (164, 105, "-0.4013917827", "0.0464467634291"),
            "3": (49, 14, "0.4054651081", "0.0094608525225"),
            "4": (348, 46, "1.1762632229", "0.4044104985393"),
        },
        "0.66601150335",
    ),
    "Payment Status of Previous Credit": (
        {
            "0": (15, 25, "-1.3581234842", "0.0840743109238"),
            "1": (21, 28, "-1.1349799328", "0.0718820624131"),
            "2": (361, 169, "-0.0883186170", "0.0042056484275"),
            "3": (60, 28, "-0.0851578083", "0.0006488213969"),
            "4": (243, 50, "0.7337405775", "0.1324227042295"),
        },
        "0.29323354739",
    ),
    "Purpose": (
        {
            "0": (145, 79, "-0.2400119704", "0.0134863869101"),
            "1": (86, 16, "0.8344607136", "0.0580148877093"),
            "10": (7, 5, "-0.5108256238", "0.0034055041584"),
            "2": (123, 54, "-0.0240975516", "0.0001032752211"),
            "3": (218, 82, "0.1304779551", "0.0049705887671"),
            "4": (8, 4, "-0.1541506798", "0.0002936203425"),
            "5": (14, 7, "-0.1541506798", "0.0005138355994"),
            "6": (28, 21, "-0.5596157879", "0.0167884736381"),
            "8": (8, 1, "1.2321436813", "0.0099744964676"),
            "9": (63, 31, "-0.1381503385", "0.0018420045131"),
        },
        "0.10939307333",
    ),
    "Value Savings/Stocks": (
        {
            "1": (386, 217, "-0.2713578445", "0.0466477056434"),
            "2": (69, 34, "-0.1395518804", "0.0020600515679"),
            "3": (52, 11, "0.7060505854", "0.0265609505935"),
            "4": (42, 6, "1.0986122887", "0.0439444915467"),
            "5": (151, 32, "0.7042460736", "0.0767963575528"),
        },
        "0.19600955690",
    ),
    "Guarantors": (
        {
            "1": (635, 272, "0.0005250722", "0.0000002500344"),
            "2": (23, 18, "-0.6021754024", "0.0163447609210"),
            "3": (42, 10, "0.5877866649", "0.0156743110641"),
        },
        "0.03201932202",
    ),
    "Foreign Worker": (
        {
            "1": (667, 296, "-0.0348672688", "0.0011788457545"),
            "2": (33, 4, "1.2629153400", "0.0426985662558"),
        },
        "0.04387741201",
    ),
}

# The cut points of bins [a, b); by bin good, bad, weight of evidence and information value, where a row more than there
# are bins is that of the missing; and the information value of the attribute.
NUMERIC = {
    "Duration of Credit (month)": (
        [8, 16, 45],
        [
            (78, 9, "1.3121863890", "0.1068494631015"),
            (264, 80, "0.3466246081", "0.0382937662266"),
            (328, 171, "-0.1959478085", "0.0198747062913"),
            (30, 40, "-1.1349799328", "0.1026886605902"),
        ],
        "0.26770659621",
    ),
    "Credit Amount": (
        [3914],
        [
            (550, 189, "0.2208734028", "0.0343931441471"),
            (150, 111, "-0.5461927676", "0.0850500166697"),
        ],
        "0.11944316082",
    ),
    "Age (years)": (
        [26, 35],
        [
            (108, 79, "-0.5346144857", "0.0582984367772"),
            (238, 111, "-0.0845573880", "0.0025367216408"),
            (335, 108, "0.2847014443", "0.0337574569686"),
            (19, 2, "1.4039939382", "0.0287484473064"),
        ],
        "0.12334106269",
    ),
}

# The splits; by bin [a, b) the count, non-events, events, weight of evidence and information value; and the total.
MEAN_RADIUS = (
    [11.42500019, 12.32999992, 13.09499979, 13.70499992, 15.04500008, 16.92500019],
    [
        (118, 3, 115, "-3.12517", "0.962483"),
        (79, 3, 76, "-2.71097", "0.538763"),
        (68, 7, 61, "-1.64381", "0.226599"),
        (49, 10, 39, "-0.839827", "0.052131"),
        (83, 28, 55, "-0.153979", "0.003385"),
        (54, 44, 10, "2.00275", "0.359566"),
        (118, 117, 1, "5.28332", "2.900997"),
    ],
    "5.043925",
)


def as_printed(figures: pd.Series, printed: list[str]) -> list[str]:
    """The figures, each with as many decimals as the printed one has."""
    return [f"{figure:.{len(text.partition('.')[2])}f}" for figure, text in zip(figures, printed, strict=True)]


def assert_printed(found: mb.AttributeBins, evidence: list[str], values: list[str], total: str, sign: int = 1) -> None:
    table = found.to_pandas()
    rows = table[:-1]
    assert as_printed(sign * rows["woe"], evidence) == evidence
    assert as_printed(rows["iv"], values) == values
    assert as_printed(table["iv"][-1:], [total]) == [total]


def bin_counts(name: str, values: list, counts: list[tuple[int, int]], cuts: list[float]) -> mb.AttributeBins:
    """The bins between these cuts of two records for each value, one of each class, that weigh what was counted."""
    rows = [(value, kind, n) for value, pair in zip(values, counts) for kind, n in zip(("good", "bad"), pair)]
    data = pd.DataFrame(rows, columns=[name, "creditability", "count"])
    bins = mb.supervised_bins(data, "creditability", [name], "count", smoothing=0.0, closed="left")
    return bins.with_cuts({name: cuts}, data)[name]


@pytest.mark.parametrize("name", NOMINAL)
def test_each_category_has_the_published_figures(name):
    by_category, total = NOMINAL[name]
    counts = [figures[:2] for figures in by_category.values()]

    found = bin_counts(name, list(by_category), counts, list(range(1, len(by_category))))

    assert sorted(found.variable.categories) == sorted(by_category)
    _, _, evidence, values = map(list, zip(*map(by_category.get, found.variable.categories)))
    assert_printed(found, evidence, values, total)


@pytest.mark.parametrize("name", NUMERIC)
def test_each_interval_and_the_missing_have_the_published_figures(name):
    cuts, printed, total = NUMERIC[name]
    below_and_at_cuts = [cuts[0] - 1, *cuts]
    values = below_and_at_cuts + [np.nan] * (len(printed) - len(below_and_at_cuts))

    found = bin_counts(name, values, [row[:2] for row in printed], cuts)

    assert found.missing_weight == sum(sum(row[:2]) for row in printed[len(below_and_at_cuts) :])
    assert_printed(found, [row[2] for row in printed], [row[3] for row in printed], total)


def test_the_breast_cancer_data_have_the_published_table():
    splits, printed, total = MEAN_RADIUS
    cancer = load_breast_cancer()
    data = pd.DataFrame({"mean radius": cancer.data[:, 0], "target": cancer.target})

    bins = mb.supervised_bins(data, "target", ["mean radius"], smoothing=0.0, closed="left")
    found = bins.with_cuts({"mean radius": splits}, data)["mean radius"]

    counts, others, events, evidence, values = map(list, zip(*printed))
    assert found.target_weights.tolist() == [list(pair) for pair in zip(others, events)]
    assert found.weights.tolist() == counts
    assert_printed(found, evidence, values, total, sign=-1)

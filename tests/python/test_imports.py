"""What the package loads, and when."""

from __future__ import annotations

import ast
import graphlib
import subprocess
import sys
from pathlib import Path

import mcbinning as mb
import pytest

MODULES = {path.stem: ast.parse(path.read_text(encoding="utf-8")) for path in Path(mb.__file__).parent.glob("*.py")}
FEATURES = ["duckdb", "matplotlib", "pandas", "pyarrow", "scipy", "sklearn", "sqlglot", "tqdm"]


def is_for_types_alone(node: ast.AST) -> bool:
    return isinstance(node, ast.If) and "TYPE_CHECKING" in ast.unparse(node.test)


def imports_of(node: ast.AST) -> set[str]:
    """The modules of the package that are imported when the code runs, at the latest when a function is called."""
    found: set[str] = set()
    if isinstance(node, ast.ImportFrom) and node.level == 1:
        found |= {node.module} if node.module else {alias.name for alias in node.names}
    for child in ast.iter_child_nodes(node):
        if not is_for_types_alone(child):
            found |= imports_of(child)
    return found


def test_the_modules_do_not_import_each_other_in_a_circle():
    graph = {name: imports_of(tree) & MODULES.keys() for name, tree in MODULES.items()}

    order = list(graphlib.TopologicalSorter(graph).static_order())  # raises CycleError
    assert order.index("_errors") < order.index("_result") < order.index("_functions") < order.index("__init__")


BLOCK = """
import sys
class Blocker:
    def find_spec(self, name, path=None, target=None):
        if name.partition(".")[0] in {blocked!r}:
            raise ModuleNotFoundError(name)
sys.meta_path.insert(0, Blocker())
"""


def run(program: str, *blocked: str) -> str:
    """What the program prints in a Python that lacks the blocked packages."""
    call = [sys.executable, "-c", BLOCK.replace("{blocked!r}", repr(blocked)) + program]
    done = subprocess.run(call, capture_output=True, text=True, timeout=60)
    assert done.returncode == 0, done.stderr
    return done.stdout.strip()


def test_the_package_loads_what_a_feature_needs_with_the_feature():
    loaded = f"import mcbinning; print([name for name in {FEATURES} if name in sys.modules])"

    assert run(loaded) == "[]"
    assert (
        run("import mcbinning as mb; print(mb.SupervisedBinner(), 'sklearn' in sys.modules)")
        == "SupervisedBinner() True"
    )
    assert set(mb.__all__) <= set(dir(mb))
    assert not hasattr(mb, "Supervised")


MAKE = """
import mcbinning as mb, pyarrow as pa
table = pa.table({"x": [float(i) for i in range(40)], "y": ["a" if i < 20 else "b" for i in range(40)]})
bins = mb.supervised_bins(table, "y")
"""


@pytest.mark.parametrize(
    ("blocked", "use", "message"),
    [
        ("sklearn", "mb.SupervisedBinner", "the estimators need scikit-learn: pip install 'mcbinning[sklearn]'"),
        ("pandas", "mb.EqualFrequencyBinner", "the estimators need pandas: pip install 'mcbinning[sklearn]'"),
        ("pandas", "bins.summary()", "data frames need pandas: pip install 'mcbinning[pandas]'"),
        ("pandas", "bins['x'].to_pandas()", "data frames need pandas: pip install 'mcbinning[pandas]'"),
        ("matplotlib", "bins.plot()", "plots need matplotlib: pip install 'mcbinning[plot]'"),
        ("matplotlib", "bins.plot_all()", "plots need matplotlib: pip install 'mcbinning[plot]'"),
        ("sqlglot", "bins.to_sql('postgres')", "dialects of SQL need sqlglot: pip install 'mcbinning[sql]'"),
        ("duckdb", "bins.transform(sys.executable)", "files need duckdb: pip install 'mcbinning[files]'"),
        (
            "tqdm",
            "mb.supervised_bins(table, 'y', progress=True)",
            "progress bars need tqdm: pip install 'mcbinning[progress]'",
        ),
    ],
)
def test_a_feature_says_what_it_lacks(blocked, use, message):
    attempt = f"{MAKE}try:\n    {use}\nexcept ImportError as error:\n    print(error)"

    assert run(attempt, blocked) == message


def test_bins_need_numpy_and_pyarrow_alone():
    use = """
import pickle
again = pickle.loads(pickle.dumps(mb.BinningResult.from_json(bins.to_json())))
print(bins["x"].labels, again.transform(table)["x_bin"].to_pylist()[18:22], len(bins.to_csv().splitlines()), repr(bins))
print(bins.to_sql(table="t") != bins.to_sql("duckdb", table="t"))
"""
    others = [name for name in FEATURES if name != "pyarrow"]

    assert run(MAKE + use, *others).splitlines() == [
        "['(-inf, 19]', '(19, +inf)'] [0, 0, 1, 1] 4 <BinningResult: supervised, 1 results>",
        "True",
    ]

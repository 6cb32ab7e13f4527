"""Arrow data that their producer has not checked."""

from __future__ import annotations

import mcbinning as mb
import pyarrow as pa
import pytest


@pytest.mark.parametrize("index", [-1, 2])
@pytest.mark.parametrize("values", [["a", "b"], [0.5, 1.5]])
def test_an_index_outside_of_its_dictionary_is_an_error(index, values):
    indices = pa.array([0, 1, index], pa.int8())
    table = pa.table(
        {
            "x": pa.array([1.0, 2.0, 3.0]),
            "y": pa.DictionaryArray.from_arrays(indices, pa.array(values), safe=False),
        }
    )

    with pytest.raises(mb.DataError, match="an index points outside of its dictionary of 2 values"):
        mb.supervised_bins(table, target="y")

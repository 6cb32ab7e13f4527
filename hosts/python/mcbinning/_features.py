"""Packages that single features need, beyond the requirements of this one."""

from __future__ import annotations

import importlib
from typing import Any


def require(module: str, feature: str, extra: str) -> Any:
    """Imports what the feature, such as "plots", needs. `extra` is that of this package which installs it."""
    try:
        return importlib.import_module(module)
    except ImportError as error:
        package = {"sklearn": "scikit-learn"}.get(module, module.partition(".")[0])
        raise ImportError(f"{feature} need {package}: pip install 'mcbinning[{extra}]'") from error

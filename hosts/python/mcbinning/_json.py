"""Texts of JSON, as the values that the core checks."""

from __future__ import annotations

import json
import math
import os
import re
from typing import Any

from . import _core

_TOKEN = re.compile(r'"(?:[^"\\]|\\.)*"|[^\s"\[\]{}:,]+', re.DOTALL)


def read_bins(source: str | os.PathLike[str]) -> _core.Bins:
    """Reads a text, or the file of a path. \\raise ValueError with the path of the fault, if it has one."""
    name, content = _read(source)
    return _core.Bins.read(_parse(content, name), name)


def read_text(source: str | os.PathLike[str]) -> str:
    """The text itself, or that of the file."""
    return _read(source)[1].decode("utf-8").removeprefix("\ufeff")


def _read(source: str | os.PathLike[str]) -> tuple[str, bytes]:
    """What messages call the source, and what it holds."""
    named = os.fspath(source)
    if isinstance(source, str) and named.lstrip("\ufeff \t\r\n").startswith("{"):
        return "the text", named.encode("utf-8", "surrogatepass")
    with open(named, "rb") as file:
        return named, file.read()


def write_text(text: str, path: str | os.PathLike[str] | None) -> str:
    if path is not None:
        with open(path, "w", encoding="utf-8", newline="") as file:
            file.write(text)
    return text


def _parse(content: bytes, name: str) -> Any:
    try:
        text = content.decode("utf-8").removeprefix("\ufeff")
        return _load(text)
    except UnicodeDecodeError as error:
        line = content.count(b"\n", 0, error.start) + 1
    except json.JSONDecodeError as error:
        line = error.lineno
    except RecursionError:
        return None  # nested deeper than any document of bins, which so it is not, and nor is this
    except ValueError:
        bad = next((token for token in _TOKEN.finditer(text) if not _is_loadable(token[0])), None)
        line = text.count("\n", 0, bad.start() if bad else 0) + 1
    raise ValueError(f"{name}: {_core.describe_not_json(line)}")


def _load(text: str) -> Any:
    """\\raise ValueError at what Python reads, but is no JSON, or no number or text that the core can hold."""
    document = json.loads(text, parse_constant=_refuse, parse_float=_number, parse_int=_number, object_pairs_hook=tuple)
    if "\\u" in text:
        json.dumps(document, ensure_ascii=False).encode("utf-8")  # refuses half a surrogate pair
    return document


def _is_loadable(token: str) -> bool:
    try:
        _load(token)
    except ValueError:
        return False
    return True


def _refuse(constant: str) -> Any:
    raise ValueError(constant)


def _number(digits: str) -> float | int:
    """The whole number, or the double. A minus in front of 0 is kept."""
    number = float(digits)
    if math.isinf(number):
        raise ValueError(digits)
    is_whole = number != 0 and digits.lstrip("-").isdigit()
    return int(digits) if is_whole or digits == "0" else number

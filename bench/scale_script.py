"""scripts/scale, which makes big policies and hosts, as the module SCALE."""

from __future__ import annotations

import importlib.machinery
import importlib.util
import pathlib
import sys
from typing import Any

REPOSITORY = pathlib.Path(__file__).resolve().parent.parent


def load() -> Any:
    loader = importlib.machinery.SourceFileLoader("scale", str(REPOSITORY / "scripts" / "scale"))
    spec = importlib.util.spec_from_loader("scale", loader)
    assert spec is not None
    module = importlib.util.module_from_spec(spec)
    sys.dont_write_bytecode = True
    sys.modules["scale"] = module
    loader.exec_module(module)
    return module


SCALE = load()

"""Imports Python scripts of script/ as modules, for their tests."""

import importlib.machinery
import importlib.util

from programs import PROJECT


def script(name):
    """A script as a module, without running its main program."""
    loader = importlib.machinery.SourceFileLoader(name, str(PROJECT / "script" / name))
    module = importlib.util.module_from_spec(importlib.util.spec_from_loader(name, loader))
    loader.exec_module(module)
    return module

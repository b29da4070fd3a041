"""Every public name is documented for help() and typed in the stubs."""

from __future__ import annotations

import ast
import inspect
import pathlib

import pytest

import kubo
from kubo import _kubo

STUBS = ast.parse((pathlib.Path(_kubo.__file__).parent / "_kubo.pyi").read_text())
STUBBED = {node.name for node in STUBS.body if isinstance(node, (ast.ClassDef, ast.FunctionDef))}
FUNCTIONS = [name for name in kubo.__all__ if inspect.isbuiltin(getattr(kubo, name))]


@pytest.mark.parametrize("name", [n for n in dir(_kubo) if not n.startswith("__")])
def test_every_name_of_the_extension_has_a_stub(name):
    assert name in STUBBED


@pytest.mark.parametrize("name", FUNCTIONS)
def test_functions_document_parameters_returns_and_raises(name):
    doc = getattr(kubo, name).__doc__
    for section in ("Parameters\n----------", "Returns\n-------", "Raises\n------"):
        assert section in doc


@pytest.mark.parametrize("name", [n for n in kubo.__all__ if inspect.isclass(getattr(kubo, n))])
def test_classes_and_their_methods_have_docstrings(name):
    cls = getattr(kubo, name)
    assert cls.__doc__ and len(cls.__doc__) > 20
    for member, value in vars(cls).items():
        if not member.startswith("_") and callable(value):
            assert value.__doc__, f"{name}.{member}"

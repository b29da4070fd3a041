"""Library failures as Python exceptions that keep every detail."""

from __future__ import annotations

import numpy as np
import pytest
from conftest import assert_raises_error

import kubo


def test_each_kind_has_its_class_and_its_details():
    error = assert_raises_error(kubo.Error, lambda: kubo.unpack(b"\xff\xff", 12, 1, "8U"),
                                "Invalid type promote, the number of bit is bigger than the "
                                "type requested for conversion")
    assert type(error) is kubo.Error and error.line == 390
    error = assert_raises_error(kubo.DataError, lambda: kubo.TileIterator(5, 0),
                                "Invalid tile size")
    assert (error.source, error.line) == ("vrkframework/basic/kubo/raster/tileiterator", 31)
    error = assert_raises_error(kubo.OutOfBoundsError, lambda: kubo.TileIterator(4, 4)[16],
                                "Tile number out of bounds")
    assert error.values == (0, 16) and isinstance(error, IndexError)
    error = assert_raises_error(kubo.ParameterError, lambda: kubo.LUT([(1.0, 2.0)]), "desc")
    assert (error.parameter, error.kind) == ("LUT", 8) and isinstance(error, ValueError)
    assert error.function.startswith("__cdecl kora::kubo::LUT::LUT(")


def test_the_classes_form_one_family_with_empty_details_by_default():
    assert all(issubclass(kind, kubo.Error) for kind in (
        kubo.DataError, kubo.ParameterError, kubo.OutOfBoundsError))
    own = kubo.OutOfBoundsError("raised by hand")
    assert own.message is None and own.values == () and str(own) == "raised by hand"


@pytest.mark.parametrize("call, error, argument", [
    (lambda: kubo.validity_mask(np.zeros((2, 2), "U1"), 0), TypeError, "array"),
    (lambda: kubo.convert(np.zeros(2), None), TypeError, "dtype"),
    (lambda: kubo.convert(np.zeros(2), "8U", out=[0, 0]), TypeError, "out"),
    (lambda: kubo.unpack(b"", 3, 0, "32R"), TypeError, "dtype"),
    (lambda: kubo.RLECompressedData(np.zeros((2, 2)), sample_type="C64S"), TypeError, "array"),
    (lambda: kubo.LineRLECompressedBitMask(np.zeros((2, 2), bool)).decode((0, 0, 3, 1)),
     ValueError, "window"),
])
def test_argument_errors_name_the_argument(call, error, argument):
    with pytest.raises(error, match=argument):
        call()

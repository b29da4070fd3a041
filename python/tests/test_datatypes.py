"""kubo.DataType and kubo.promote: labels, numpy dtypes, fields and the promotion rule."""

from __future__ import annotations

import pickle

import numpy as np
import pytest
from hypothesis import given
from hypothesis import strategies as st

import kubo

NUMPY = {"8U": np.uint8, "8S": np.int8, "16U": np.uint16, "16S": np.int16, "32U": np.uint32,
         "32S": np.int32, "32R": np.float32, "64U": np.uint64, "64S": np.int64,
         "64R": np.float64, "C32R": np.complex64, "C64R": np.complex128}
LABELS = [t.label for t in kubo.DataType.predefined()]


@pytest.mark.parametrize("label", LABELS)
def test_labels_fields_and_numpy_dtypes_agree(label):
    kind = kubo.DataType(label)
    assert repr(kind) == f"DataType('{label}')" and kind.label == label
    fields = (kind.bits, kind.is_signed, kind.is_float, kind.mantissa_bits, kind.exponent_bits,
              kind.is_complex)
    assert kubo.DataType(*fields) == kind and pickle.loads(pickle.dumps(kind)) == kind
    assert kind.is_complex == label.startswith("C") and kind.bits == int(label.strip("CURS"))
    if label in NUMPY:
        assert kind.dtype == NUMPY[label] and kubo.DataType(NUMPY[label]) == kind == NUMPY[label]
    else:
        assert kind.dtype is None
    assert (kind.component_dtype is None) == (label == "1U")


def test_types_outside_the_table_compare_by_all_six_fields():
    packed = kubo.DataType(12, False, False, 12, 0, False)
    assert packed.label is None and packed.dtype is None and "bits=12" in repr(packed)
    assert packed != kubo.DataType("16U") and hash(packed) != hash(kubo.DataType("16U"))
    assert kubo.DataType("16S") != "not a type" and kubo.DataType("8U") == "uint8"
    for bad in ("8X", np.float16, bool, ">i4", None):
        with pytest.raises((ValueError, TypeError)):
            kubo.DataType(bad)


def promoted(*labels: str) -> kubo.DataType:
    """The promotion rule written out: widest types only, last of each group wins."""
    if not labels:
        return kubo.DataType("8U")
    kinds = [kubo.DataType(label) for label in labels]
    width = max(k.bits for k in kinds)
    last = {}
    for k in kinds:
        if k.bits == width:
            last["float" if k.is_float else "signed" if k.is_signed else "unsigned"] = k
    if "float" in last:
        f = last["float"]
        if "signed" not in last and "unsigned" not in last:
            return f
        mantissa, exponent = {64: (52, 11), 128: (128, 0)}.get(2 * width, (23, 8))
        if 2 * width not in (32, 64):
            mantissa, exponent = 2 * width, 0
        return kubo.DataType(2 * width, True, True, mantissa, exponent, f.is_complex)
    if "signed" in last:
        s = last["signed"]
        if "unsigned" not in last:
            return s
        return kubo.DataType(2 * width, True, False, 2 * width, 0, s.is_complex)
    return last["unsigned"]


@given(st.lists(st.sampled_from(LABELS[1:]), max_size=5))
def test_promotion_follows_the_rule(labels):
    assert kubo.promote(*labels) == promoted(*labels)


def test_documented_promotions():
    assert kubo.promote("16S", np.uint16) == "32S" and kubo.promote() == "8U"
    assert kubo.promote("8S", "16U") == "16U" and kubo.promote("32R", "C32R") == "C32R"
    wide = kubo.promote("64R", "64U")
    assert (wide.bits, wide.mantissa_bits, wide.exponent_bits, wide.label) == (128, 128, 0, None)


def test_types_hash_like_their_equals_and_serve_as_keys():
    table = {kubo.DataType("C16S"): "radar", kubo.DataType(np.float32): "float"}
    assert table[kubo.DataType(16, True, False, 16, 0, True)] == "radar"
    assert len({kubo.DataType(t) for t in ("32R", np.float32, "float32", "f4")}) == 1

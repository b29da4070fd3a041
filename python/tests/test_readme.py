"""The Python session in the README runs as it is written."""

from __future__ import annotations

import pathlib
import re

import numpy as np

README = pathlib.Path(__file__).resolve().parents[2] / "README.md"


def test_the_readme_session_runs_word_for_word():
    blocks = re.findall(r"```python\n(.*?)```", README.read_text(), re.S)
    assert len(blocks) == 1
    names: dict = {}
    exec(compile(blocks[0], str(README), "exec"), names)
    image, mask, runs, small = names["image"], names["mask"], names["runs"], names["small"]
    np.testing.assert_array_equal(mask, np.packbits(image != 0, axis=-1))
    np.testing.assert_array_equal(runs.decode(), mask)
    assert small.dtype == np.uint8 and small.max() == 255 and (small[:, :32] == 0).all()

"""The package's pure-Python types: tiles, metadata views and named codes."""

from __future__ import annotations

import enum
from collections.abc import Iterator, MutableMapping
from typing import TYPE_CHECKING, NamedTuple

if TYPE_CHECKING:
    from ._kubo import ControlPointContainer


class Tile(NamedTuple):
    """A window of an image: its first column and row and its size in pixels."""

    x: int
    y: int
    width: int
    height: int

    @property
    def slices(self) -> tuple[slice, slice]:
        """The (rows, columns) slices of the window: ``image[tile.slices]``."""
        return slice(self.y, self.y + self.height), slice(self.x, self.x + self.width)


class Metadata(MutableMapping[str, str]):
    """The live key/value metadata of a ControlPointContainer.

    Keys match without regard to the case of ASCII letters (``"Sensor"`` and
    ``"SENSOR"`` are one key; other letters are compared as they are) and iterate in that
    order; a key keeps the spelling it was first set with.
    """

    def __init__(self, container: ControlPointContainer) -> None:
        self._container = container

    def __getitem__(self, key: str) -> str:
        return self._container._metadata_get(key)

    def __setitem__(self, key: str, value: str) -> None:
        self._container._metadata_set(key, value)

    def __delitem__(self, key: str) -> None:
        self._container._metadata_delete(key)

    def __iter__(self) -> Iterator[str]:
        return iter(self._container._metadata_keys())

    def __len__(self) -> int:
        return len(self._container._metadata_keys())

    def __repr__(self) -> str:
        return f"Metadata({dict(self)!r})"


class ControlPointType(enum.IntEnum):
    """The role of a control point."""

    UNDEFINED = 0
    GROUND = 1
    CHECK = 2
    TIE = 3


class PopulatedAxes(enum.IntEnum):
    """Which axes of a ground location hold measured values."""

    NONE = 0
    XY = 1
    Z = 2
    XYZ = 3

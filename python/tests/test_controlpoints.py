"""Control points, their container, metadata view and history."""

from __future__ import annotations

import copy

import numpy as np
import pytest

import kubo


def test_points_compare_copy_and_keep_their_locations():
    ground = kubo.GroundLocation(500120.0, 4649870.0, 412.0, populated_axes=kubo.PopulatedAxes.XYZ)
    point = kubo.ControlPoint(1, "Church tower", ground=ground,
                              images=[kubo.ImageLocation(1024.5, 733.0, matrix=np.eye(2))],
                              type=kubo.ControlPointType.GROUND)
    twin = copy.copy(point)
    twin.used = True
    assert twin == point and twin.ground.z == 412.0 and point.ground.populated_axes == 3
    images = twin.images
    images[0].row = 1.0
    assert twin.images[0].row == 733.0  # a copy: assign to change
    twin.images = images
    assert twin != point and point.images[0].matrix.tolist() == [[1, 0], [0, 1]]
    assert kubo.GroundLocation(np.nan) != kubo.GroundLocation(np.nan)
    with pytest.raises(ValueError, match="3 x 3"):
        kubo.GroundLocation(matrix=np.eye(2))


def test_the_container_s_metadata_history_and_reference_system():
    container = kubo.ControlPointContainer()
    container.points = [kubo.ControlPoint(7)]
    container.metadata["Sensor"] = "frame camera"
    container.metadata["SENSOR"] = "line scanner"
    assert dict(container.metadata) == {"Sensor": "line scanner"} and "sensor" in container.metadata
    del container.metadata["sensor"]
    with pytest.raises(KeyError):
        container.metadata["Sensor"]
    container.metadata.update(b="2", A="1")
    assert list(container.metadata) == ["A", "b"]
    container.history = [kubo.HistoryEvent(1, "Point measured", "2026-11-21 10:00")]
    container.set_crs(3)
    duplicate = copy.copy(container)
    assert duplicate.history == [] and duplicate.crs_dimension == 3
    assert duplicate.points == container.points and len(duplicate.metadata) == 2
    assert kubo.HistoryEvent(2, "POINT MEASURED") == container.history[0]
    error = pytest.raises(kubo.ParameterError, container.set_crs, 2).value
    assert (error.parameter, error.kind, error.received, error.expected) == (
        "oCRS", 1, "Dimension = 2", "Dimension = 3")
    assert container.crs_dimension is None and isinstance(error, ValueError)


def test_texts_round_trip_as_utf8_and_keep_the_library_s_lengths():
    point = kubo.ControlPoint(3, "Kirchturm Süd ⛪")
    assert point.name == "Kirchturm Süd ⛪"
    assert repr(point) == "ControlPoint(3, 'Kirchturm Süd ⛪')"
    event = kubo.HistoryEvent(1, "x" * 100, "2026-11-21 10:00:59 UTC")
    assert event.message == "x" * 64 and event.timestamp == "2026-11-21 10:00"
    assert len(kubo.HistoryEvent(2, "now").timestamp) <= 16
    container = kubo.ControlPointContainer()
    container.metadata["Höhe"] = "412 m"
    assert dict(container.metadata) == {"Höhe": "412 m"}

"""A car for the tests: simulated, and closed when they are done."""
from collections.abc import Iterator

import pytest

import velmora

PORT = "sim:petrol-can11?instant"


@pytest.fixture(scope="module")
def car() -> Iterator[velmora.Car]:
    with velmora.Car(PORT, settings_file="/proc/nonexistent/settings.toml") as made:
        yield made

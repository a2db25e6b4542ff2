"""A car behind an OBD-II adapter.

>>> with Car("sim:petrol-can11?instant") as car:
...     [reading.unit for reading in car.read("RPM", "coolant")]
['rpm', '°C']

A process has one car at a time. All functions may be called from any thread, but not from a callback of a watch or of
the progress, which run on the car's own thread.
"""
from __future__ import annotations

import asyncio
import dataclasses
import datetime
import json
import os
import types
from collections.abc import AsyncIterator, Callable, Iterator
from typing import Any, Literal

from . import _topics, _velmora
from ._topics import (Calibration, Cleared, CodeList, Counter, Counters, FreezeFrame, FrozenReading, Info, Meaning, Module, ModuleCodes, Monitor,
                      Monitors, Readiness, ReadinessMonitor, Sensor, Test, TroubleCode)
from ._velmora import (AdapterSilentError, Error, InterruptedByUserError, LinkLostError, NotSupportedError, PortError,
                       RefusedError, VehicleSilentError, WrongUseError)

__all__ = [
    "AdapterSilentError", "Calibration", "Car", "Cleared", "CodeList", "Counter", "Counters", "Error", "FreezeFrame", "FrozenReading", "Info",
    "InterruptedByUserError", "LinkLostError", "Meaning", "Module", "ModuleCodes", "Monitor", "Monitors",
    "NotSupportedError", "PortError", "Reading", "Readiness", "ReadinessMonitor", "RefusedError", "Sensor", "Test",
    "TroubleCode", "Units", "VehicleSilentError", "Watch", "WrongUseError", "explain",
]
__version__ = _velmora.version

Units = Literal["metric", "imperial", "imperial-uk"]


@dataclasses.dataclass(frozen=True, slots=True)
class Reading:
    """One value of one sensor of one control module at one moment.

    value is a number in unit, a text for states and lists, or None if the module did not tell it.

    >>> print(Reading("RPM", 1726.0, "rpm", "Engine RPM", 0x7E8, "010C", 0.0, 0, b"", ""))
    Engine RPM: 1726 rpm
    """

    sensor: str
    value: float | str | None
    unit: str
    name: str
    module: int
    pid: str
    time: float
    precision: int
    raw: bytes
    vehicle: str

    @property
    def datetime(self) -> datetime.datetime:
        """When the reply had come."""
        return datetime.datetime.fromtimestamp(self.time, datetime.timezone.utc)

    def to_dict(self) -> dict[str, Any]:
        return dataclasses.asdict(self)

    def __str__(self) -> str:
        text = f"{self.value:.{self.precision}f}" if isinstance(self.value, float) else self.value or "-"
        return f"{self.name}: {text} {self.unit}".rstrip()


class Watch:
    """Readings that come over and over: ``for``, ``async for``, or a callback. Ends when it is left or stopped.

    >>> with Car("sim:petrol-can11?instant") as car, car.watch("RPM") as watch:
    ...     next(iter(watch)).sensor
    'RPM'
    """

    def __init__(self, native: _velmora.Watch) -> None:
        self._native = native

    def __enter__(self) -> Watch:
        return self

    def __exit__(self, kind: type[BaseException] | None, value: BaseException | None,
                 trace: types.TracebackType | None) -> None:
        self.stop()

    def stop(self) -> None:
        """Ends it; iterations end too. A callback that runs is waited for, unless this is it."""
        self._native.stop()

    @property
    def link_is_up(self) -> bool:
        """False from a loss of the link on until it is back; the car tries to come back by itself."""
        return self._native.link_is_up

    @property
    def lost(self) -> int:
        """How many readings were dropped because nobody took them in time."""
        return self._native.lost

    def take(self, seconds: float = 0.0) -> list[Reading]:
        """All readings that have come; waits so long for the first one."""
        return [Reading(*each) for each in self._native.take(seconds)]

    def __iter__(self) -> Iterator[Reading]:
        while not self._native.stopped:
            yield from self.take(3600.0)

    async def __aiter__(self) -> AsyncIterator[Reading]:
        while not self._native.stopped:
            for reading in await asyncio.to_thread(self.take, 0.2):
                yield reading


class Car:
    """A vehicle behind an adapter; connects when it is made, and raises Error if that fails.

    port is what the program's --port takes: "/dev/ttyUSB0", "192.168.0.10:35000", "sim:petrol-can11", "auto". What is
    None comes from the settings file, or is the default. progress is told what the car is at, line by line.
    """

    def __init__(self, port: str = "auto", *, baud: int | None = None, protocol: int | None = None,
                 reset: bool = False, module: int | None = None, units: Units | None = None, sleep: bool = False,
                 log_file: str | os.PathLike[str] | None = None,
                 trace_file: str | os.PathLike[str] | None = None,
                 settings_file: str | os.PathLike[str] | None = None,
                 progress: Callable[[str], object] | None = None) -> None:
        def path(file: str | os.PathLike[str] | None) -> str | None:
            return None if file is None else os.fspath(file)

        self._native = _velmora.Car(port, {
            "baud": baud, "protocol": protocol, "reset": reset, "module": module, "units": units,
            "sleep": sleep, "log_file": path(log_file),
            "trace_file": path(trace_file), "settings_file": path(settings_file), "progress": progress})

    def __enter__(self) -> Car:
        return self

    def __exit__(self, kind: type[BaseException] | None, value: BaseException | None,
                 trace: types.TracebackType | None) -> None:
        self.close()

    def close(self) -> None:
        """Closes the connection. Calls that run elsewhere end first, and watches end."""
        self._native.close()

    def reconnect(self) -> None:
        """Connects anew after a loss."""
        self._native.reconnect()

    def read(self, *sensors: str) -> list[Reading]:
        """Each sensor once, in the order of the names: "RPM", "0C", "coolant", "7E9:RPM", or all of a module by "all"."""
        return [Reading(*each) for each in self._native.read(list(sensors))]

    def watch(self, *sensors: str, callback: Callable[[Reading], object] | None = None) -> Watch:
        """Reads over and over; a sensor may have a rate: "RPM@10hz".

        With a callback, readings go there, on the car's thread, and the watch gives none to iterate over.
        """
        if callback is None:
            return Watch(self._native.watch(list(sensors), None))
        given = callback
        return Watch(self._native.watch(list(sensors), lambda plain: given(Reading(*plain))))

    def modules(self) -> list[Module]:
        """The control modules that answer."""
        return [Module(*each) for each in self._native.modules()]

    def sensors(self) -> list[Sensor]:
        """What each control module offers."""
        return [Sensor(*each) for each in self._native.sensors()]

    def codes(self) -> list[ModuleCodes]:
        """Lamp and trouble codes of each control module, list by list, with what was not told."""
        return [_topics.module_codes(each) for each in self._native.codes()]

    def freeze_frames(self, number: int = 0) -> list[FreezeFrame]:
        """What each control module froze when a code was set; 0 is the newest as a rule."""
        if not 0 <= number <= 255:
            raise WrongUseError("a freeze frame has a number from 0 to 255")
        return [_topics.freeze_frame(each) for each in self._native.freeze_frame(number)]

    def readiness(self) -> list[Readiness]:
        """Which monitors have run."""
        return [_topics.readiness(each) for each in self._native.readiness()]

    def monitors(self) -> list[Monitors]:
        """The results of on-board tests. Takes seconds."""
        return [_topics.monitors(each) for each in self._native.monitors()]

    def info(self) -> list[Info]:
        """What each control module says of itself and the vehicle."""
        return [_topics.info(each) for each in self._native.info()]

    def counters(self) -> list[Counters]:
        """How often monitors could run and did."""
        return [_topics.counters(each) for each in self._native.counters()]

    def clear(self, *, erase_readiness: bool) -> list[Cleared]:
        """Clears the confirmed and pending codes of all control modules, and turns the lamp off.

        Also erases freeze frames, readiness and test results: the vehicle must be driven before it can pass an emissions
        test. Only with erase_readiness=True, which says that this is known. Raises Error if no module cleared its codes.
        """
        if erase_readiness is not True:
            raise WrongUseError("clearing also erases readiness: pass erase_readiness=True if that is meant")
        return [_topics.cleared(each) for each in self._native.clear()]

    def report_json(self) -> str:
        """All that the vehicle tells, as the JSON document of ``velmora scan --json``. Takes seconds."""
        return self._native.report_json()

    def report(self) -> dict[str, Any]:
        """The same as a dict."""
        document: dict[str, Any] = json.loads(self.report_json())
        return document


def explain(code: str) -> TroubleCode:
    """All meanings of a trouble code, with or without a car.

    >>> explain("P0420").meanings[0].text
    'Catalyst System Efficiency Below Threshold Bank 1'
    """
    return _topics.trouble_code(_velmora.explain(code))

"""What a car tells of itself, as plain values."""
from __future__ import annotations

import dataclasses
from typing import Any


@dataclasses.dataclass(frozen=True)
class OfModule:
    """What belongs to one control module, by its id and name."""

    module: int
    name: str


@dataclasses.dataclass(frozen=True)
class Answered(OfModule):
    """What one control module was asked; answer tells how that went."""

    answer: str


@dataclasses.dataclass(frozen=True)
class Module:
    """A control module that answers."""

    id: int
    name: str
    description: str


@dataclasses.dataclass(frozen=True)
class Sensor:
    """A sensor that a control module offers; a derived value has no PID."""

    module: int
    key: str
    pid: str | None
    title: str


@dataclasses.dataclass(frozen=True)
class Meaning:
    """One meaning of a trouble code: "Generic", or a maker's own."""

    maker: str
    text: str


@dataclasses.dataclass(frozen=True)
class TroubleCode:
    """A trouble code with all its meanings, and the text that holds for the vehicle.

    >>> str(TroubleCode("P0420", "Powertrain", (), None, "Catalyst Efficiency"))
    'P0420 Catalyst Efficiency'
    """

    code: str
    system: str
    meanings: tuple[Meaning, ...]
    maker: str | None
    text: str

    def __str__(self) -> str:
        return f"{self.code} {self.text}"


@dataclasses.dataclass(frozen=True)
class CodeList:
    """The codes of one kind in one control module.

    kind is "confirmed", "pending" or "permanent". Without codes, answer tells whether nothing is stored ("read") or the
    module did not tell: "refused", "no answer", "unreadable" or "not supported".
    """

    kind: str
    answer: str
    reason: str | None
    codes: tuple[TroubleCode, ...]


@dataclasses.dataclass(frozen=True)
class ModuleCodes(OfModule):
    """Lamp and trouble codes of one control module; lamp is None if it was not told."""

    lamp: bool | None
    lists: tuple[CodeList, ...]


@dataclasses.dataclass(frozen=True)
class FrozenReading:
    """One value of a freeze frame; None if the module did not tell it."""

    name: str
    value: str | None
    unit: str


@dataclasses.dataclass(frozen=True)
class FreezeFrame(Answered):
    """What a control module froze when a code was set; code is None if it froze nothing, if answer is "read"."""

    number: int
    code: TroubleCode | None
    readings: tuple[FrozenReading, ...]


@dataclasses.dataclass(frozen=True)
class ReadinessMonitor:
    """One monitor: "complete", "not complete", "disabled" or "not available"."""

    name: str
    since_cleared: str
    this_cycle: str | None


@dataclasses.dataclass(frozen=True)
class Readiness(Answered):
    """The monitors of one control module, as an emissions test asks for them."""

    lamp: bool | None
    monitors: tuple[ReadinessMonitor, ...]


@dataclasses.dataclass(frozen=True)
class Test:
    """A test that a control module made on itself: "failed", "passed", "no result" or "no limits"."""

    id: int
    description: str
    value: str
    minimum: str | None
    maximum: str | None
    unit: str
    verdict: str


@dataclasses.dataclass(frozen=True)
class Monitor:
    """An on-board monitor with the results of its tests."""

    id: int
    description: str
    tests: tuple[Test, ...]


@dataclasses.dataclass(frozen=True)
class Monitors(Answered):
    """The results of on-board tests of one control module."""

    monitors: tuple[Monitor, ...]


@dataclasses.dataclass(frozen=True)
class Calibration:
    """A calibration, and the checksum of what it names."""

    id: str
    verification: str | None


@dataclasses.dataclass(frozen=True)
class Info(OfModule):
    """What one control module says of itself and the vehicle; None is what was not told."""

    vin: str | None
    description: str | None
    standard: str | None
    protocol: str | None
    calibrations: tuple[Calibration, ...]
    engine_serial_number: str | None
    type_approval: str | None
    distance_with_lamp: str | None
    time_with_lamp: str | None
    distance_since_cleared: str | None
    time_since_cleared: str | None


@dataclasses.dataclass(frozen=True)
class Counter:
    """How often a monitor could run, or did."""

    name: str
    value: int


@dataclasses.dataclass(frozen=True)
class Counters(Answered):
    """The in-use counters of one control module that are not 0."""

    counters: tuple[Counter, ...]


@dataclasses.dataclass(frozen=True)
class Cleared(OfModule):
    """What one control module said to clearing: "cleared", "refused", "no answer" or "unreadable"."""

    result: str
    reason: str | None


def trouble_code(plain: Any) -> TroubleCode:
    code, system, meanings, maker, text = plain
    return TroubleCode(code, system, tuple(Meaning(*each) for each in meanings), maker, text)


def module_codes(plain: Any) -> ModuleCodes:
    module, name, (lamp, lists) = plain
    return ModuleCodes(module, name, lamp, tuple(
        CodeList(kind, answer, reason, tuple(trouble_code(each) for each in codes))
        for kind, answer, reason, codes in lists))


def freeze_frame(plain: Any) -> FreezeFrame:
    module, name, (answer, number, code, readings) = plain
    return FreezeFrame(module, name, answer, number, None if code is None else trouble_code(code),
                       tuple(FrozenReading(*each) for each in readings))


def readiness(plain: Any) -> Readiness:
    module, name, (answer, lamp, monitors) = plain
    return Readiness(module, name, answer, lamp, tuple(ReadinessMonitor(*each) for each in monitors))


def monitors(plain: Any) -> Monitors:
    module, name, (answer, told) = plain
    return Monitors(module, name, answer, tuple(
        Monitor(id, description, tuple(Test(*each) for each in tests)) for id, description, tests in told))


def info(plain: Any) -> Info:
    module, name, (vin, description, standard, protocol, calibrations, *more) = plain
    return Info(module, name, vin, description, standard, protocol,
                tuple(Calibration(*each) for each in calibrations), *more)


def counters(plain: Any) -> Counters:
    module, name, (answer, told) = plain
    return Counters(module, name, answer, tuple(Counter(*each) for each in told))


def cleared(plain: Any) -> Cleared:
    module, name, (result, reason) = plain
    return Cleared(module, name, result, reason)

"""Watches, and the life of a car."""
import asyncio
import os
import signal
import subprocess
import sys
import threading
import time

import pytest

import velmora
from velmora import _velmora

PORT = "sim:petrol-can11?instant"


def test_iterates_and_ends(car: velmora.Car) -> None:
    with car.watch("RPM", "SPEED") as watch:
        seen = [reading for _, reading in zip(range(6), watch)]
        assert {reading.sensor for reading in seen} == {"RPM", "SPEED"}
        assert watch.link_is_up and watch.lost == 0
    assert list(watch) == []


def test_asyncio_iterates_and_is_cancelled(car: velmora.Car) -> None:
    async def run() -> int:
        count = 0
        with car.watch("RPM") as watch:
            async for reading in watch:
                assert reading.sensor == "RPM"
                count += 1
                if count == 5:
                    break

            async def forever() -> None:
                async for _ in watch:
                    pass

            task = asyncio.create_task(forever())
            await asyncio.sleep(0)
            task.cancel()
            with pytest.raises(asyncio.CancelledError):
                await task
        return count

    assert asyncio.run(run()) == 5


def test_callbacks_come_and_may_not_ask(car: velmora.Car) -> None:
    errors: list[BaseException] = []
    enough = threading.Event()

    def on_reading(reading: velmora.Reading) -> None:
        try:
            car.read("RPM")
        except velmora.Error as error:
            errors.append(error)
            enough.set()

    with car.watch("RPM", callback=on_reading) as watch:
        assert enough.wait(10)
        assert watch.take() == []
    assert isinstance(errors[0], velmora.WrongUseError)


def test_a_callback_that_raises_is_told_and_the_watch_goes_on(car: velmora.Car, monkeypatch: pytest.MonkeyPatch) -> None:
    told: list[object] = []
    twice = threading.Event()

    def hook(unraisable: object) -> None:
        told.append(unraisable)
        if len(told) == 2:
            twice.set()

    def fails(reading: velmora.Reading) -> None:
        raise RuntimeError("of the test")

    monkeypatch.setattr(sys, "unraisablehook", hook)
    with car.watch("RPM", callback=fails):
        assert twice.wait(10)


@pytest.mark.skipif("LD_PRELOAD" in os.environ, reason="a sanitizer takes its time")
def test_callbacks_are_cheap() -> None:
    count = 100000
    seen: list[velmora.Reading] = []
    assert _velmora.callback_seconds(lambda plain: seen.append(velmora.Reading(*plain)), count) < 1.0
    assert len(seen) == count + 1 and seen[-1].value == 1726.0


def run_python(code: str) -> "subprocess.Popen[str]":
    return subprocess.Popen([sys.executable, "-c", code], stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)


def test_a_closed_car_raises_and_never_crashes() -> None:
    child = run_python(f"""
import velmora
car = velmora.Car({PORT!r})
watch = car.watch("RPM")
car.close()
car.close()
watch.stop()
for call in (car.codes, car.report_json, lambda: car.read("RPM"), lambda: car.watch("RPM")):
    try:
        call()
    except velmora.WrongUseError as error:
        print(error.kind)
with velmora.Car({PORT!r}) as again:
    print(again.read("RPM")[0].unit)
left = velmora.Car({PORT!r}, progress=lambda line: None)  # still open at exit, with a callback
kept = left.watch("RPM", callback=lambda reading: None)
""")
    out, err = child.communicate(timeout=60)
    assert out == "2\n2\n2\n2\nrpm\n" and err == "" and child.returncode == 0


@pytest.mark.parametrize("wait", ["[None for _ in car.watch('RPM')]", "car.monitors()"])
def test_ctrl_c_ends_a_wait(wait: str) -> None:
    child = run_python(f"""
import time, velmora
car = velmora.Car("sim:petrol-can11")
print("ready", flush=True)
try:
    {wait}
except KeyboardInterrupt:
    print("interrupted", flush=True)
""")
    assert child.stdout is not None and child.stdout.readline() == "ready\n"
    time.sleep(0.2)
    start = time.monotonic()
    child.send_signal(signal.SIGINT)
    assert child.stdout.readline() == "interrupted\n"
    assert time.monotonic() - start < 1
    child.communicate(timeout=60)
    assert child.returncode == 0


def test_no_port_no_car() -> None:
    code = "import velmora\ntry:\n    velmora.Car('127.0.0.1:1')\nexcept ConnectionError as e:\n    print(type(e).__name__, e.kind)"
    out, _ = run_python(code).communicate(timeout=60)
    assert out == "PortError 3\n"

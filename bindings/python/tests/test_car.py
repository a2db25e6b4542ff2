"""One car, asked for everything."""
import json
import threading

import pytest

import velmora


def test_reads_sensors_by_any_name(car: velmora.Car) -> None:
    speed, coolant, alias = car.read("RPM", "coolant", "AMBIANT_AIR_TEMP")
    assert speed.sensor == "RPM" and speed.unit == "rpm" and speed.pid == "010C" and speed.module == 0x7E8
    assert isinstance(speed.value, float) and speed.value > 0
    assert speed.raw[:2] == b"\x41\x0c" and len(speed.raw) == 4
    assert str(speed) == f"Engine RPM: {speed.value:.0f} rpm"
    assert coolant.unit == "°C" and alias.pid == "0146"
    assert speed.to_dict()["unit"] == "rpm" and speed.datetime.timestamp() == pytest.approx(speed.time)


def test_tells_what_answers_and_what_it_offers(car: velmora.Car) -> None:
    assert [module.id for module in car.modules()] == [0x7E8, 0x7E9]
    sensors = {sensor.key: sensor for sensor in car.sensors() if sensor.module == 0x7E8}
    assert sensors["RPM"].title == "Engine RPM" and sensors["RPM"].pid == "010C"


def test_keeps_silence_refusal_and_nothing_stored_apart(car: velmora.Car) -> None:
    engine, gearbox = car.codes()
    assert engine.lamp is True and engine.name == "ECM"
    confirmed = next(each for each in engine.lists if each.kind == "confirmed")
    assert confirmed.answer == "read" and "P0171" in [code.code for code in confirmed.codes]
    assert "Lean" in next(code for code in confirmed.codes if code.code == "P0171").text
    assert all(each.answer in ("read", "refused", "no answer", "unreadable", "not supported") for each in gearbox.lists)


def test_tells_each_topic(car: velmora.Car) -> None:
    frame = car.freeze_frames()[0]
    assert frame.answer == "read" and frame.code is not None and len(frame.readings) > 3
    assert any(monitor.since_cleared == "complete" for each in car.readiness() for monitor in each.monitors)
    assert any(test.verdict == "passed" for each in car.monitors() for monitor in each.monitors for test in monitor.tests)
    engine = car.info()[0]
    assert engine.vin is not None and len(engine.vin) == 17 and engine.calibrations
    report = car.report()
    assert len(report["modules"]) == 2
    assert json.loads(json.dumps(report)) == report


def test_errors_have_a_kind_a_class_and_hints(car: velmora.Car) -> None:
    with pytest.raises(velmora.WrongUseError) as wrong:
        car.read("no such sensor")
    assert wrong.value.kind == 2 and isinstance(wrong.value, ValueError) and wrong.value.hints
    with pytest.raises(velmora.Error, match="a process has one car|There is a car"):
        velmora.Car("sim:petrol-can11")
    with pytest.raises(velmora.WrongUseError):
        car.freeze_frames(256)


def test_any_thread_may_ask(car: velmora.Car) -> None:
    seen: list[velmora.Reading] = []
    threads = [threading.Thread(target=lambda: seen.extend(car.read("RPM"))) for _ in range(4)]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    assert len(seen) == 4


def test_other_threads_run_while_a_call_waits(car: velmora.Car) -> None:
    ticks = 0
    done = threading.Event()

    def tick() -> None:
        nonlocal ticks
        while not done.wait(0.001):
            ticks += 1

    thread = threading.Thread(target=tick)
    thread.start()
    before = ticks
    car.monitors()
    meanwhile = ticks - before
    done.set()
    thread.join()
    assert meanwhile > 10


def test_readings_make_a_table(car: velmora.Car) -> None:
    pandas = pytest.importorskip("pandas")
    table = pandas.DataFrame([reading.to_dict() for reading in car.read("RPM", "SPEED")])
    assert list(table["sensor"]) == ["RPM", "SPEED"]


def test_explains_codes_beside_a_car_and_without_one(car: velmora.Car) -> None:
    code = velmora.explain("p0420")
    assert code.code == "P0420" and code.meanings[0].maker == "Generic" and "Catalyst" in code.meanings[0].text
    with pytest.raises(velmora.WrongUseError):
        velmora.explain("no code")

"""Clearing, on a car of its own."""
import pytest

import velmora


def confirmed(car: velmora.Car) -> list[str]:
    return [code.code for module in car.codes() for each in module.lists if each.kind == "confirmed"
            for code in each.codes]


def test_units_are_chosen_by_name() -> None:
    for units, label in (("metric", "l/100 km"), ("imperial", "mpg"), ("imperial-uk", "mpg (UK)")):
        with velmora.Car("sim:petrol-can11?instant", units=units, module=0x7E8) as car:  # type: ignore[arg-type]
            assert car.read("F0")[0].unit == label
    with pytest.raises(velmora.WrongUseError, match="metric, imperial or imperial-uk"):
        velmora.Car("sim:petrol-can11?instant", units="UK")  # type: ignore[arg-type]


def test_clears_when_told_what_that_erases() -> None:
    with velmora.Car("sim:petrol-can11?instant", units="imperial", module=0x7E8) as car:
        assert car.read("coolant")[0].unit == "°F"
        assert [module.id for module in car.modules()] == [0x7E8]
        assert any(each.counters for each in car.counters())
        with pytest.raises(velmora.WrongUseError):
            car.clear(erase_readiness=False)
        assert "P0171" in confirmed(car)
        assert "cleared" in [each.result for each in car.clear(erase_readiness=True)]
        assert confirmed(car) == []

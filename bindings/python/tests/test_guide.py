"""The programs of the guide run as they stand there, with a simulated car in the place of a real one."""
import pathlib
import re
import signal
import subprocess
import sys

import pytest

GUIDE = pathlib.Path(__file__).parents[3] / "docs" / "python.md"
PROGRAMS = re.findall(r"^```python\n(.*?)^```$", GUIDE.read_text(), re.MULTILINE | re.DOTALL)
PORT = "sim:petrol-can11?instant"


def whole(program: str) -> str:
    """The program, with what stands around a function that the guide shows alone."""
    if program.startswith("import velmora"):
        return program.replace("192.168.0.10:35000", PORT)
    return f"import asyncio, velmora\n{program}\nwith velmora.Car({PORT!r}) as car:\n    asyncio.run(show(car))\n"


def test_the_guide_has_programs() -> None:
    assert len(PROGRAMS) == 2


@pytest.mark.parametrize("program", PROGRAMS, ids=range(len(PROGRAMS)))
def test_shows_values_until_ctrl_c(program: str) -> None:
    child = subprocess.Popen([sys.executable, "-u", "-c", whole(program)], stdout=subprocess.PIPE, stderr=subprocess.PIPE,
                             text=True)
    assert child.stdout is not None
    watched = r"\d+\.\d+ RPM \d+\.\d+ rpm" if "reading.time" in program else r"Engine RPM: \d+ rpm"
    seen = [child.stdout.readline()]
    while seen[-1] and not re.fullmatch(watched, seen[-1].rstrip()):
        seen.append(child.stdout.readline())
    child.send_signal(signal.SIGINT)
    _, complaint = child.communicate(timeout=60)
    assert seen[-1], f"{seen}\n{complaint}"
    assert complaint.rstrip().endswith("KeyboardInterrupt")
    if "car.codes()" in program:
        assert re.fullmatch(r"Engine RPM: \d+ rpm\n", seen[0]) and re.fullmatch(r"Engine Coolant Temperature: \d+ °C\n", seen[1])
        assert seen[2].startswith("confirmed read ['P0133 O2 Sensor")

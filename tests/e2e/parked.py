"""parked.py PROGRAM: a car is driven, parked and started again, with a real session over TCP. While it is parked no request
may reach its modules: the simulated car counts them. Prints what went wrong; exits 0 if nothing did."""

import json
import os
import subprocess
import sys
import time

import watching
from watching import wait_for

PARKED = 9.0  # seconds that are looked at: longer than any idle connection of the library is left alone

SETTINGS = """port = "%s"
vehicle = "van"
[battery]
stop_after = "2s"
settle = "1s"
voltage_every = "1s"
[[output]]
to = "ndjson:%s"
"""


class Car:
    def __init__(self, program):
        self.process = subprocess.Popen([program, "simulate", "--vehicle", "petrol-can11", "--listen",
                                         "tcp://127.0.0.1:0"], stdin=subprocess.PIPE, stdout=subprocess.PIPE, text=True)
        self.address = self.process.stdout.readline().strip()

    def say(self, line):
        self.process.stdin.write(line + "\n")
        self.process.stdin.flush()


def requests(car):
    """All that its modules were asked: the adapter's own commands begin with AT."""
    car.say("requests")
    count = 0
    for line in iter(car.process.stdout.readline, "ok\n"):
        number, what = line.split(maxsplit=1)
        if what.strip() != "in all" and not what.startswith("AT"):
            count += int(number)
    return count


def events(folder):
    try:
        lines = open(folder + "/out").read().splitlines()
    except FileNotFoundError:
        return []
    return [json.loads(line).get("event") for line in lines]


def run(program, folder, processes):
    car = Car(program)
    processes.append(car.process)
    with open(folder + "/watch.toml", "w") as settings:
        settings.write(SETTINGS % (car.address, folder + "/out"))
    watch = subprocess.Popen([program, "watch", "--config", folder + "/watch.toml", "--settings", folder + "/settings",
                              "--quiet"], env=dict(os.environ, STATE_DIRECTORY=folder))
    processes.append(watch)
    wait_for("the drive", lambda: "engine_start" in events(folder))
    driven = requests(car)
    car.say("engine stop")
    assert car.process.stdout.readline() == "ok\n"
    wait_for("the car to be parked", lambda: "asleep" in events(folder))
    before = requests(car)
    time.sleep(PARKED)
    after = requests(car)
    if not 0 < driven < before or after != before:
        print(f"requests: {driven} in the drive, {before} when it was parked, {after} some seconds later")
        sys.exit(1)
    car.say("engine start")
    assert car.process.stdout.readline() == "ok\n"
    wait_for("the car to wake up", lambda: events(folder).count("engine_start") == 2)
    watching.end(watch)


watching.main(run)

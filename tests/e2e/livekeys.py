#!/usr/bin/env python3
"""Each key of the live view, in tmux: livekeys.py VELMORA

Most of them on a recording that stands still, so that every frame is exact.
"""
import os
import pathlib
import re
import subprocess
import sys
import tempfile
import time

COLUMNS, ROWS = 120, 20
SENSORS = 30


def check(good, what):
    if not good:
        raise AssertionError(f"{what}\n{screen()}")


def tmux(*arguments):
    return subprocess.run(["tmux", "-L", f"velmora-keys-{os.getpid()}-{views}", *arguments], capture_output=True, text=True, timeout=20).stdout


def screen():
    return tmux("capture-pane", "-p")


def begin(command):
    environment = f"env -u NO_COLOR TERM=screen-256color LC_ALL=C.UTF-8 VELMORA_SETTINGS={folder}/settings.toml"
    global views
    tmux("kill-server")
    views += 1  # one that is ending takes no more
    tmux("-f", "/dev/null", "-u", "new-session", "-d", "-x", str(COLUMNS), "-y", str(ROWS),
         f"{environment} {command}; echo ended with $?; exec cat")
    tmux("set-option", "-s", "escape-time", "0")


def press(*keys):
    tmux("send-keys", *keys)


def until_seen(what, *patterns):
    """Waits until all of the patterns are on the screen at once."""
    end = time.monotonic() + 15
    while time.monotonic() < end:
        text = screen()
        if all(re.search(pattern, text, re.M) for pattern in patterns):
            return text
        time.sleep(0.05)
    return check(False, f"{what}: {patterns}")


def record():
    """S01 to S30, of which S01 counts the seconds and each other one is ten more than the one before."""
    lines = ["time," + ",".join(f"S{i:02} (V)" for i in range(1, SENSORS + 1)) + ",Gear"]
    for second in range(60):
        values = ",".join(str(second + 10 * i) for i in range(SENSORS))
        lines.append(f"2024-03-07T09:05:{second:02}.000Z,{values},{'first' if second < 30 else 'second'}")
    (folder / "drive.csv").write_text("\n".join(lines) + "\n")
    for sensor, limit in (("S30", "340"), ("S04", "1")):
        subprocess.run([program, "settings", f"limit.{sensor}", limit], check=True, stdout=subprocess.DEVNULL, timeout=20,
                       env=os.environ | {"VELMORA_SETTINGS": str(folder / "settings.toml")})


def row(sensor, value):
    return rf"^{sensor} +{value} V "


def moves_in_time():
    begin(f"{program} live --play {folder}/drive.csv --speed 0.125")
    until_seen("the beginning", r"0:0\d \[.*\] 0:59 0.125x", "^drive.csv, 31 sensors, 2024-03-07T09:05:0", "^S01.* ! S04")
    press("Space", "End")
    text = until_seen("the end", r"Paused 0:59 \[={20}\] 0:59 0.125x", row("S01", 59))
    check(re.search(r"^S01 +59 V +0 +30 +59", text, re.M), "least, mean and greatest of all")
    check("ended with" not in text and "q quit  ? help  s sensors  u units  b big" in text, "the keys at the bottom")
    press("+")
    until_seen("twice the speed", "0:59 0.25x")
    press("-", "-")
    until_seen("half of it", r"0:59 0.0625x|0:59 0.125x")
    for key, place, value in (("Left", "0:49", 49), ("Left", "0:39", 39), ("Right", "0:49", 49), ("Home", "0:00", 0),
                              ("Left", "0:00", 0), ("End", "0:59", 59), ("Right", "0:59", 59)):
        press(key)
        until_seen(f"{key} leads to {place}", rf"Paused {place} \[", row("S01", value))
    press("u")
    until_seen("units of a recording", "^The units are those of the recording$|The units are those of the recording")
    press("x")
    until_seen("any other key takes the words away", "q quit  ")


def moves_in_the_table():
    """Big digits leave little for the table; without them it has 16 rows."""
    until_seen("big digits", "[▀▄█]{3}")
    press("b")
    end = time.monotonic() + 10
    while re.search("[▀▄█]{3}", screen()) and time.monotonic() < end:
        time.sleep(0.05)
    text = until_seen("the table alone", row("S01", 59), row("S16", 209), r"\(15 more: up and down\)")
    check(not re.search("[▀▄█]{3}", text) and not re.search(r"^S17", text, re.M), "sixteen rows")
    for key, first in (("Down", 2), ("Down", 3), ("Up", 2), ("Up", 1), ("Up", 1), ("PageDown", 16), ("PageUp", 1)):
        press(key)
        shown = min(first, 16)
        until_seen(f"{key} shows S{shown:02} first", rf"Unit.*\nS{shown:02} ")
    press("PageDown", "PageUp", "PageDown")
    until_seen("the last line", "^Gear +second$", r"Unit.*\nS16 ", r"^S30 +!349 V ")
    press("PageUp")
    until_seen("the first line", row("S01", 59))


def holds():
    press("Home", "h")
    until_seen("the screen is held", "Held: h goes on  Paused 0:00")
    press("End")  # a key is drawn for
    until_seen("held still", "Held: h goes on  Paused 0:59")
    press("h")
    until_seen("goes on", "^Paused 0:59|\\) Paused 0:59")


def helps():
    press("?")
    until_seen("help", "^Keys$", "^  q +quit$", "^  s +choose sensors and their order$",
               "^  b +big digits on and off, of the first six sensors$", "^  h, space +hold the screen, and let it go on$",
               "^  up, down +move the table, by pages with page up and down$", "^  space +pause, and go on$",
               r"^  \+ - +twice and half the speed$", "^  left, righ?t? *ten seconds back and on$",
               "^  home, end +to the beginning and the end$", "^Any key goes back$")
    press("q")
    until_seen("back, and not out", row("S01", 59), "q quit  ")


def chooses():
    press("s")
    until_seen("the list", r"^> \[x\] 00 S01$", r"^  \[x\] 01 S02$", "Which sensors, in which order", "esc leaves all as it was")
    for key, at in (("Up", "00 S01"), ("Down", "01 S02"), ("j", "02 S03"), ("k", "01 S02"), ("PageDown", "0B S12"),
                    ("PageUp", "01 S02")):
        press(key)
        until_seen(f"{key} stands on {at}", rf"^> \[x\] {at}$")
    press("Space")
    until_seen("taken out", r"^> \[ \] 01 S02$")
    press("-")
    until_seen("carried down", r"^  \[x\] 02 S03\n> \[ \] 01 S02$")
    press("Up", "+")
    until_seen("carried up", r"^> \[x\] 02 S03\n  \[x\] 00 S01\n  \[ \] 01 S02$")
    press("Enter")
    text = until_seen("as chosen", r"Unit.*\nS03 +79 V .*\nS01 +59 V .*\nS04 ")
    check("S02" not in text and "Paused 0:59" in text, "what was taken out is gone, and the time is the same")
    for leave in ("Escape", "q"):
        press("s", "Space", "Down")
        until_seen("another choice", r"^  \[ \] 02 S03$")
        press(leave)
        until_seen(f"{leave} leaves all as it was", r"Unit.*\nS03 +79 V .*\nS01 ")
    press("q")
    until_seen("the end", "ended with 0")


def plays_what_is_named():
    begin(f"{program} live --play {folder}/drive.csv s02 GEAR")
    until_seen("the two that were named", "^Gear +first$")
    press("Space", "End")
    text = until_seen("the two that were named", r"Paused 0:59", row("S02", 69), "^Gear +second$")
    check("S01" not in text, "and no other")
    press("Q")
    until_seen("the end", "ended with 0")
    begin(f"{program} live --play {folder}/drive.csv nothing")
    until_seen("no such sensor", "ended with 6", 'The recording has no sensor "nothing"')


def changes_how_a_car_is_shown():
    begin(f"XDG_DATA_HOME={folder}/data {program} -p 'sim:petrol-can11?instant' live RPM SPEED --csv {folder}/live.csv")
    until_seen("the car", "^Vehicle Speed")
    for key, why in (("s", "The recording's columns are fixed"), ("p", "The recording's columns are fixed"),
                     ("u", "The recording's units are fixed"), ("x", r"Recording to .*live\.csv  q quit")):
        press(key)
        until_seen(f"{key} while a file is written", why)
    press("q")
    text = until_seen("the end", "ended with 0")
    check(re.search("^Engine RPM .*[▁▂▃▄▅▆▇█]", text, re.M), "the whole table with its trend below the prompt")

    begin(f"XDG_DATA_HOME={folder}/data {program} -p 'sim:petrol-can11?instant' live RPM SPEED")
    until_seen("metric", r"^Vehicle Speed Sensor +\d+ km/h ", r"^sim:petrol-can11\?instant, module 7E8 ECM, \d+ s, [\d.]+ readings/s")
    press("u")
    until_seen("imperial", r"^Vehicle Speed Sensor +\d+ mph ")
    press("Down")
    time.sleep(0.4)  # a frame later
    until_seen("all rows are still there", r"Unit.*\nEngine RPM .*\nVehicle Speed Sensor +\d+ mph ")
    press("r")
    until_seen("anew", "The statistics begin anew")
    press("w")
    until_seen("a recording", "^.*Recording to .*/live-.*db")
    press("u")
    until_seen("no other units", "The recording's units are fixed", "mph")
    press("w", "e", "p")
    until_seen("performance", "0 to 60 mph")
    press("s")
    until_seen("no choice there", "Speed and engine speed alone are read here; p goes back to the values")
    press("e")
    until_seen("nothing to export", "There is no run yet")
    press("p", "u")
    until_seen("metric again", r"^Vehicle Speed Sensor +\d+ km/h ")
    until_seen("big digits", "[▀▄█]{3}")
    press("b", "q")
    until_seen("the end", "ended with 0")
    begin(f"{program} -p 'sim:petrol-can11?instant' live")
    until_seen("the sensors and the plain table of the last time", r"Unit.*\nEngine RPM .*\nVehicle Speed Sensor .*\n\n")
    check(not re.search("[▀▄█]{3}", screen()), "no big digits")
    press("C-c")
    until_seen("Ctrl-C ends it", "ended with (0|130)")


def tells_the_rates_it_reaches():
    begin(f"{program} -p 'sim:petrol-can11?instant' live RPM@5hz SPEED@2hz 05 --rate 1")
    asked = {"RPM": 5, "SPEED": 2, "COOLANT_TEMP": 1}
    end = time.monotonic() + 20
    reached = {}
    while not all(0.8 * hertz <= reached.get(sensor, 0) <= 1.2 * hertz for sensor, hertz in asked.items()):
        check(time.monotonic() < end, f"all three at their rates in the title: {reached}")
        time.sleep(0.1)
        reached = {sensor: float(rate) for sensor, rate, hertz in
                   re.findall(r"(\w+) ([\d.]+) of (\d+) Hz", screen()) if asked.get(sensor) == int(hertz)}
    press("q")
    until_seen("the end", "ended with 0")


program = os.path.realpath(sys.argv[1])
views = 0
start = time.monotonic()
with tempfile.TemporaryDirectory() as place:
    folder = pathlib.Path(place)
    try:
        record()
        moves_in_time()
        moves_in_the_table()
        holds()
        helps()
        chooses()
        plays_what_is_named()
        changes_how_a_car_is_shown()
        tells_the_rates_it_reaches()
    finally:
        tmux("kill-server")
print(f"all keys do what they should; {time.monotonic() - start:.1f} s")

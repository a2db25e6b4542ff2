#!/usr/bin/env python3
"""What velmora's commands print for a person, line by line: commandtexts.py VELMORA"""
import fcntl
import json
import os
import pathlib
import pty
import re
import struct
import subprocess
import sys
import tempfile
import termios
import time

CAR = ["-q", "-p", "sim:petrol-can11?instant"]
SIGNALS = """[vehicle]
maker = "Example"
[[signal]]
id = "GEARBOX_TEMP"
name = "Gearbox oil temperature"
header = "7E1"
request = "221E1C"
formula = "(A*256+B)/16"
unit = "°C"
[[signal]]
id = "OFF"
name = "Switched off"
header = "7E1"
request = "221E20"
formula = "A"
enabled = false
reason = "needs session 03"
"""

# Commands, and lines that stand in this order without any between them.
TEXTS = (
    ([*CAR, "--ecu", "7E9", "info"], """Control module 7E9: TCM
  Description    Transmission Control Module
  Standard       EOBD
  Protocol       ISO 15765-4 (CAN 11/500)
  VIN            -
  Calibration    VS-AT6-0111  verification 5D0C77A1
  Engine number  -
  Type approval  -
  With lamp on   -
  Since cleared  -
"""),
    ([*CAR, "codes", "--confirmed", "--permanent"], """Control module 7E8: ECM
  Lamp           on
  Confirmed      2 codes
    P0133  Generic        O2 Sensor Circuit Slow Response Bank 1 Sensor 1
    P0171  Generic        System Too Lean Bank 1
  Permanent      1 code
    P0133  Generic        O2 Sensor Circuit Slow Response Bank 1 Sensor 1

Control module 7E9: TCM
  Lamp           off
  Confirmed      none stored
  Permanent      none stored
"""),
    ([*CAR, "codes", "--pending"], """Control module 7E8: ECM
  Lamp           on
  Pending        1 code
    P0300  Generic        Random/Multiple Cylinder Misfire Detected

Control module 7E9: TCM
  Lamp           off
  Pending        none stored
"""),
    ([*CAR, "--ecu", "7E8", "monitors"], """Control module 7E8: ECM
  Monitor tests  1 failed, 6 passed, 1 without result
      Result     Test      Value    Minimum    Maximum  Unit  Description
    01 Exhaust Gas Sensor Monitor Bank 1 - Sensor 1
      failed     05        0.096      0.000      0.080  s     Rich to lean sensor switch time (calculated)
      passed     01        0.450      0.400      0.500  V     Rich to lean sensor threshold voltage (constant)
    02 Exhaust Gas Sensor Monitor Bank 1 - Sensor 2
"""),
    ([*CAR, "monitors"], """
Control module 7E9: TCM
  Monitor tests  no answer
"""),
    ([*CAR, "readiness"], """Control module 7E8: ECM
  Lamp           on
  Readiness      2 monitors not complete
    Monitor                  Since cleared  This driving cycle
    Evaporative System       not complete   disabled this cycle
    Oxygen Sensor            not complete   not complete
    Misfire                  complete       complete
    Fuel System              complete       complete
    Comprehensive Component  complete       complete
    Catalyst                 complete       not complete
    Oxygen Sensor Heater     complete       complete
    EGR and/or VVT System    complete       disabled this cycle
    Not available: Heated Catalyst, Secondary Air System, Gasoline Particulate
    Filter

Control module 7E9: TCM
  Lamp           off
  Readiness      ready
"""),
    ([*CAR, "counters"], """Control module 7E8: ECM
  Counters       12 counters above 0
    OBD Monitoring Conditions Encountered Counts                      412
    Ignition Cycle Counter                                            655
"""),
    ([*CAR, "counters"], """
Control module 7E9: TCM
  Counters       not supported
"""),
    ([*CAR, "freeze"], """Control module 7E8: ECM
  Freeze frame   0
    P0133  Generic        O2 Sensor Circuit Slow Response Bank 1 Sensor 1
    Fuel system status: Fuel system A        Closed loop (1)
    Fuel system status: Fuel system B        -
"""),
    ([*CAR, "routines"], """Control module 7E8: ECM
  Routine 01     Evaporative system leak test
    This service enables the conditions required to conduct an evaporative
    system leak test, but does not actually run the test. The vehicle
    manufacturer is responsible to determine the criteria to automatically
    stop the test.
  Routine 02     Particulate Filter Regeneration
"""),
    (["-y", *CAR, "routines", "--run", "01"], """Control module 7E8: ECM
  Routine 01     Evaporative system leak test
  Result         accepted
"""),
    (["-y", *CAR, "clear"], "Control module 7E8 ECM: cleared\nControl module 7E9 TCM: cleared\n"),
    ([*CAR, "sensors"], """  06 monitor tests         01 02 21 3C A2 A3
  08 system control        01 02
  09 vehicle information   02 04 06 08 0A
"""),
    ([*CAR, "sensors"], """  03  Fuel system status: Fuel system A                                   text
      Fuel system status: Fuel system B                                   text
  04  Calculated engine load                                    %         0 to 100
  05  Engine Coolant Temperature                                °C        -40 to 215
"""),
    ([*CAR, "sensors"], """  F7  Boost pressure                                            kPa       0 to 255
  A6  Odometer                                                  km        ODOMETER (recorded)

Control module 7E9: TCM (Transmission Control Module)
"""),
    ([*CAR, "sensors"], """  06 monitor tests         - (not known in full: no answer)
  08 system control        - (not known in full: no answer)
"""),
    (["vin", "1M8GDM9AXKP042788"], """  VIN            1M8GDM9AXKP042788
  Region         North America
  Country        United States
  Maker          -
  Model year     1989 (position 10 is K, position 7 says which cycle of 30 years)
  Check digit    right
"""),
    (["dtc", "P0420", "B1234"], """P0420  Generic        Catalyst System Efficiency Below Threshold Bank 1
B1234  Ford           Mirror Switch Invalid Code
       GM             CD Player On Signal Circuit Open
"""),
    (["signals", "list", "mine.toml"], """mine.toml
  GEARBOX_TEMP  Gearbox oil temperature  7E1  221E1C  °C
  OFF           Switched off             7E1  221E20      off: needs session 03
"""),
    (["signals", "check", "mine.toml"], "mine.toml: 2 signals\n"),
    (["settings", "limit.RPM", "6000"], """Limit of RPM
  In the sensor's metric unit: the highest value, such as 6000, or a range
  such as 11.8..14.8, or none. live marks values outside.
  Value          ..6000
"""),
    (["history"], "Nothing is kept yet; velmora scan --history keeps a scan\n"),
)

# Commands that are refused: their exit code, and how the error begins.
REFUSED = (
    ([*CAR, "--ecu", "7EA", "info"], 6, "velmora: The vehicle has no control module 7EA\n  - these answer: 7E8, 7E9\n"),
    ([*CAR, "--ecu", "XYZ", "info"], 2, 'velmora: "XYZ" is not understood; expected a control module id in hexadecimal'),
    ([*CAR, "clear"], 2, "velmora: Clearing must be confirmed, and there is no terminal to ask\n  - --yes clears without asking\n"),
    (["-y", *CAR, "--ecu", "7E9", "clear"], 2, "velmora: Clearing reaches all control modules; it can't be held to one\n"),
    ([*CAR, "freeze", "1"], 5, "velmora: The vehicle did not answer this\n"),
    (["signals"], 2, "velmora: A subcommand is required\n"),
    (["signals", "check"], 2, "velmora: FILE is required\n"),
    (["history", "show", "7"], 2, "velmora: "),
    (["history", "show", "1", "forget", "X"], 2, "velmora: "),
    (["trips"], 2, "velmora: DB is required\n"),
    (["-P", "0", *CAR, "info"], 2, "velmora: "), (["-P", "10", *CAR, "info"], 2, "velmora: "),
    (["live", "--play", "nowhere.csv"], 1, "velmora: "),
)


def check(good, what):
    if not good:
        raise AssertionError(what)


def run(arguments, **more):
    done = subprocess.run([program, *arguments], stdin=subprocess.DEVNULL, capture_output=True, text=True, timeout=60,
                          cwd=folder, env=environment | more)
    return done.returncode, done.stdout, done.stderr


def printed(*arguments, **more):
    code, out, err = run(arguments, **more)
    check(code == 0, f"{arguments}: exit code {code}, {err}")
    return out


def on_terminal(columns, *arguments):
    """What stands on a terminal of so many columns."""
    parent, child = pty.openpty()
    fcntl.ioctl(child, termios.TIOCSWINSZ, struct.pack("HHHH", 24, columns, 0, 0))
    process = subprocess.Popen([program, *arguments], stdin=subprocess.DEVNULL, stdout=child, stderr=subprocess.DEVNULL,
                               cwd=folder, env=environment | {"NO_COLOR": "1"})
    os.close(child)
    text = b""
    while True:
        try:
            text += os.read(parent, 65536)
        except OSError:
            break
    check(process.wait(60) == 0, f"{arguments}: {text}")
    os.close(parent)
    return text.decode().replace("\r", "")


def prints_these_lines():
    seen = {}
    for arguments, lines in TEXTS:
        if tuple(arguments) not in seen:
            seen[tuple(arguments)] = printed(*arguments)
        out = seen[tuple(arguments)]
        check(out == lines or "\n" + lines in "\n" + out, f"{arguments} prints\n{out}\nwithout\n{lines}")


def refuses():
    for arguments, expected, begin in REFUSED:
        code, out, err = run(arguments)
        check(code == expected and err.startswith(begin) and (out == "" or code != 2), f"{arguments}: {code}\n{out}\n{err}")


def breaks_lines_for_narrow_terminals():
    for command in (["scan", "--no-history"], ["counters"]):
        lines = on_terminal(50, *CAR, *command).splitlines()
        check(max(map(len, lines)) <= 50 and len(lines) > 8, f"{command} in 50 columns: {lines}")
    narrow = on_terminal(50, *CAR, "monitors")
    check("Result     Test" not in narrow and "Rich to lean sensor switch time" in " ".join(narrow.split()),
          f"no table where there is no room for one: {narrow}")
    wide = on_terminal(120, *CAR, "monitors")
    check("      failed     05        0.096      0.000      0.080  s     Rich to lean" in wide, f"the table: {wide}")


def keeps_tells_and_forgets_scans():
    scan = ["-p", "sim:petrol-can11?instant", "-y", "scan", "--history"]
    code, out, err = run(scan)
    check(code == 0 and "\nKept as scan 1 of VELMRAS1MM0000001; velmora diff tells what has changed\n" in err, err)
    code, _, err = run(["-q", "--ecu", "7E8", *scan])
    check(code == 0 and err == "", f"quiet is quiet: {err}")
    stands = r"\d{4}-\d\d-\d\d \d\d:\d\d:\d\d"
    out = printed("history")
    check(re.fullmatch(rf"VELMRAS1MM0000001\n  1  {stands}  lamp on  P0133 P0171\n  2  {stands}  lamp on  P0133 P0171\n", out), out)
    out = printed("history", "show", "1")
    check(re.match(rf"VELMRAS1MM0000001\n  1  {stands}  lamp on  P0133 P0171\n\nAdapter\n  Device         ELM327 v1.5\n", out), out)
    out = printed("diff")
    check(re.fullmatch(rf"VELMRAS1MM0000001\n  scan 1 of {stands}\n  scan 2 of {stands}\n\nChanges\n"
                       r"    7E9 TCM  control module  there -> not there\n", out), out)
    printed("history", "export", "all.ndjson")
    kept = folder / "all.ndjson"
    check(kept.stat().st_mode & 0o777 == 0o600, "for its owner alone")
    check([json.loads(line)["vehicle"] for line in kept.read_text().splitlines()] == ["VELMRAS1MM0000001"] * 2, "both scans")
    check(printed("-y", "history", "forget", "VELMRAS1MM0000001") == "Forgot 2 scans\n", "what is forgotten")
    code, _, err = run(["-y", "history", "forget", "VELMRAS1MM0000001"])
    check(code == 2 and err.startswith("velmora: Nothing is kept of VELMRAS1MM0000001\n"), f"nothing is left: {code} {err}")


def gives_lists_to_programs():
    files = json.loads(printed("--json", "signals", "list", "mine.toml"))
    check([each["id"] for each in files[0]["signals"]] == ["GEARBOX_TEMP", "OFF"], f"the signals: {files}")
    check(files[0]["signals"][1]["enabled"] is False and files[0]["maker"] == "Example", f"the signals: {files}")
    codes = json.loads(printed("--json", "dtc", "P0420", "P1105"))
    check([code["code"] for code in codes] == ["P0420", "P1105"], f"codes: {codes}")
    check(codes[0]["meaning"]["maker"] == "Generic" and codes[1]["meaning"] is None, f"their meanings: {codes}")
    limits = [each for each in json.loads(printed("--json", "settings")) if each["name"] == "limit.RPM"]
    check(len(limits) == 1 and limits[0]["value"] == "..6000", f"the limit among the settings: {limits}")
    check('highest' in limits[0]["range"], f"its range: {limits}")
    printed("settings", "limit.RPM", "none")
    check("limit.RPM" not in printed("--json", "settings"), "no limit any more")


def records_a_dialogue_that_can_be_replayed():
    printed(*CAR, "record", "drive.dialogue")
    text = printed("-q", "-p", "replay:drive.dialogue", "codes")
    check("P0133" in text and "P0171" in text, f"the recorded car: {text}")
    code, _, err = run([*CAR, "record", "drive.dialogue"])
    check(code == 2 and err.startswith("velmora: The file drive.dialogue exists already\n"), f"a file that stands: {code} {err}")


program = os.path.realpath(sys.argv[1])
start = time.monotonic()
with tempfile.TemporaryDirectory() as name:
    folder = pathlib.Path(name)
    (folder / "mine.toml").write_text(SIGNALS)
    environment = os.environ | {"VELMORA_SETTINGS": str(folder / "settings.toml"), "XDG_DATA_HOME": str(folder / "data"),
                                "VELMORA_HISTORY": str(folder / "history.db")}
    prints_these_lines()
    refuses()
    breaks_lines_for_narrow_terminals()
    keeps_tells_and_forgets_scans()
    gives_lists_to_programs()
    records_a_dialogue_that_can_be_replayed()
print(f"the commands print what they should; {time.monotonic() - start:.1f} s")

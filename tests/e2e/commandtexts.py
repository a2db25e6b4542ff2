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

sys.dont_write_bytecode = True
from commandlines import CAR, REFUSED, SIGNALS, TEXTS  # noqa: E402


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


def writes_files_without_standard_input():
    done = subprocess.run(["sh", "-c", 'exec "$0" history export none.ndjson <&-', program], capture_output=True, text=True,
                          timeout=60, cwd=folder, env=environment | {"VELMORA_HISTORY": str(folder / "no.db")})
    check(done.stdout == "Exported 0 scans to none.ndjson\n", f"what is opened first is 0 there: {done.stderr}")


def gives_lists_to_programs():
    files = json.loads(printed("--json", "signals", "list", "mine.toml"))
    check([each["id"] for each in files[0]["signals"]] == ["GEARBOX_TEMP", "OFF"], f"the signals: {files}")
    check(files[0]["signals"][1]["enabled"] is False and files[0]["maker"] == "Example", f"the signals: {files}")
    report = json.loads(printed("--json", *CAR, "--ecu", "7E8", "scan", "--no-history"))
    values = {each["pid"]: each for each in report["modules"][0]["values"]}
    check(float(values["05"]["value"]) in values["05"]["samples"], f"whole degrees, and what they were made of: {values}")
    codes = json.loads(printed("--json", "dtc", "P0420", "P1105"))
    check([code["code"] for code in codes] == ["P0420", "P1105"], f"codes: {codes}")
    check(codes[0]["meaning"]["maker"] == "Generic" and codes[1]["meaning"] is None, f"their meanings: {codes}")
    limits = [each for each in json.loads(printed("--json", "settings")) if each["name"] == "limit.RPM"]
    check(len(limits) == 1 and limits[0]["value"] == "..6000", f"the limit among the settings: {limits}")
    check('highest' in limits[0]["range"], f"its range: {limits}")
    code, ports, err = run(["--json", "ports"])
    check(code == 0 and isinstance(json.loads(ports), list), f"the ports: {ports}")
    check("No Bluetooth: The Bluetooth service can't be asked" in err, f"there is no message bus: {err}")
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
                                "VELMORA_HISTORY": str(folder / "history.db"),
                                "DBUS_SYSTEM_BUS_ADDRESS": "unix:path=/nonexistent"}
    prints_these_lines()
    refuses()
    breaks_lines_for_narrow_terminals()
    keeps_tells_and_forgets_scans()
    writes_files_without_standard_input()
    gives_lists_to_programs()
    records_a_dialogue_that_can_be_replayed()
print(f"the commands print what they should; {time.monotonic() - start:.1f} s")

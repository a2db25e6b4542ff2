#!/usr/bin/env python3
"""What the command line of velmora is good for beside reading a car: commandline.py VELMORA

Completion, the ends of the ranges of options, the question whether scans are kept, what live, log and settings print, and
that what --json tells stands in the text as well.
"""
import json
import os
import pathlib
import pty
import re
import select
import subprocess
import sys
import tempfile
import time

CAR = ["-q", "-p", "sim:petrol-can11?instant"]
EXIT_WRONG_USE = 2


def check(good, what):
    if not good:
        raise AssertionError(what)


def run(*arguments, **environment):
    done = subprocess.run([program, *arguments], stdin=subprocess.DEVNULL, capture_output=True, text=True, timeout=60,
                          env=os.environ | {"VELMORA_SETTINGS": str(folder / "settings.toml")} | environment)
    return done.returncode, done.stdout, done.stderr


def printed(*arguments, **environment):
    code, out, err = run(*arguments, **environment)
    check(code == 0, f"{arguments}: exit code {code}, {err}")
    return out


def on_terminal(arguments, question, answer, **environment):
    """What stands on a terminal on which somebody answers a question, if it is asked, and the exit code."""
    parent, child = pty.openpty()
    process = subprocess.Popen([program, *arguments], stdin=child, stdout=child, stderr=child, start_new_session=True,
                               env=os.environ | {"VELMORA_SETTINGS": str(folder / "settings.toml")} | environment)
    os.close(child)
    text, asked, end = "", False, time.monotonic() + 60
    while time.monotonic() < end:
        if select.select([parent], [], [], 0.1)[0]:
            try:
                part = os.read(parent, 4096)
            except OSError:
                break
            text += part.decode("utf-8", "replace")
        if question in text and not asked:
            asked = True
            time.sleep(0.3)  # what is typed before the question is there is thrown away
            os.write(parent, answer.encode())
    code = process.wait(10)
    os.close(parent)
    return text.replace("\r", ""), asked, code


def completes():
    for words, wanted, others in (
            (["sc"], ["scan"], ["live"]), (["--un"], ["--units"], ["--port"]), (["-u", ""], ["metric", "imperial"], ["scan"]),
            (["-p", "sim:pe"], ["sim:petrol-can11"], ["auto"]), (["-p", "a"], ["auto"], []), (["--color", ""], ["never"], []),
            (["live", "RP"], ["RPM"], ["SPEED"]), (["live", "al"], ["all"], []), (["dtc", "P042"], ["P0420"], ["P0430"]),
            (["dtc", "p042"], ["P0420"], ["P0430"]), (["dtc", "P0"], [], ["P0420"]), (["dtc", "--make", "For"], ["Ford"], ["Fiat"]),
            (["watch", "--output", "nd"], ["ndjson:"], ["csv:"]), (["simulate", "--listen", ""], ["pty"], []),
            (["simulate", "--vehicle", "die"], ["diesel-can29"], ["petrol-can11"]), (["simulate", "--drive", ""], ["town"], []),
            (["simulate", "--adapter", "st"], ["stn2120"], ["elm327-v1.5"])):
        offered = [line.split("\t")[0] for line in printed("__complete", *words).splitlines()]
        check(all(word in offered for word in wanted) and not set(others) & set(offered), f"{words} offers {offered}")
    check(printed("__complete", "live", "RP").startswith("RPM\tPID 0C\n"), "a sensor with its PID")
    pages = folder / "manual"
    pages.mkdir()
    printed("__manual", str(pages))
    names = {page.name for page in pages.iterdir()}
    check({"velmora.1", "velmora-scan.1"} <= names, f"the manual pages: {names}")


def holds_ranges():
    """Each option takes what stands at the ends of its range, and refuses what is beyond as wrong use. The car, which is
    looked for later, is not there."""
    for options, good, wrong in (
            (["info", "-b"], ("300", "4000000"), ("299", "4000001")), (["live", "RPM", "--pids"], ("1", "6"), ("0", "7")),
            (["live", "--duration"], ("0.001",), ("0",)), (["live", "-n"], ("1", "1000000000"), ("0", "1000000001")),
            (["log", "--duration"], ("0.001",), ("0",)), (["log", "-n"], ("1", "1000000000"), ("0", "1000000001")),
            (["freeze"], ("0", "255"), ("256",)), (["scan", "--model-year"], ("1980", "2100"), ("1979", "2101"))):
        for value in good:
            code, _, err = run("-p", "sim:no-such-car", *options, value)
            check(code == 3, f"{options} {value}: {code}, {err}")
        for value in wrong:
            code, _, err = run("-p", "sim:no-such-car", *options, value)
            check(code == EXIT_WRONG_USE and err.startswith("velmora: "), f"{options} {value} is taken: {code}, {err}")
    for wrong in (["simulate", "--control", "65536"], ["simulate", "--control", "-1"], ["watch", "--mask-vin", "half"],
                  ["live", "--speed", "1"], [*CAR, "live", "--rate", "fast", "RPM"]):
        code, _, err = run(*wrong)
        check(code == EXIT_WRONG_USE, f"{wrong} is taken: {code}, {err}")


def asks_once_whether_scans_are_kept():
    question = "Keep this scan and those to come?"
    scan = ["-p", "sim:petrol-can11?instant", "scan"]
    kept = {"VELMORA_HISTORY": str(folder / "history.db")}
    settings = {"VELMORA_SETTINGS": str(folder / "asked.toml")}

    def count():
        return len(json.loads(printed("--json", "history", **kept))) if (folder / "history.db").exists() else 0

    _, asked, code = on_terminal(["-y", *scan], question, "y\n", **kept, **settings)
    check(not asked and code == 0 and count() == 0, "who wants no questions is not asked, and nothing is kept")
    text, asked, code = on_terminal(scan, question, "y\n", **kept, **settings)
    check(asked and code == 0 and count() == 1, f"the question, and its yes: {text[-300:]}")
    check("Kept as scan 1 of VELMRAS1MM0000001" in text, f"what was kept: {text[-300:]}")
    _, asked, _ = on_terminal(scan, question, "n\n", **kept, **settings)
    check(not asked and count() == 2, "the yes is remembered")
    _, asked, _ = on_terminal([*scan, "--no-history"], question, "y\n", **kept, **settings)
    check(not asked and count() == 2, "not this one")
    settings = {"VELMORA_SETTINGS": str(folder / "refused.toml")}
    text, asked, _ = on_terminal(scan, question, "n\n", **kept, **settings)
    check(asked and count() == 2 and "Nothing is kept" in text, "the no")
    _, asked, _ = on_terminal(scan, question, "y\n", **kept, **settings)
    check(not asked and count() == 2, "the no is remembered")
    kept["VELMORA_HISTORY"] = "/proc/nonexistent/history.db"
    code, _, err = run(*scan, "--history", **kept)
    check(code == 1 and "The scan is not kept" in err, f"a history that can't be written: {code}, {err}")


TOLD = {"id", "name", "code", "vin", "value", "minimum", "maximum", "verification", "sinceCleared", "thisCycle", "test"}


def told(value, key=""):
    """The texts of a document that a person must find, too."""
    if isinstance(value, dict):
        return [leaf for name, each in value.items() for leaf in told(each, name)]
    if isinstance(value, list):
        return [leaf for each in value for leaf in told(each, key)]
    return [value] if isinstance(value, str) and key in TOLD else []


def tells_in_text_what_json_tells():
    for car, commands in (("petrol-can11", ("codes", "freeze", "readiness", "monitors", "counters", "info", "routines")),
                          ("petrol-iso9141", ("oxygen", "counters"))):
        for command in commands:
            line = ["-q", "-p", f"sim:{car}?instant", "--ecu", "all", command]
            code, document, _ = run("--json", *line)
            text_code, text, _ = run(*line)
            check(code in (0, 6) and text_code == code, f"{line}: exit codes {code} and {text_code}")
            text = " ".join(text.split()).lower()
            for leaf in told(json.loads(document)) if code == 0 else []:
                check(" ".join(leaf.lower().split()) in text, f"{line} does not tell {leaf!r}:\n{text}")


def shows_traffic_in_whole_lines():
    for form in ([], ["--json"]):
        lines = printed(*CAR, *form, "log", "-n", "5", "RPM").splitlines()
        entries = [json.loads(line) for line in lines] if form else [
            re.fullmatch(r"(?P<time>\d\d:\d\d:\d\d) (?P<direction>>>|<<) (?P<data>.+)", line) for line in lines]
        check(all(entries) and len(entries) > 20, f"each line of the traffic: {lines[-5:]}")
        sent = [entry["data"] for entry in entries if entry["direction"] in (">>", "sent")]
        check("010C" in sent and "ATI" in sent, f"what was sent: {sent}")


def tells_of_each_module_and_of_what_it_remembers():
    check("\n\nControl module 7E9: TCM" in printed(*CAR, "--ecu", "all", "sensors"), "an empty line between modules")
    car = ["-p", "sim:petrol-can11-modules?instant", "modules"]
    found, known = run(*car), run(*car)
    check(found[0] == 0 and "28400-S1004" in found[1] and "are remembered" not in found[2], f"the modules: {found}")
    check(known[:2] == found[:2] and "These are remembered of this vehicle" in known[2], f"once more: {known}")


def stops_after_as_many_readings_as_wished():
    for count in (1, 3):
        lines = printed(*CAR, "live", "-n", str(count), "--csv", "-", "RPM").splitlines()
        check(len(lines) == count + 1, f"the names and {count} rows: {lines}")


def forgets_only_what_is_confirmed():
    kept = {"VELMORA_HISTORY": str(folder / "forgotten.db")}
    printed(*CAR, "scan", "--history", **kept)
    text, asked, _ = on_terminal(["history", "forget", "VELMRAS1MM0000001"], "Forget them?", "n\n", **kept)
    check(asked and len(json.loads(printed("--json", "history", **kept))) == 1, f"the no: {text}")
    text, asked, _ = on_terminal(["history", "forget", "VELMRAS1MM0000001"], "Forget them?", "Y\n", **kept)
    check(asked and not json.loads(printed("--json", "history", **kept)), f"the yes: {text}")


def keeps_settings():
    listed = printed("settings")
    check(re.search(r"^  displacement +2\.00 l +0\.05 to 30\.00$", listed, re.M), f"the settings: {listed}")
    for name, value, shown in (("displacement", "1.6", "1.60 l"), ("displacement", "0.05", "0.05 l"), ("displacement", "30", "30.00 l"),
                               ("efficiency", "80", "80 %"), ("weight", "1", "1 kg"), ("weight", "60000", "60000 kg"),
                               ("ignition", "compression", "compression"), ("units", "imperial", "imperial")):
        printed("settings", name, value)
        check(re.search(rf"^  {name} +{re.escape(shown)}", printed("settings"), re.M), f"{name} is {shown}")
    for name, value in (("displacement", "0.04"), ("displacement", "30.01"), ("efficiency", "101"), ("weight", "0"),
                        ("weight", "60001"), ("weight", "much"), ("ignition", "steam"), ("colour", "1")):
        code, _, err = run("settings", name, value)
        check(code == EXIT_WRONG_USE and err.startswith("velmora: "), f"{name} {value}: {code}, {err}")


program = sys.argv[1]
start = time.monotonic()
with tempfile.TemporaryDirectory() as name:
    folder = pathlib.Path(name)
    completes()
    holds_ranges()
    asks_once_whether_scans_are_kept()
    tells_in_text_what_json_tells()
    shows_traffic_in_whole_lines()
    keeps_settings()
    tells_of_each_module_and_of_what_it_remembers()
    stops_after_as_many_readings_as_wished()
    forgets_only_what_is_confirmed()
print(f"the command line is as it should be; {time.monotonic() - start:.1f} s")

#!/usr/bin/env python3
"""Runs what README and the guides tell to type, each command in a folder of its own: guides.py VELMORA SOURCE_FOLDER

Simulated cars and this machine stand in for the ports and hosts that are told. What goes on until it is told to end is
interrupted once it has said or written something.
"""
import concurrent.futures
import os
import pathlib
import re
import shlex
import shutil
import signal
import subprocess
import sys
import tempfile
import time

CAR = "sim:petrol-can11?instant"
STANDS = "sim:petrol-can11-modules?instant&scenario=stands"

# What stands in for ports, hosts and files. The ports of listeners are left to the system, and few identifiers are asked.
INSTEAD = (
    (r"/dev/ttyUSB0|192\.168\.0\.10:35000", shlex.quote(CAR)),
    (r"\bsim:petrol-can11(?= )", shlex.quote(CAR)),
    (r"broker\.example/", "127.0.0.1:1/"),
    (r"0\.0\.0\.0:8722|127\.0\.0\.1:(8722|9109)", "127.0.0.1:0"),
    (r"dash$", "dash --listen 127.0.0.1:0"),
    (r"dash --play", "dash --listen 127.0.0.1:0 --play"),
    (r"--module 7E0$", "--module 7E0 --from F186 --to F18A"),
    (r"import FILE", "import pids.csv"),
    (r"\bFILE\.\.\.", "gearbox.toml"),
)

# How a command ends that is not done in the end: no adapter is here, and what ran on was interrupted.
ENDS = {"bt://": 3, "ble://": 3, "ports pair": 3}
RUNS_ON = r" (dash|simulate)\b| (live|watch)\b(?!.*(--play \S+\.(csv|db)|--check-config))"
INTERRUPTED = (0, 130)

PIDS = "Name,ShortName,ModeAndPID,Equation,Min Value,Max Value,Units,Header\nGearbox,GBX,221E1C,A-40,-40,215,C,7E1\n"


def commands_of(guide):
    """The commands in a guide's blocks of code, without what is said beside them."""
    fenced = False
    for line in guide.read_text().splitlines():
        fenced ^= line.startswith("```")
        if match := re.match(r"(    )?(?:build/default/program/)?(velmora .*)", line):
            if fenced or match[1]:
                yield re.split(r"  +|\s+#", match[2])[0]


def signal_file(guide):
    """The example of a signal file, as the guide on signals has it, for any vehicle."""
    example = re.search(r"^```toml\n(\[vehicle\].*?)^```$", guide.read_text(), re.MULTILINE | re.DOTALL)[1]
    return re.sub(r"^vin = .*\n", "", example, flags=re.MULTILINE)


def environment_of(folder, port):
    return {"PATH": f"{program.parent}:/usr/bin:/bin", "HOME": str(folder), "XDG_CONFIG_HOME": f"{folder}/config",
            "XDG_DATA_HOME": f"{folder}/data", "XDG_STATE_HOME": f"{folder}/state", "VELMORA_PORT": port,
            "DBUS_SYSTEM_BUS_ADDRESS": "unix:path=/nonexistent",
            **{key: value for key, value in os.environ.items() if key.endswith("SAN_OPTIONS")}}


def written_by(command, folder):
    """The files that a command is told to write."""
    told = re.findall(r"(?:--report|--csv|record|>|--output sqlite:) ?([\w.]+)", command)
    return [folder / name for name in told]


def ended(process, folder, command, said):
    """Waits for the end of a command, which is asked for once one that runs on has shown that it runs."""
    deadline = time.monotonic() + 60
    runs_on = re.search(RUNS_ON, command)
    while process.poll() is None and time.monotonic() < deadline:
        if runs_on and (os.stat(said[0].name).st_size or "running" in pathlib.Path(said[1].name).read_text()):
            if all(file.exists() and file.stat().st_size for file in written_by(command, folder)):
                process.send_signal(signal.SIGINT)
                runs_on = None
        time.sleep(0.02)
    process.kill()
    return process.wait()


def here(command):
    """The command with what stands in for what is not here."""
    for pattern, instead in INSTEAD:
        command = re.sub(pattern, lambda _: instead, command)
    return command


def run(command, folder):
    """Runs a command in a folder; None, or what is wrong."""
    for file in written_by(command, folder):
        file.unlink(missing_ok=True)
    with tempfile.NamedTemporaryFile("w") as out, tempfile.NamedTemporaryFile("w") as err:
        process = subprocess.Popen(["sh", "-c", f"exec {command}"], cwd=folder, stdin=subprocess.DEVNULL, stdout=out,
                                   stderr=err, env=environment_of(folder, STANDS if " probe " in command else CAR))
        code = ended(process, folder, command, (out, err))
        told = pathlib.Path(err.name).read_text()
    expected = [code for words, code in ENDS.items() if words in command] or \
        (INTERRUPTED if re.search(RUNS_ON, command) else [0])
    if code not in expected:
        return f"{command}\n  ends with {code}: {told}"
    missing = [file.name for file in written_by(command, folder) if not file.exists() or file.stat().st_size == 0]
    return f"{command}\n  writes no {missing}" if missing else None


def run_apart(command):
    """The same in a copy of what was prepared."""
    with tempfile.TemporaryDirectory() as name:
        return run(command, pathlib.Path(shutil.copytree(prepared, f"{name}/copy")))


def prepare(pool):
    """What the commands find: files of signals and settings, two kept scans, and recordings by the program itself."""
    (prepared / "gearbox.toml").write_text(signal_file(source / "docs/signals.md"))
    (prepared / "pids.csv").write_text(PIDS)
    (prepared / "stands").write_text("0 hold speed 0\n")
    shutil.copy(source / "packaging/watch.toml", prepared)
    scan = "velmora scan --history"
    makers = ("record car.dialogue", "live RPM SPEED --csv drive.csv", "watch --output sqlite:car.db")
    others = pool.map(lambda each: run(f"velmora {each}", prepared), makers)
    report([run(scan, prepared), run(scan, prepared), *others])


def report(results):
    wrong = [result for result in results if result]
    if wrong:
        sys.exit("\n".join(wrong))


program, source = (pathlib.Path(path).resolve() for path in sys.argv[1:])
guides = [source / "README.md", *sorted((source / "docs").glob("**/*.md"))]
commands = list(dict.fromkeys(here(command) for guide in guides for command in commands_of(guide)))
assert len(commands) > 35, commands
with tempfile.TemporaryDirectory() as name, concurrent.futures.ThreadPoolExecutor(12) as pool:
    prepared = pathlib.Path(name)
    prepare(pool)
    report(pool.map(run_apart, commands))
print(f"{len(commands)} commands do what the guides tell")

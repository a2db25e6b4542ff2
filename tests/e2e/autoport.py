"""autoport.py PROGRAM: `live` and `dash` look for the adapter themselves, where one serial port is its and another is
that of something else. Prints what went wrong; exits 0 if nothing did.

It runs where only it sees its ports: /dev and the list of terminals are of its own."""

import json
import os
import subprocess
import sys
import tempfile
import urllib.request

PROGRAM = os.path.realpath(sys.argv[1])
LIMIT = 60.0  # seconds that each step may take
AUTO = ["--port", "auto", "--baud", "38400"]  # the other rates would be tried on the other thing, too
SETUP = r"""
set -e
mkdir "$0"/dev "$0"/tty "$0"/tty/ttyUSB6 "$0"/tty/ttyUSB7
mount --rbind /dev "$0"/dev
mount -t tmpfs none /dev
for each in null zero random urandom tty; do touch /dev/$each; mount --bind "$0"/dev/$each /dev/$each; done
mkdir /dev/pts
mount --rbind "$0"/dev/pts /dev/pts
mount --bind "$0"/tty /sys/class/tty
exec "$@"
"""


def check(what, truth):
    if not truth:
        print(what)
        sys.exit(1)


def first_line(process):
    line = process.stdout.readline().strip()
    check("the program says nothing", line)
    return line


def with_own_ports(adapter, other):
    """Runs this script again where these two are the serial ports."""
    with tempfile.TemporaryDirectory() as folder:
        rights = "-m" if os.geteuid() == 0 else "-Urm"
        return subprocess.call(["unshare", rights, "bash", "-c", SETUP, folder, sys.executable, __file__,
                                sys.argv[1], adapter, other])


def environment(folder):
    return dict(os.environ, STATE_DIRECTORY=folder, VELMORA_SETTINGS=folder + "/settings.toml")


def live(folder):
    run = subprocess.run([PROGRAM, *AUTO, "live", "RPM", "-n", "2"], env=environment(folder),
                         capture_output=True, text=True, timeout=LIMIT, check=False)
    check(f"live ended with {run.returncode}: {run.stderr}", run.returncode == 0)
    check(f"live does not tell where it looks: {run.stderr}", "Trying /dev/ttyUSB7" in run.stderr)
    check(f"live gives no values: {run.stdout}", run.stdout.count("Engine RPM: ") == 2)
    with open(folder + "/settings.toml", encoding="utf-8") as file:
        check("the port that was found is not remembered", "/dev/ttyUSB7" in file.read())


def events(link):
    """The data of the page's events."""
    with urllib.request.urlopen(link + "events", timeout=LIMIT) as stream:
        for line in stream:
            if line.startswith(b"data: "):
                yield json.loads(line[6:])


def dash(folder):
    page = subprocess.Popen([PROGRAM, *AUTO, "dash", "--listen", "127.0.0.1:0"], env=environment(folder),
                            stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True)
    try:
        for event in events(first_line(page)):
            if any(row[0] == "7E8/RPM" and row[2] > 0 for row in (event or {}).get("v", [])):
                break
    finally:
        page.terminate()
    check("dash ends", page.wait(LIMIT) == 0)


def nothing(folder):
    """Where only the other thing is left."""
    os.remove("/dev/ttyUSB7")
    run = subprocess.run([PROGRAM, *AUTO, "live", "RPM", "-n", "1"], env=environment(folder),
                         capture_output=True, text=True, timeout=LIMIT, check=False)
    check(f"live without an adapter ended with {run.returncode}: {run.stderr}", run.returncode == 3)
    check(f"live does not tell of the other port: {run.stderr}", "/dev/ttyUSB6" in run.stderr)


def inside(adapter, other):
    os.symlink(adapter, "/dev/ttyUSB7")
    os.symlink(other, "/dev/ttyUSB6")
    with tempfile.TemporaryDirectory() as folder:
        live(folder)
        dash(folder)
        nothing(folder)


def outside():
    car = subprocess.Popen([PROGRAM, "simulate", "--vehicle", "petrol-can11", "--listen", "pty"],
                           stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True)
    deaf = os.openpty()
    try:
        return with_own_ports(first_line(car), os.ttyname(deaf[1]))
    finally:
        car.terminate()
        car.wait(LIMIT)


if len(sys.argv) > 2:
    inside(sys.argv[2], sys.argv[3])
else:
    sys.exit(outside())

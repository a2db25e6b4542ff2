#!/usr/bin/env python3
"""What the command line of obdsim is good for: commandline.py PROGRAM

Serves a fleet with all that can be asked for, a recorded dialogue, and refuses what can't be served.
"""
import os
import pathlib
import re
import signal
import socket
import subprocess
import sys
import tempfile
import time

ROOT = pathlib.Path(__file__).resolve().parents[2]
OPTIONS = ["--listen", "--vehicle", "--replay", "--adapter", "--fault", "--scenario", "--drive", "--write-scenario",
           "--control", "--fleet", "--trace", "--list"]


def check(good, what):
    if not good:
        raise AssertionError(what)


class Line:
    """A connection to a served address."""

    def __init__(self, address):
        host, port = address.rsplit(":", 1)
        self.socket = socket.create_connection((host.strip("[]"), int(port)), 10)
        self.socket.settimeout(10)

    def ask(self, text, end):
        self.socket.sendall(text.encode())
        reply = b""
        while not reply.endswith(end):
            part = self.socket.recv(4096)
            check(part, f"the line ends behind {reply!r}")
            reply += part
        return reply.decode("latin-1")


class Served:
    """obdsim at work; `lines` are the first that it prints."""

    def __init__(self, lines, *arguments):
        self.process = subprocess.Popen([program, *arguments], stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                                        stderr=subprocess.PIPE, text=True)
        self.lines = [self.process.stdout.readline().strip() for _ in range(lines)]

    def type(self, line):
        self.process.stdin.write(line + "\n")
        self.process.stdin.flush()
        return self.process.stdout.readline().strip()

    def end(self, with_signal=signal.SIGTERM):
        self.process.send_signal(with_signal)
        _, told = self.process.communicate(timeout=10)
        return self.process.returncode, told


def run(*arguments):
    done = subprocess.run([program, *arguments], stdin=subprocess.DEVNULL, capture_output=True, text=True, timeout=20)
    return done.returncode, done.stdout, done.stderr


def tells_of_itself():
    code, told, _ = run("--help")
    check(code == 0 and all(option + " " in told for option in OPTIONS), f"the help: {told}")
    code, told, _ = run("--list")
    for title, member in (("Vehicles", "petrol-can11"), ("Adapters", "elm327-v1.5"), ("Drives", "town"),
                          ("Faults", "cut@BYTE"), ("Control lines", "ignition on|off")):
        section = told[told.index(title + ":\n"):].split("\n")[1:]
        members = [each.strip() for each in section[:next((i for i, each in enumerate(section) if each[:1] != " "))]]
        check(code == 0 and any(each.startswith(member) for each in members), f"{title} of the list: {members}")
    code, told, err = run("__complete", "--ve")
    check(code == 0 and "--vehicle\t" in told and not err, "completion of an option")
    for option, word in (("--drive", "motorway"), ("--vehicle", "petrol-can11"), ("--adapter", "stn2120"), ("--listen", "pty")):
        check(word in run("__complete", option, "")[1].split("\n"), f"completion behind {option}")
    with tempfile.TemporaryDirectory() as folder:
        code, _, _ = run("__manual", folder)
        pages = [page.read_text() for page in pathlib.Path(folder).iterdir()]
    check(code == 0 and any(".TH" in page and "fleet" in page for page in pages), f"the manual page: {pages}")


def refuses():
    for arguments in (["--fleet", "0"], ["--fleet", "2001"], ["--fleet", "x"], ["--listen", "nowhere"], ["--control", "65536"],
                      ["--control", "-1"], ["--listen", "tcp://:1"], ["--listen", "tcp://127.0.0.1:1x"],
                      ["--listen", "tcp://127.0.0.1"], ["--listen", "tcp://127.0.0.1:"],
                      ["--listen", "tcp://127.0.0.1:65536"], ["--listen", "tcp://"], ["--vehicle", "no-such-car"], ["--adapter", "no-such"],
                      ["--replay", "/no/such/file"], ["--drive", "no-such"], ["--scenario", "/no/such/file"],
                      ["--trace", "/no/such/folder/x"], ["--fault", "fire=1"], ["--no-such"]):
        code, told, why = run(*(["--listen", "tcp://127.0.0.1:0"] if arguments[0] != "--listen" else []), *arguments)
        check(code == 2 and why and not re.search(r"\d+:\d+|127", told), f"{arguments}: {code}, {told}{why}")
    with socket.socket() as taken:
        taken.bind(("127.0.0.1", 0))
        taken.listen()
        port = taken.getsockname()[1]
        code, _, why = run("--listen", f"tcp://127.0.0.1:{port}")
        check(code == 1 and f"127.0.0.1:{port}" in why, f"a port in use: {code}, {why}")
        code, _, why = run("--listen", "tcp://127.0.0.1:0", "--control", str(port))
        check(code == 1 and f"control lines on 127.0.0.1:{port}" in why, f"a control port in use: {code}, {why}")


def serves_a_fleet(folder):
    trace, written, scenario = folder / "trace", folder / "written", folder / "scenario"
    scenario.write_text("0 voltage 11.1\n")
    fleet = Served(3, "--listen", "tcp://127.0.0.1:0", "--fleet", "2", "--control", "0", "--vehicle", "petrol-can11",
                   "--adapter", "elm327-v2.3", "--scenario", str(scenario), "--drive", "cold-start", "--trace", str(trace),
                   "--write-scenario", str(written), "--fault", "error:BUS BUSY@4")
    first, second = Line(fleet.lines[0]), Line(fleet.lines[1])
    check(fleet.lines[2].startswith("control 127.0.0.1:"), f"the control address: {fleet.lines}")
    for line in (first, second):
        check(line.ask("ATE0\r", b">") == "ATE0\rOK\r\r>" and line.ask("ATI\r", b">") == "ELM327 v2.3\r\r>", "the adapter")
        check(line.ask("ATRV\r", b">") == "11.1V\r\r>", "the scenario")
        check(line.ask("ATI\r", b">") == "BUS BUSY\r\r>", "the fault")
        check("SEARCHING" in line.ask("0100\r", b">"), "the search")
        told = line.ask("01461\r", b">")
        check(told == "41 46 21 \r\r>", f"the drive's weather: {told}")
    control = Line(fleet.lines[2].split()[1])
    check(control.ask("voltage 12.2\r\n", b"\n") == "ok\n", "a control line")
    check(control.ask("voltage high\n", b"\n").startswith("error: line 2, word 2 is \"high\""), "a wrong one")
    second.ask("ATDPN\r", b">")
    reply = control.ask("requests\n", b"ok\n")
    check(re.match(r"6 in all\n(\d+ \w+\n)+ok\n$", reply) and "ATDPN" not in reply, f"what the first car was asked: {reply}")
    long = Line(fleet.lines[2].split()[1])
    check(long.ask("#" + "x" * 4094 + "\n", b"\n") == "ok\n", "a line of 4096 characters")
    long.socket.sendall(b"#" + b"x" * 4095 + b"\n")
    try:
        check(long.socket.recv(64) == b"", "a longer one ends its client")
    except ConnectionResetError:
        pass
    check(fleet.type("\nhold speed 90") == "ok", "standard input")
    check(second.ask("ATRV\r", b">") == "12.2V\r\r>" and second.ask("010D1\r", b">") == "41 0D 5A \r\r>", "both take effect")
    fleet.process.stdin.write("nonsense\n")
    fleet.process.stdin.flush()
    check("error: line 3, word 1 is \"nonsense\"" in fleet.process.stderr.readline(), "a wrong line of standard input")
    check(fleet.end() == (0, ""), "the end")
    check([line.split(" ", 1)[1] for line in written.read_text().splitlines()][-2:] == ["voltage 12.2", "hold speed 90"],
          f"the scenario that was written: {written.read_text()}")
    lines = [re.match(r"(\d+\.\d{6}) ([12]) ([<>]) (.*)$", line) for line in trace.read_text().splitlines()]
    check(all(lines), "each line of the trace")
    for car in "12":
        said = [line[3] + line[4] for line in lines if line[2] == car]
        check("".join(each[1:] for each in said if each[0] == ">").startswith("ATE0\\rATI\\r"), f"what car {car} was asked: {said}")
        check(any(each.startswith("<ELM327 v2.3\\r") for each in said), f"what car {car} said: {said}")


def serves_the_rest(folder):
    recording = ROOT / "tests" / "dialogues" / "kwpfast-van-2005-stn.dialogue"
    replay = Served(2, "--listen", "tcp://[::1]:0", "--replay", str(recording), "--control", "0", "--write-scenario", str(folder / "no"))
    check(replay.lines[0].startswith("[::1]:"), f"an address of IPv6: {replay.lines}")
    line = Line(replay.lines[0])
    line.ask("ATE0\r", b">")
    check("86F1124100983B2013D0" in line.ask("0100\r", b">"), "the recording")
    told = Line(replay.lines[1].split()[1]).ask("clear\n", b"\n")
    check(told == "error: line 1, word 1: a recorded dialogue cannot be changed\n", f"control of a recording: {told}")
    check(replay.end(signal.SIGINT) == (0, "") and not (folder / "no").exists(), "Ctrl-C")

    code, told, why = run("--listen", "tcp://127.0.0.1:0", "--write-scenario", str(folder / "none" / "x"))
    check(code == 2 and not told and "the scenario cannot be written" in why, f"no such folder: {code}, {told}, {why}")
    pipe = folder / "pipe"
    os.mkfifo(pipe)
    reader = os.open(pipe, os.O_RDONLY | os.O_NONBLOCK)
    piped = Served(1, "--listen", "tcp://127.0.0.1:0", "--write-scenario", str(pipe))
    try:
        check(os.read(reader, 64), "who reads the pipe is told its end before anything was written")
    except BlockingIOError:
        pass
    check(piped.type("voltage 12.2") == "ok" and piped.end() == (0, ""), "a scenario that goes to a pipe")
    check(os.read(reader, 64).endswith(b" voltage 12.2\n"), "it went to the pipe")
    os.close(reader)

    lost = Served(1, "--listen", "tcp://127.0.0.1:0", "--trace", "/dev/full", "--write-scenario", "/dev/full")
    Line(lost.lines[0]).ask("ATI\r", b">")
    lost.type("voltage 12.2")
    code, told = lost.end()
    check(code == 2 and "the scenario cannot be written" in told and "the trace cannot be written" in told, f"{code}: {told}")
    full = Served(1, "--listen", "pty", "--trace", "/dev/full")
    check(full.lines[0].startswith("/dev/pts/"), f"a device: {full.lines}")
    device = os.open(full.lines[0], os.O_RDWR | os.O_NOCTTY)
    os.write(device, b"ATI\r")
    while b">" not in os.read(device, 64):
        pass
    os.close(device)
    code, told = full.end()
    check(code == 1 and told.count("the trace cannot be written") == 1, f"a full disk: {code}, {told}")


program = sys.argv[1]
start = time.monotonic()
with tempfile.TemporaryDirectory() as name:
    tells_of_itself()
    refuses()
    serves_a_fleet(pathlib.Path(name))
    serves_the_rest(pathlib.Path(name))
print(f"the command line is as it should be; {time.monotonic() - start:.1f} s")

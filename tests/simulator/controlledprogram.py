#!/usr/bin/env python3
"""obdsim as its users control it while it runs: controlledprogram.py PROGRAM

Control lines come by standard input and by the socket, mistakes are answered with line and word, what was typed is
written as a scenario, and a second run that plays it is the same car.
"""
import os
import signal
import socket
import subprocess
import sys
import tempfile


class Client:
    def __init__(self, address, end):
        host, port = address.rsplit(":", 1)
        self.socket = socket.create_connection((host.removeprefix("tcp://"), int(port)), 10)
        self.end = end

    def ask(self, line):
        self.socket.sendall(line.encode())
        text = b""
        while not self.end(text):
            piece = self.socket.recv(4096)
            assert piece, f"the connection ended behind {text!r}"
            text += piece
        return text.decode()

    def close(self):
        self.socket.close()


def adapter(address):
    client = Client(address, lambda text: text.endswith(b">"))
    for line in ("ATE0", "ATS0", "ATSP6"):
        client.ask(line + "\r")
    return client


def control(address):
    return Client(address, lambda text: text.endswith(b"ok\n") or text.startswith(b"error") and text.endswith(b"\n"))


def start(program, *more):
    process = subprocess.Popen([program, "--listen", "tcp://127.0.0.1:0", *more], stdin=subprocess.PIPE,
                               stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)
    return process, process.stdout.readline().strip()


def end(process, code=0):
    process.send_signal(signal.SIGTERM)
    said = process.communicate(timeout=20)
    assert process.returncode == code, (process.returncode, said)
    return said


def check(what, good):
    if not good:
        raise AssertionError(what)


def typed_and_played(program, folder):
    scenario, trace = os.path.join(folder, "typed.txt"), os.path.join(folder, "trace.txt")
    process, address = start(program, "--control", "0", "--write-scenario", scenario, "--trace", trace)
    lines = control(process.stdout.readline().strip().removeprefix("control "))
    check("the help lists the forms", "module MODULE silent|speaks" in lines.ask("help\n"))
    told = lines.ask("ignition sideways\n")
    check(told, told == 'error: line 2, word 2 is "sideways"; here belongs on or off\n')
    check("a value of the drive is taken", lines.ask("hold speed 90\n") == "ok\n")
    car = adapter(address)
    check("the speed is held", "410D5A" in car.ask("010D\r"))
    process.stdin.write("value 7E8 0C 3000\n")
    process.stdin.flush()
    for _ in range(100):
        if "410C3000" in car.ask("010C\r"):
            break
    else:
        raise AssertionError("standard input is not followed")
    check("what was asked is counted", "010D\n" in lines.ask("requests\n"))
    check("a module falls silent", lines.ask("module 7E8 silent\n") == "ok\n" and "410C3000" not in car.ask("010C\r"))
    check("the link breaks", lines.ask("loss\n") == "ok\n")
    check("and ends the connection", car.socket.recv(16) == b"")
    lines.close()
    end(process)
    text = open(scenario, encoding="utf-8").read()
    words = [line.split(" ", 1)[1] for line in text.splitlines()]
    check(text, words == ["hold speed 90", "value 7E8 0C 3000", "module 7E8 silent", "loss"])
    check("the trace has both ways", {" > ", " < "} <= {line[line.index(" 1 ") + 2:][:3] for line in open(trace, encoding="utf-8")})
    return scenario


def play(program, scenario, folder):
    kept = os.path.join(folder, "played.txt")
    lines = open(scenario, encoding="utf-8").read().splitlines()
    with open(kept, "w", encoding="utf-8") as file:  # as typed, but at once and with the module still speaking
        file.writelines("0.0 " + line.split(" ", 1)[1] + "\n" for line in lines[:2])
    process, address = start(program, "--scenario", kept)
    car = adapter(address)
    check("the scenario holds the speed", "410D5A" in car.ask("010D\r"))
    check("and the engine's value", "410C3000" in car.ask("010C\r"))
    car.close()
    end(process)


def mistakes(program, folder):
    wrong = os.path.join(folder, "wrong.txt")
    with open(wrong, "w", encoding="utf-8") as file:
        file.write("1 clear\n2 voltage much\n")
    for arguments, told in ((["--scenario", wrong], wrong + ":2: word 2"), (["--drive", "uphill"], "uphill"),
                            (["--fleet", "0"], "1 to 2000 cars"), (["--fault", "fire@3"], "fire"),
                            (["--write-scenario", "/no/such/folder/x", "--listen", "tcp://256.1.1.1:1"], "listen")):
        result = subprocess.run([program, *arguments], capture_output=True, text=True, timeout=20, check=False)
        check((arguments, result), result.returncode in (1, 2) and told in result.stderr and not result.stdout)


def main(program):
    with tempfile.TemporaryDirectory() as folder:
        play(program, typed_and_played(program, folder), folder)
        mistakes(program, folder)


main(sys.argv[1])

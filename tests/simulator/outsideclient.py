#!/usr/bin/env python3
"""A client that talks the way the well-known Python libraries do, over pseudo-terminals: outsideclient.py PROGRAM

Starts PROGRAM (obdsim) once for each of its vehicles, at the same time, and fails for each with which it cannot get on:
a probe at each line rate, ATZ, ATE0, ATH1, ATL0, AT RV with its blank, ATSP0, 0100, ATDPN (then the same by ATTPn, as where
a search fails), all lists of what is supported, requests with the number of frames to expect, an empty line to repeat the
last command, and ATZ at the end.
"""
import concurrent.futures
import os
import re
import select
import subprocess
import sys
import termios
import time
import tty

RATES = (38400, 9600, 230400, 115200, 57600, 19200)


class Line:
    def __init__(self, path):
        self.port = os.open(path, os.O_RDWR | os.O_NOCTTY)
        tty.setraw(self.port)

    def set_rate(self, rate):
        attributes = termios.tcgetattr(self.port)
        attributes[4] = attributes[5] = getattr(termios, f"B{rate}")
        termios.tcsetattr(self.port, termios.TCSANOW, attributes)
        termios.tcflush(self.port, termios.TCIFLUSH)

    def read(self, limit):
        text = b""
        end = time.monotonic() + limit
        while not text.endswith(b">"):
            left = end - time.monotonic()
            if left <= 0 or not select.select([self.port], [], [], left)[0]:
                raise AssertionError(f"no prompt behind {text!r}")
            text += os.read(self.port, 256)
        return text.replace(b"\0", b"")

    def ask(self, text, limit=15.0):
        os.write(self.port, text.encode() + b"\r")
        lines = self.read(limit)[:-1].decode("latin-1").split("\r")
        return [each.strip() for each in lines if each.strip()]


def check(good, what):
    if not good:
        raise AssertionError(what)


def frames(lines):
    return [each for each in lines if re.fullmatch(r"[0-9A-F ]+", each)]


def supported(lines, base):
    pids = set()
    for each in frames(lines):
        found = re.search(r"41 ?%02X ?((?:[0-9A-F]{2} ?){4})" % base, each)
        mask = int(found.group(1).replace(" ", ""), 16) if found else 0
        pids |= {base + bit + 1 for bit in range(32) if mask >> (31 - bit) & 1}
    return pids


def talk(path):
    line = Line(path)
    for rate in RATES:
        line.set_rate(rate)
        os.write(line.port, b"\x7F\x7F\r")
        check(line.read(5).endswith(b">"), f"the line rate {rate}")
    check(any("ELM" in each for each in line.ask("ATZ")), "ATZ")
    check(line.ask("ATE0")[-1] == "OK", "ATE0")
    check(line.ask("ATH1") == ["OK"], "ATH1")
    check(line.ask("ATL0") == ["OK"], "ATL0")
    check(re.fullmatch(r"\d+\.\dV", line.ask("AT RV")[0]), "AT RV")
    check(line.ask("ATSP0") == ["OK"], "ATSP0")
    reply = line.ask("0100", 25)
    check(frames(reply), f"0100: {reply}")
    number = line.ask("ATDPN")[0]
    check(re.fullmatch(r"A[1-9]", number), "ATDPN")
    check(line.ask(f"ATTP{number[1]}") == ["OK"], "ATTP")
    reply = line.ask("0100", 25)
    check(frames(reply), f"0100 behind ATTP{number[1]}: {reply}")
    check(line.ask("ATDPN")[0] == number[1], "ATDPN behind ATTP")
    pids = supported(reply, 0)
    for base in range(0x20, 0x100, 0x20):
        if base in pids:
            pids |= supported(line.ask(f"01{base:02X}"), base)
    told = 0
    for pid in (0x0C, 0x0D, 0x05):
        if pid not in pids:
            continue
        plain = frames(line.ask(f"01{pid:02X}"))
        if not plain:
            continue  # a car that was captured in part tells more in its lists than it holds
        counted = frames(line.ask(f"01{pid:02X}{len(plain)}"))
        check(len(counted) == len(plain), f"01{pid:02X}{len(plain)}: {counted}")
        again = frames(line.ask(""))
        check(len(again) == len(plain), f"the repeated 01{pid:02X}: {again}")
        told += 1
    check(any("ELM" in each for each in line.ask("ATZ")), "ATZ at the end")
    os.close(line.port)
    return told


def run(program, vehicle):
    server = subprocess.Popen([program, "--listen", "pty", "--vehicle", vehicle], stdin=subprocess.DEVNULL,
                              stdout=subprocess.PIPE, text=True)
    try:
        told = talk(server.stdout.readline().strip())
        return vehicle, told, "" if told or vehicle.startswith("real-") else "no value"
    except (AssertionError, OSError, IndexError) as error:
        return vehicle, 0, str(error) or repr(error)
    finally:
        server.terminate()
        server.wait(10)


def main(program):
    listed = subprocess.run([program, "--list"], check=True, capture_output=True, text=True).stdout
    vehicles = re.search(r"Vehicles:\n((?:  .*\n)+)", listed).group(1).split()
    with concurrent.futures.ThreadPoolExecutor(len(vehicles)) as pool:
        results = list(pool.map(lambda each: run(program, each), vehicles))
    for vehicle, asked, problem in results:
        print(f"{vehicle}: {problem or f'{asked} values'}")
    return 1 if len(vehicles) < 20 or any(problem for _, _, problem in results) else 0


sys.exit(main(sys.argv[1]))

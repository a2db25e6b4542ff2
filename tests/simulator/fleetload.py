#!/usr/bin/env python3
"""Asks each car of a fleet ten times a second: fleetload.py PROGRAM CARS SECONDS [CORES MEGABYTES]

Starts PROGRAM (obdsim) with that many cars, sends 010C to each every 100 ms, and prints what came back in time, the
processor time and the memory of the simulator. Fails if answers are missing, or if it takes more than that.
"""
import asyncio
import os
import subprocess
import sys


def usage(pid):
    fields = open(f"/proc/{pid}/stat").read().rsplit(")", 1)[1].split()
    seconds = (int(fields[11]) + int(fields[12])) / os.sysconf("SC_CLK_TCK")
    peak = next(line for line in open(f"/proc/{pid}/status") if line.startswith("VmHWM"))
    return seconds, int(peak.split()[1]) / 1024


async def ask(reader, writer, text):
    writer.write(text.encode() + b"\r")
    return await asyncio.wait_for(reader.readuntil(b">"), 10)


async def drive(address, rounds, start, counts):
    host, port = address.rsplit(":", 1)
    reader, writer = await asyncio.open_connection(host, int(port))
    for line in ("ATE0", "ATS0", "ATSP6", "0100"):
        await ask(reader, writer, line)
    await start.wait()
    loop = asyncio.get_running_loop()
    begin = loop.time()
    for each in range(rounds):
        await asyncio.sleep(max(0, begin + each * 0.1 - loop.time()))
        reply = await ask(reader, writer, "010C1")
        counts["good" if reply.startswith(b"410C") else "bad"] += 1
    writer.close()


async def main(program, cars, seconds, cores=None, megabytes=None):
    server = subprocess.Popen(
        [program, "--fleet", str(cars), "--listen", "tcp://127.0.0.1:0", "--vehicle", "bench-can11"],
        stdin=subprocess.DEVNULL, stdout=subprocess.PIPE, text=True)
    try:
        addresses = [server.stdout.readline().strip() for _ in range(cars)]
        start = asyncio.Event()
        counts = {"good": 0, "bad": 0}
        rounds = seconds * 10
        tasks = [asyncio.create_task(drive(each, rounds, start, counts)) for each in addresses]
        await asyncio.sleep(3)
        before, _ = usage(server.pid)
        began = asyncio.get_running_loop().time()
        start.set()
        await asyncio.gather(*tasks)
        wall = asyncio.get_running_loop().time() - began
        after, memory = usage(server.pid)
        print(f"{cars} cars, {counts['good']} answers in {wall:.1f} s ({counts['good'] / wall:.0f} a second), "
              f"{counts['bad']} bad, {after - before:.2f} s of processor, {memory:.0f} MB")
        spared = cores is None or (after - before <= cores * wall and memory <= megabytes)
        return 0 if counts["bad"] == 0 and counts["good"] == cars * rounds and spared else 1
    finally:
        server.terminate()
        server.wait(10)


sys.exit(asyncio.run(main(sys.argv[1], *(int(each) for each in sys.argv[2:]))))

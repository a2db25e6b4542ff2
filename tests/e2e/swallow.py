"""swallow.py PROGRAM: between a watch and its broker the network goes, and nobody is told: bytes are swallowed, and no
connection is closed. The watch has to notice, to keep what it reads, and to send it later. Prints what went wrong; exits 0 if
nothing did."""

import json
import os
import select
import socket
import sqlite3
import subprocess
import sys
import threading
import time

import paho.mqtt.client as mqtt

import watching
from watching import wait_for


class Proxy:
    """Hands bytes to and fro, until it swallows them. A connection that lived while it did stays dead."""

    def __init__(self, port):
        self.port = port
        self.swallows = False
        self.listener = socket.create_server(("127.0.0.1", 0))
        threading.Thread(target=self.accept, daemon=True).start()

    def address(self):
        return f"127.0.0.1:{self.listener.getsockname()[1]}"

    def accept(self):
        while True:
            near, _ = self.listener.accept()
            far = socket.create_connection(("127.0.0.1", self.port))
            threading.Thread(target=self.pass_on, args=(near, far), daemon=True).start()

    def pass_on(self, near, far):
        dead = False
        while True:
            for end in select.select([near, far], [], [])[0]:
                data = end.recv(65536)
                if not data:
                    near.close()
                    far.close()
                    return
                dead = dead or self.swallows
                if not dead:
                    (far if end is near else near).sendall(data)


def free_port():
    with socket.socket() as probe:
        probe.bind(("127.0.0.1", 0))
        return probe.getsockname()[1]


def listens(port):
    with socket.socket() as probe:
        return probe.connect_ex(("127.0.0.1", port)) == 0


def rows(spool):
    with sqlite3.connect(f"file:{spool}?mode=ro", uri=True) as database:
        return database.execute("SELECT count(*) FROM row").fetchone()[0]


def text(path):
    return open(path).read() if os.path.exists(path) else ""


def written(folder):
    lines = [json.loads(line) for line in text(folder + "/car.ndjson").splitlines()]
    return [(each["time"], each["module"], each["sensor"], each["value"]) for each in lines if "sensor" in each]


class Consumer:
    """Takes what comes, each reading by its number; what comes a second time has to be the same."""

    def __init__(self, port):
        self.readings = {}
        self.mistakes = []
        self.ready = threading.Event()
        client = mqtt.Client()
        client.on_connect = lambda *_: client.subscribe("cars/van/readings", qos=1)
        client.on_subscribe = lambda *_: self.ready.set()
        client.on_message = lambda _client, _data, message: self.take(json.loads(message.payload))
        client.connect("127.0.0.1", port)
        client.loop_start()

    def take(self, batch):
        for seq, millis, module, sensor, value, _unit in batch["readings"]:
            stamp = time.strftime("%Y-%m-%dT%H:%M:%S", time.gmtime(millis // 1000)) + f".{millis % 1000:03d}Z"
            reading = (stamp, module, sensor, value)
            if self.readings.setdefault((batch["spool"], seq), reading) != reading:
                self.mistakes.append(seq)


def start_watch(program, folder, port, proxy):
    with open(folder + "/log", "a") as log:
        return subprocess.Popen(
            [program, "watch", "--port", port, "--vehicle", "van", "--settings", folder + "/settings", "--output",
             f"ndjson:{folder}/car.ndjson", "--output",
             f"mqtt://{proxy.address()}/cars?keep_alive=5&discovery=off&spool={folder}/spool"],
            stderr=log, env=dict(os.environ, STATE_DIRECTORY=folder))


def run(program, folder, processes):
    port = free_port()
    with open(folder + "/broker.conf", "w") as settings:
        settings.write(f"user root\nlistener {port} 127.0.0.1\nallow_anonymous true\n")
    processes.append(subprocess.Popen(["/usr/sbin/mosquitto", "-c", folder + "/broker.conf"],
                                      stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL))
    wait_for("the broker", lambda: listens(port))
    consumer = Consumer(port)
    wait_for("the consumer", consumer.ready.is_set)
    proxy = Proxy(port)
    watch = start_watch(program, folder, "sim:petrol-can11?instant", proxy)
    processes.append(watch)
    wait_for("readings at the consumer", lambda: len(consumer.readings) > 20)
    proxy.swallows = True
    wait_for("the watch to notice", lambda: "no connection" in text(folder + "/log"))
    came = len(consumer.readings)
    wait_for("readings on the disk", lambda: rows(folder + "/spool") > 100)
    proxy.swallows = False
    wait_for("readings to come again", lambda: len(consumer.readings) > came + 100)
    watching.end(watch)
    if rows(folder + "/spool") > 0:  # what the end left there is sent by a watch without a car
        rest = start_watch(program, folder, "tcp://127.0.0.1:1", proxy)
        processes.append(rest)
        wait_for("an empty spool", lambda: rows(folder + "/spool") == 0)
        watching.end(rest)
    wait_for("all readings", lambda: len(consumer.readings) >= len(written(folder)))
    if consumer.mistakes or sorted(consumer.readings.values(), key=repr) != sorted(written(folder), key=repr):
        print(f"{len(written(folder))} readings were written, {len(consumer.readings)} came, and they differ; numbers "
              f"with two readings: {consumer.mistakes}")
        sys.exit(1)


watching.main(run)

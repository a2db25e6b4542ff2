#!/usr/bin/python3
"""A fleet on this machine's loopback: brokers, database, consumers and cars, some of which are killed meanwhile. At the end
it counts: each reading that a car wrote down must be in the database once. Exits 0 if all are.

run.py --velmora PROGRAM                                  3 cars, Mosquitto and one NATS node
run.py --velmora PROGRAM --large --sender PROGRAM         20 cars and 180 senders, Mosquitto and three NATS nodes"""

import argparse
import contextlib
import json
import os
import pathlib
import re
import shutil
import signal
import socket
import sqlite3
import subprocess
import sys
import tempfile
import time

import psycopg

HERE = pathlib.Path(__file__).resolve().parent
PASSWORD = "not-a-secret"
KNOWN_PORTS = re.compile(r"\b2\d{4}\b")  # all in the settings here begin with 2, and have five digits


def free_port():
    with socket.socket() as probe:
        probe.bind(("127.0.0.1", 0))
        return probe.getsockname()[1]


def say(text):
    print(f"{time.monotonic() - say.begin:6.1f} s  {text}", flush=True)


say.begin = time.monotonic()


def wait_for(what, condition, limit=60.0):
    end = time.monotonic() + limit
    while True:
        with contextlib.suppress(OSError, psycopg.OperationalError, sqlite3.OperationalError):
            if condition():
                return
        if time.monotonic() > end:
            raise RuntimeError(f"{what}: not within {limit:.0f} s")
        time.sleep(0.1)


def listens(port):
    with socket.create_connection(("127.0.0.1", port), timeout=1):
        return True


class Fleet:
    def __init__(self, arguments, folder):
        self.arguments = arguments
        self.folder = folder
        self.processes = {}
        self.commands = {}
        self.ports = {}
        self.environment = dict(os.environ, NATS_SYS_PASSWORD=PASSWORD, FLEET_CAR_PASSWORD=PASSWORD,
                                FLEET_CONSUMER_PASSWORD=PASSWORD, FLEET_USER="consumer", STATE_DIRECTORY=str(folder),
                                VELMORA_MQTT_PASSWORD=PASSWORD)
        self.nodes = ["node1", "node2", "node3"] if arguments.large else ["single"]
        self.down = set()  # killed, and to stay so for a while
        self.copy_settings()

    def copy_settings(self):
        """With ports that are free now in the place of those in the files."""
        for source in HERE.glob("*/*"):
            if source.suffix in (".conf", "") and source.is_file():
                target = self.folder / source.parent.name / source.name
                target.parent.mkdir(exist_ok=True)
                target.write_text(KNOWN_PORTS.sub(lambda port: str(self.port(port[0])), source.read_text()))

    def port(self, known):
        return self.ports.setdefault(str(known), free_port())

    def start(self, name, command, **environment):
        self.commands[name] = (command, environment)
        with open(self.folder / f"{name}.log", "ab") as log:
            self.processes[name] = subprocess.Popen([str(word) for word in command], cwd=self.folder, stdout=log,
                                                    stderr=log, env=dict(self.environment, **environment))

    def kill(self, name):
        say(f"kill -9 {name}")
        self.down.add(name)
        self.processes[name].kill()
        self.processes[name].wait()

    def start_again(self, name):
        say(f"start {name} again")
        self.down.discard(name)
        command, environment = self.commands[name]
        self.start(name, command, **environment)

    def supervise(self):
        """What ends by itself is started again, as a service manager would."""
        for name, process in list(self.processes.items()):
            if name.startswith("consumer") and name not in self.down and process.poll() is not None:
                self.start_again(name)

    def pause(self, seconds):
        end = time.monotonic() + seconds
        while time.monotonic() < end:
            self.supervise()
            time.sleep(0.2)

    # The engines

    def database(self):
        return f"host=127.0.0.1 port={self.port(25432)} user=postgres dbname=postgres"

    def postgres(self, *words):
        program = max(pathlib.Path("/usr/lib/postgresql").glob("*/bin"), key=lambda path: int(path.parts[-2]))
        become = ["runuser", "-u", "postgres", "--"] if os.geteuid() == 0 else []
        return [*become, str(program / words[0]), *words[1:]]

    def start_postgresql(self):
        data = self.folder / "data"
        data.mkdir(mode=0o700)
        if os.geteuid() == 0:
            self.folder.chmod(0o711)
            shutil.chown(data, "postgres", "postgres")
        subprocess.run(self.postgres("initdb", "-D", data, "-U", "postgres", "-A", "trust", "--no-sync"), check=True,
                       stdout=subprocess.DEVNULL, cwd="/")
        with open(data / "postgresql.conf", "a", encoding="ascii") as settings:
            settings.write((self.folder / "postgresql" / "postgresql.conf").read_text())
        self.start("postgresql", self.postgres("postgres", "-D", data))
        wait_for("PostgreSQL", lambda: psycopg.connect(self.database()).close() is None)
        with psycopg.connect(self.database()) as connection:
            connection.execute((HERE / "postgresql" / "schema.sql").read_text())

    def kill_postgresql(self):
        say("stop PostgreSQL without care for what it is at")
        subprocess.run(self.postgres("pg_ctl", "stop", "-m", "immediate", "-D", self.folder / "data"), check=True,
                       stdout=subprocess.DEVNULL, cwd="/")
        self.processes["postgresql"].wait()

    def start_mosquitto(self):
        passwords = self.folder / "passwords"
        passwords.touch()
        for name in ["consumer", *self.names("m")]:
            subprocess.run(["mosquitto_passwd", "-b", passwords, name, PASSWORD], check=True)
        settings = self.folder / "mosquitto" / "mosquitto.conf"
        if os.geteuid() == 0:
            settings.write_text("user root\n" + settings.read_text())
        self.start("mosquitto", ["/usr/sbin/mosquitto", "-c", settings])
        wait_for("Mosquitto", lambda: listens(self.port(21941)))

    def start_nats(self):
        for node in self.nodes:
            self.start(node, ["/usr/sbin/nats-server", "-c", self.folder / "nats" / f"{node}.conf"])
        for index, _ in enumerate(self.nodes):
            wait_for("NATS", lambda port=self.port(21931 + index): listens(port))

    def start_consumer(self, name, places):
        self.start(name, [sys.executable, HERE / "consumer.py", places, self.database(), "--name", name])
        wait_for(f"{name} (see {self.folder}/{name}.log)", lambda: self.is_ready(name))

    def is_ready(self, name):
        self.supervise()
        return "ready" in (self.folder / f"{name}.log").read_text()

    # The cars

    def names(self, broker):
        """Those of one broker: half of all, and of three cars two."""
        cars = 20 if self.arguments.large else 3
        senders = 180 if self.arguments.large else 0
        mine = 0 if broker == "m" else 1
        return [name for i, name in enumerate([f"car{i}" for i in range(cars)] + [f"sender{i}" for i in range(senders)])
                if i % 2 == mine]

    def broker_of(self, name):
        """Where it goes, and as which user: of a cluster to any node, and the cars begin with different ones."""
        index = int(re.sub(r"\D", "", name))
        if name in self.names("m"):
            return f"127.0.0.1:{self.port(21941)}", name
        return self.cluster(index // 2), "car"

    def cluster(self, first):
        count = len(self.nodes)
        return ",".join(f"127.0.0.1:{self.port(21931 + (first + node) % count)}" for node in range(count))

    def output(self, name, places):
        return (f"mqtt://{places}/fleet?ack_topic=fleet/{name}/stored&discovery=off"
                f"&spool={self.folder}/{name}.spool")

    def start_car(self, name, adapter="sim:petrol-can11?instant"):
        places, user = self.broker_of(name)
        self.start(name, [self.arguments.velmora, "watch", "--port", adapter, "--vehicle", name,
                          "--settings", self.folder / "settings.toml",
                          "--output", self.output(name, places), "--output", f"ndjson:{self.folder}/{name}.ndjson"],
                   VELMORA_MQTT_USER=user)

    def start_senders(self):
        """All of one broker in one process, on what the first car has read by now."""
        for broker in ("m", "n"):
            words = []
            for name in self.names(broker):
                if name.startswith("sender"):
                    places, user = self.broker_of(name)
                    (self.folder / f"{name}.user").write_text(user + "\n")
                    words += [name, f"{self.output(name, places)}&user_file={self.folder}/{name}.user"]
            if words:
                self.start(f"senders-{broker}", [self.arguments.sender, self.folder / "car0.ndjson", "5", *words])

    def cars(self):
        return [name for name in self.processes if name.startswith("car")]

    def end(self, names):
        for name in names:
            self.processes[name].send_signal(signal.SIGTERM)
        for name in names:
            code = self.processes[name].wait(timeout=400)
            if code != 0:
                raise RuntimeError(f"{name} ended with {code}: see {self.folder}/{name}.log")

    def stored(self):
        with psycopg.connect(self.database()) as connection:
            return connection.execute("SELECT count(*) FROM reading").fetchone()[0]

    def waiting(self, name):
        with contextlib.closing(sqlite3.connect(f"file:{self.folder}/{name}.spool?mode=ro", uri=True)) as spool:
            return spool.execute("SELECT count(*) FROM row").fetchone()[0]

    def is_drained(self):
        self.supervise()
        return not self.left()

    def left(self):
        counts = {path.stem: self.waiting(path.stem) for path in self.folder.glob("*.spool")}
        return {name: count for name, count in sorted(counts.items()) if count > 0}

    # The count

    def judge(self):
        wrong = 0
        total = 0
        with psycopg.connect(self.database()) as connection:
            for name in self.cars():
                written = [(each["time"], each["sensor"], each["value"])
                           for each in map(json.loads, (self.folder / f"{name}.ndjson").read_text().splitlines())
                           if "sensor" in each]
                rows = connection.execute(
                    "SELECT to_char(time AT TIME ZONE 'UTC', 'YYYY-MM-DD\"T\"HH24:MI:SS.MS\"Z\"'), sensor, "
                    "coalesce(to_jsonb(value), to_jsonb(text)) FROM reading WHERE vehicle = %s", (name,)).fetchall()
                total += len(written)
                wrong += self.compare(name, written, rows)
            for line in "".join(path.read_text() for path in self.folder.glob("senders-*.log")).splitlines():
                if line.startswith("sent "):
                    _, name, count = line.split()
                    rows = connection.execute("SELECT count(*), count(DISTINCT (time, sensor)) FROM reading "
                                              "WHERE vehicle = %s", (name,)).fetchone()
                    total += int(count)
                    if rows != (int(count), int(count)):
                        wrong += 1
                        say(f"{name}: {count} sent, {rows[0]} stored, {rows[1]} of them different")
        say(f"{total} readings, {'each stored once' if wrong == 0 else 'NOT each stored once'}")
        return wrong == 0 and total > 0

    @staticmethod
    def compare(name, written, rows):
        lost = set(written) - set(rows)
        if len(written) == len(rows) and not lost and len(set(rows)) == len(set(written)):
            return 0
        say(f"{name}: {len(written)} written, {len(rows)} stored, {len(lost)} lost, "
            f"{len(rows) - len(set(rows))} twice")
        return 1

    def close(self):
        for name, process in self.processes.items():
            if name != "postgresql" and process.poll() is None:
                process.kill()
                process.wait()
        if "postgresql" in self.processes and self.processes["postgresql"].poll() is None:
            self.kill_postgresql()


def drive(fleet, seconds):
    """What happens on the way, at parts of the time. A broker that is killed while nobody takes what it holds loses some
    of that, though it has acknowledged it."""
    brokers = ["mosquitto", fleet.nodes[0]]
    consumers = ["consumer-m", "consumer-n"]
    for pause, action, names in ((0.1, fleet.kill, consumers),
                                 (0.2, fleet.kill, brokers),
                                 (0.1, fleet.start_again, brokers + consumers),
                                 (0.25, lambda _: fleet.kill_postgresql(), ["postgresql"]),
                                 (0.1, fleet.start_again, ["postgresql"])):
        fleet.pause(pause * seconds)
        for name in names:
            action(name)
    fleet.pause(0.25 * seconds)


def run(arguments, folder):
    fleet = Fleet(arguments, folder)
    try:
        fleet.start_postgresql()
        fleet.start_mosquitto()
        fleet.start_nats()
        # Their sessions have to be there before the first car: what nobody has subscribed to, a broker throws away.
        fleet.start_consumer("consumer-m", f"127.0.0.1:{fleet.port(21941)}")
        fleet.start_consumer("consumer-n", fleet.cluster(len(fleet.nodes) - 1))
        say("the engines run")
        for name in [each for each in fleet.names("m") + fleet.names("n") if each.startswith("car")]:
            fleet.start_car(name)
        wait_for("the first readings", lambda: fleet.stored() > 0)
        for name in fleet.cars():
            wait_for(f"readings of {name}", lambda path=folder / f"{name}.ndjson": path.stat().st_size > 2000)
        fleet.start_senders()
        say("all drive")
        drive(fleet, arguments.seconds or (180 if arguments.large else 12))
        fleet.end(fleet.cars() + [name for name in fleet.processes if name.startswith("senders")])
        say("all have ended; what was under way is sent by watches without a car")
        for name in fleet.cars():
            fleet.start_car(name, "tcp://127.0.0.1:1")
        try:
            wait_for("empty spools", fleet.is_drained, 120)
        except RuntimeError:
            say("readings that wait: " + ", ".join(f"{name} {count}" for name, count in fleet.left().items()))
            raise
        fleet.end(fleet.cars())
        return fleet.judge()
    finally:
        fleet.close()


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--velmora", required=True, type=pathlib.Path)
    parser.add_argument("--large", action="store_true")
    parser.add_argument("--sender", type=pathlib.Path, help="needed for the large form")
    parser.add_argument("--seconds", type=float, help="how long they drive")
    arguments = parser.parse_args()
    if arguments.large and not arguments.sender:
        parser.error("--large needs --sender")
    for name in ("velmora", "sender"):
        if getattr(arguments, name):
            setattr(arguments, name, getattr(arguments, name).resolve())
    with tempfile.TemporaryDirectory(prefix="fleet-") as folder:
        try:
            good = run(arguments, pathlib.Path(folder))
        except (RuntimeError, OSError, subprocess.SubprocessError) as error:
            say(f"failed: {error}")
            for log in sorted(pathlib.Path(folder).glob("*.log")):
                print(f"--- {log.name}\n" + "\n".join(log.read_text(errors="replace").splitlines()[-8:]))
            good = False
    sys.exit(0 if good else 1)


main()

#!/usr/bin/python3
"""Stores what cars publish: consumer.py HOST:PORT[,HOST:PORT...] DATABASE [--topic FILTER] [--name NAME].

One message is one transaction, which is committed before the broker is told that the message has come. Then the car is told
up to which number all of it is stored, and forgets that. A message that comes twice changes nothing.

Several places are the nodes of a cluster: when one is gone, the session goes on with the next. User and password of the
broker come from FLEET_USER and FLEET_CONSUMER_PASSWORD. DATABASE is a connection string. Whoever starts this has to start it
again when it ends: it ends when the database fails, so that nothing is acknowledged."""

import argparse
import itertools
import json
import os
import sys
import time

import paho.mqtt.client as mqtt
import psycopg

STORE_READINGS = """INSERT INTO reading SELECT vehicle, spool, seq, to_timestamp(millis / 1000.0), clock, module, sensor,
                    value, text, unit FROM incoming ON CONFLICT DO NOTHING"""
STORE_EVENT = "INSERT INTO event VALUES (%s, %s, %s, %s) ON CONFLICT DO NOTHING"
STORE_MARK = """INSERT INTO mark VALUES (%s, %s, %s) ON CONFLICT (vehicle, spool) DO UPDATE SET seq = excluded.seq"""
INCOMING = """CREATE TEMP TABLE incoming (vehicle text, spool text, seq bigint, millis bigint, clock boolean, module text,
              sensor text, value double precision, text text, unit text) ON COMMIT DELETE ROWS"""


class Batch:
    """A message, taken apart. Raises ValueError, KeyError or TypeError for what is none."""

    def __init__(self, vehicle, payload):
        content = json.loads(payload.replace(b"\\u0000", b"\\ufffd"))  # which the database has no place for
        self.vehicle = vehicle
        self.spool = str(content["spool"])
        self.after = int(content["after"])
        self.last = int(content["last"])
        self.stored = int(content["stored"])
        clock = bool(content["clock"])
        if content["vehicle"] != vehicle:
            raise ValueError("a car speaks for another one")
        self.readings = [self.row(clock, *each) for each in content["readings"]]
        self.events = [(vehicle, self.spool, int(each["seq"]), json.dumps(each)) for each in content["events"]]

    def row(self, clock, seq, millis, module, sensor, value, unit):
        text = value if isinstance(value, str) else None
        number = None if value is None or text is not None else float(value)
        return (self.vehicle, self.spool, int(seq), int(millis), clock, module, sensor, number, text, unit)


class Store:
    """The database."""

    def __init__(self, where):
        self.connection = psycopg.connect(where)
        self.connection.execute(INCOMING)
        self.connection.commit()

    def add(self, batch):
        """Stores a batch; tells up to which number all of that spool is stored."""
        with self.connection.transaction(), self.connection.cursor() as cursor:
            if batch.readings:
                # Copying is four times as fast as inserting, and can't skip what is there already: so in two steps.
                with cursor.copy("COPY incoming FROM STDIN") as copy:
                    for row in batch.readings:
                        copy.write_row(row)
                cursor.execute(STORE_READINGS)
            for row in batch.events:
                cursor.execute(STORE_EVENT, row)
            mark = self.mark(cursor, batch)
            cursor.execute(STORE_MARK, (batch.vehicle, batch.spool, mark))
        return mark

    @staticmethod
    def mark(cursor, batch):
        # Brokers deliver out of order now and then: a batch that lies behind a hole is stored, but its car must send
        # again from the hole on. What the car has forgotten will never come.
        cursor.execute("SELECT seq FROM mark WHERE vehicle = %s AND spool = %s", (batch.vehicle, batch.spool))
        row = cursor.fetchone()
        known = max(row[0] if row else 0, batch.stored)
        return max(known, batch.last) if batch.after <= known else known


class Consumer:
    """Between broker and database."""

    def __init__(self, arguments):
        self.arguments = arguments
        self.store = Store(arguments.database)
        # The session lives on in the broker while this program does not.
        self.client = mqtt.Client(client_id=arguments.name, clean_session=False)
        self.client.username_pw_set(os.environ["FLEET_USER"], os.environ["FLEET_CONSUMER_PASSWORD"])
        self.client.on_connect = self.on_connect
        self.client.on_subscribe = lambda *_: print("ready", flush=True)
        self.client.on_message = self.on_message

    def run(self):
        for place in itertools.cycle(self.arguments.broker.split(",")):
            host, _, port = place.rpartition(":")
            try:
                self.client.connect(host, int(port), keepalive=30)
                while self.client.loop() == mqtt.MQTT_ERR_SUCCESS:
                    pass
            except OSError as error:
                print(f"{place}: {error}", file=sys.stderr, flush=True)
            time.sleep(1)

    def on_connect(self, client, _userdata, _flags, result):
        if result == 0:
            client.subscribe(self.arguments.topic, qos=1)
        else:
            print("the broker refuses:", mqtt.connack_string(result), file=sys.stderr, flush=True)

    def on_message(self, client, _userdata, message):
        """The broker is told that the message has come when this returns."""
        try:
            vehicle = message.topic.split("/")[-2]
            try:
                batch = Batch(vehicle, message.payload)
            except (ValueError, KeyError, TypeError) as error:
                print(f"{message.topic}: no batch of readings: {error!r}", file=sys.stderr, flush=True)
                return  # it will be none the next time either
            try:
                mark = self.store.add(batch)
            except psycopg.DataError as error:
                print(f"{message.topic}: the database has no place for it: {error!r}", file=sys.stderr, flush=True)
                return
            answer = json.dumps({"spool": batch.spool, "seq": mark})
            client.publish(message.topic.rpartition("/")[0] + "/stored", answer, qos=1, retain=True)
        except Exception as error:  # the client would log it and acknowledge the message
            print("ends without acknowledging:", repr(error), file=sys.stderr, flush=True)
            os._exit(1)


def main():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("broker", metavar="HOST:PORT[,HOST:PORT...]")
    parser.add_argument("database")
    parser.add_argument("--topic", default="fleet/+/readings")
    parser.add_argument("--name", default="fleet-consumer")
    Consumer(parser.parse_args()).run()


main()

"""What the tests of Bluetooth stand on: the program, a simulated adapter, and the played service on its bus."""
import os
import signal
import subprocess
import time
import unittest

import dbus

HERE = os.path.dirname(os.path.abspath(__file__))
BLE, CLASSIC, OTHER = 'AA:BB:CC:DD:EE:01', 'AA:BB:CC:DD:EE:02', 'AA:BB:CC:DD:EE:09'
UART = '0000fff0-0000-1000-8000-00805f9b34fb'
NOTIFY, WRITE = UART.replace('fff0', 'fff1'), UART.replace('fff0', 'fff2')
GIVEN = {}  # program, simulator and folder, as the test was started with


def command(*arguments):
    return [GIVEN['program'], '--settings', os.path.join(GIVEN['folder'], 'settings'), *arguments]


def run(*arguments, seconds=40, environment=None, text=None):
    result = subprocess.run(command(*arguments), text=True, input=text, capture_output=True, timeout=seconds,
                            env={**os.environ, **(environment or {})}, check=False)
    return result.returncode, result.stdout, result.stderr


def start_simulator():
    process = subprocess.Popen([GIVEN['simulator'], '--listen', 'tcp://127.0.0.1:0', '--vehicle', 'petrol-can11'],
                               stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True)
    return process, int(process.stdout.readline().rsplit(':', 1)[1])


class Rig(unittest.TestCase):
    def setUp(self):
        self.simulator, self.port = start_simulator()
        self.service = subprocess.Popen(
            ['/usr/bin/python3', '-m', 'dbusmock', '--template', os.path.join(HERE, 'bluez_template.py')],
            stdout=subprocess.DEVNULL)
        bus = dbus.SystemBus()
        end = time.monotonic() + 10
        while not bus.name_has_owner('org.bluez'):
            self.assertLess(time.monotonic(), end, 'the played service does not start')
            time.sleep(0.02)
        self.control = dbus.Interface(bus.get_object('org.bluez', '/'), 'org.bluez.Mock')
        self.control.AddAdapter('hci0', 'test')

    def tearDown(self):
        for process in (self.service, self.simulator):
            process.send_signal(signal.SIGTERM)
            process.wait(10)
            if process.stdout:
                process.stdout.close()

    def add_ble(self, mtu=23, flags=('write', 'write-without-response'), notify=NOTIFY, write=WRITE, service=UART,
                address=BLE, name='OBDBLE', port=0):
        return self.control.AddLowEnergy('hci0', address, name, service, notify, write, dbus.Array(flags, signature='s'),
                                         dbus.UInt16(mtu), dbus.Int32(port or self.port))

    def add_classic(self):
        return self.control.AddClassic('hci0', CLASSIC, 'OBDII', dbus.Int32(self.port))

    def expect(self, arguments, code, *words, **how):
        result = run(*arguments, **how)
        self.assertEqual(result[0], code, result)
        for word in words:
            self.assertIn(word, result[1] + result[2])
        return result

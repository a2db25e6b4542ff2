#!/usr/bin/env python3
"""The program over Bluetooth, against a played Bluetooth service on a message bus of its own.

    bluetooth_test.py PROGRAM SIMULATOR        starts the bus, and itself again on it
"""
import os
import signal
import subprocess
import sys
import threading
import time
import unittest

from details import Details  # noqa: F401  (its tests run with these)
from rig import BLE, CLASSIC, GIVEN, NOTIFY, OTHER, Rig, WRITE, command, run


class Bluetooth(Rig):
    def test_low_energy_by_sockets_writes_within_the_unit(self):
        path = self.add_ble()
        self.expect(['-p', f'ble://{BLE}', 'info'], 0, 'VIN')
        count, longest, dropped = self.control.Writes(path)
        self.assertGreater(count, 10)
        self.assertLessEqual(longest, 20)
        self.assertEqual(dropped, 0)

    def test_low_energy_by_messages_where_no_socket_is_given(self):
        path = self.add_ble(flags=('write',), notify=WRITE, write=WRITE)
        self.control.GiveSockets(path, False)
        start = time.monotonic()
        self.expect(['-p', f'ble://{BLE}', 'info'], 0, 'VIN')
        self.assertLess(time.monotonic() - start, 15, 'it ends without waiting for what was answered')

    def test_low_energy_of_an_unknown_service_and_swapped_names(self):
        self.add_ble(service='12345678-0000-1000-8000-00805f9b34fb', notify=WRITE, write=NOTIFY)
        self.expect(['-p', f'ble://{BLE}', 'info'], 0, 'VIN')

    def test_low_energy_gets_through_after_failures_on_the_edge_of_reach(self):
        path = self.add_ble()
        self.control.Fail(path, 'Failed:le-connection-abort-by-local|Failed:le-connection-abort-by-local')
        self.expect(['-p', f'ble://{BLE}', 'info'], 0, 'VIN')

    def test_loss_in_mid_session_is_told_as_a_lost_link(self):
        path = self.add_ble()
        self.control.LoseAfter(path, 25)
        self.expect(['-p', f'ble://{BLE}', 'scan'], 8)

    def test_watch_comes_back_after_a_loss(self):
        for path, port in ((self.add_ble(), f'ble://{BLE}'), (self.add_classic(), f'bt://{CLASSIC}')):
            watch = subprocess.Popen(command('-q', '-p', port, 'watch', 'RPM', '--output', 'ndjson:-'),
                                     stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True,
                                     env={**os.environ, 'STATE_DIRECTORY': GIVEN['folder']})
            limit = threading.Timer(60, watch.kill)
            limit.start()
            try:
                self.values(watch, 3)
                self.control.LoseAfter(path, 1)
                seen = self.values(watch, 3, behind='link_lost')
                self.assertIn('link_back', seen)
            finally:
                limit.cancel()
                watch.send_signal(signal.SIGINT)
                watch.communicate(timeout=20)

    def values(self, watch, count, behind=''):
        """Reads lines until so many values have come, behind an event if it is told."""
        text = ''
        for line in watch.stdout:
            text += line
            if behind in text and '"RPM"' in line:
                count -= 1
            if not count:
                return text
        self.fail(f'the watch ended: {text}{watch.stderr.read()}')

    def test_loss_in_the_midst_of_a_reply_is_told_as_a_lost_link(self):
        ble, classic = self.add_ble(), self.add_classic()
        for sockets in (True, False):
            self.control.GiveSockets(ble, sockets)
            self.control.LoseInReply(ble, 30)
            self.expect(['-p', f'ble://{BLE}', 'scan'], 8, f'The link to the adapter on ble://{BLE} broke', 'in reach?')
        self.control.LoseInReply(classic, 30)
        self.expect(['-p', f'bt://{CLASSIC}', 'scan'], 8, f'bt://{CLASSIC}', 'in reach?')

    def test_device_without_a_serial_service_is_told(self):
        self.add_ble(flags=('read',))
        self.expect(['-p', f'ble://{BLE}', 'info'], 3, f'The Bluetooth device {BLE} has no serial service', 'ports')

    def test_errors_of_low_energy_name_what_to_do(self):
        path = self.add_ble()
        rows = [('NotReady:Resource Not Ready', 'Bluetooth is off'),
                ('AuthenticationFailed:x', 'ports pair'),
                ('InProgress:Operation already in progress', 'another program'),
                ('Failed:le-connection-refused', 'le-connection-refused'),
                ('Failed:br-connection-page-timeout', 'out of reach')]
        for error, words in rows:
            self.control.Fail(path, error)
            self.expect(['-p', f'ble://{BLE}', 'info'], 3, words)

    def test_classic_by_the_service_hands_over_a_socket(self):
        path = self.add_classic()
        self.expect(['-p', f'bt://{CLASSIC}', 'info'], 0, 'VIN')
        self.control.LoseAfter(path, 25)
        self.expect(['-p', f'bt://{CLASSIC}', 'scan'], 8)

    def test_classic_goes_past_a_service_that_refuses_to_the_kernel(self):
        path = self.add_classic()
        self.control.Fail(path, 'NotAvailable:br-connection-profile-unavailable')
        code, _, said = self.expect(['-p', f'bt://{CLASSIC}', 'info'], 3, CLASSIC)
        self.assertRegex(said, 'no Bluetooth support|not loaded|is off|no answer')

    def test_ports_lists_adapters_and_auto_tries_only_paired_ones(self):
        ble = self.add_ble()
        self.control.AddDevice('hci0', OTHER, 'Kitchen lamp')
        self.control.SetPaired(self.add_classic(), True)
        _, out, _ = self.expect(['ports', '--known'], 0)
        self.assertIn(f'bt://{CLASSIC}  OBDII, paired', out)
        self.assertIn(f'ble://{BLE}  OBDBLE, nearby, not paired', out)
        self.assertNotIn('lamp', out)
        self.assertEqual(self.control.Writes(ble)[0], 0)
        self.expect(['-p', 'auto', 'info'], 0, 'VIN', f'bt://{CLASSIC}')
        self.assertEqual(self.control.Writes(ble)[0], 0, 'nothing is written to a device that is only nearby')

    def test_pairing_tells_the_usual_pins_one_after_the_other(self):
        path = self.add_classic()
        self.control.WantPin(path, '0000')
        self.expect(['ports', 'pair', CLASSIC], 0, 'Paired with ' + CLASSIC)
        self.expect(['ports', 'pair', CLASSIC], 0, 'Paired with')
        ble = self.add_ble()
        self.expect(['ports', 'pair', f'ble://{BLE}'], 0, 'Paired with')
        self.control.SetPaired(ble, False)
        self.control.WantPin(ble, '9753')
        self.expect(['ports', 'pair', BLE], 3, 'refused the usual PINs')

    def test_interrupt_ends_the_search_for_an_absent_device_at_once(self):
        process = subprocess.Popen([GIVEN['program'], '-p', f'ble://{OTHER}', 'info'], stderr=subprocess.PIPE, text=True)
        time.sleep(1.5)
        start = time.monotonic()
        process.send_signal(signal.SIGINT)
        _, said = process.communicate(timeout=20)
        self.assertEqual(process.returncode, 130, said)
        self.assertLess(time.monotonic() - start, 1.5)

    def test_no_bus_and_no_service_are_told(self):
        code, _, said = run('-p', f'ble://{BLE}', 'info', environment={'DBUS_SYSTEM_BUS_ADDRESS': 'unix:path=/nonexistent'})
        self.assertEqual(code, 3)
        self.assertIn('no system bus', said)
        code, _, said = run('-p', f'bt://{CLASSIC}', 'info', environment={'DBUS_SYSTEM_BUS_ADDRESS': 'unix:path=/nonexistent'})
        self.assertEqual(code, 3)
        self.assertIn(f'Could not connect to {CLASSIC} by Bluetooth: ', said, "the kernel's own socket needs no bus")
        self.service.send_signal(signal.SIGTERM)
        self.service.wait(10)
        self.expect(['-p', f'ble://{BLE}', 'info'], 3, 'bluetoothd')
        code, _, said = run('-p', 'ble://AA:BB', 'info')
        self.assertEqual(code, 2, said)


if __name__ == '__main__':
    if 'BLUETOOTH_TEST_ON_ITS_BUS' not in os.environ:
        os.environ['BLUETOOTH_TEST_ON_ITS_BUS'] = '1'
        os.execvp('dbus-run-session', ['dbus-run-session', '--', '/usr/bin/python3', *sys.argv])
    os.environ['DBUS_SYSTEM_BUS_ADDRESS'] = os.environ['DBUS_SESSION_BUS_ADDRESS']
    GIVEN.update(zip(('program', 'simulator', 'folder'), sys.argv[1:4]))
    os.makedirs(GIVEN['folder'], exist_ok=True)
    os.environ['HOME'] = GIVEN['folder']
    unittest.main(argv=[sys.argv[0], '-v', *sys.argv[4:]])

"""What the program asks of the Bluetooth service, call by call, and what it makes of odd answers."""
import resource
import socket
import subprocess
import time

from rig import BLE, CLASSIC, OTHER, Rig, UART, command

SERIAL = '00001101-0000-1000-8000-00805f9b34fb'


class Details(Rig):
    def calls(self, *members):
        return [int(self.control.Calls(member)) for member in members]

    def test_low_energy_is_left_as_it_was_found(self):
        path = self.add_ble()
        self.expect(['-p', f'ble://{BLE}', 'info'], 0, 'VIN')
        self.assertEqual(self.calls('Disconnect', 'AcquireNotify', 'AcquireWrite', 'WriteValue', 'StartNotify'),
                         [1, 1, 1, 0, 0])
        self.assertLess(self.calls('GetManagedObjects')[0], 15, 'it waits while the services are not told')
        self.control.ConnectForAnother(path)
        self.calls('Disconnect')
        self.expect(['-p', f'ble://{BLE}', 'info'], 0, 'VIN')
        self.assertEqual(self.calls('Disconnect'), [0], 'somebody else was connected')

    def test_low_energy_speaks_by_messages_whatever_the_reason(self):
        path = self.add_ble()
        for error in ('org.bluez.Error.NotSupported', 'org.bluez.Error.NotPermitted', 'org.bluez.Error.InProgress',
                      'org.freedesktop.DBus.Error.UnknownMethod'):
            self.control.RefuseSockets(path, error)
            self.calls('StartNotify')
            self.expect(['-p', f'ble://{BLE}', 'info'], 0)
            self.assertEqual(self.calls('StartNotify'), [1], error)
        self.control.RefuseSockets(path, 'org.bluez.Error.Failed')
        self.expect(['-p', f'ble://{BLE}', 'info'], 3, f'Could not connect to {BLE} by Bluetooth Low Energy: Notify acquired')

    def test_low_energy_is_tried_three_times(self):
        path = self.add_ble()
        self.control.Fail(path, '|'.join(['Failed:le-connection-abort-by-local'] * 3))
        self.expect(['-p', f'ble://{BLE}', 'info'], 3, 'out of reach')
        self.assertEqual(self.calls('Connect'), [3])
        self.control.Fail(path, 'Failed:le-connection-refused')
        self.expect(['-p', f'ble://{BLE}', 'info'], 3, 'le-connection-refused')
        self.assertEqual(self.calls('Connect'), [1], 'what will not get better is not tried again')

    def test_long_lines_go_in_pieces_with_pauses(self):
        line = 'AT@3' + 'X' * 60
        rows = ((23, True, [20, 20, 20, 5]), (185, True, [65]), (185, False, [20, 20, 20, 5]))
        for number, (mtu, sockets, sizes) in enumerate(rows):
            address = BLE[:-1] + str(3 + number)
            path = self.add_ble(mtu=mtu, flags=('write', 'write-without-response') if sockets else ('write',), address=address)
            self.control.GiveSockets(path, sockets)
            self.expect(['-p', f'ble://{address}', 'console'], 0, text=line + '\n')
            pieces = [int(size) for size in self.control.Pieces(path)]
            self.assertTrue(any(pieces[i:i + len(sizes)] == sizes for i in range(len(pieces))), (mtu, sockets, pieces))
            if sizes[0] == 20:
                self.assertGreaterEqual(self.control.ShortestPause(path, 20), 0.012, 'for adapters that lose bytes')

    def test_writes_that_fail_or_are_never_answered_are_a_lost_link(self):
        path = self.add_ble(flags=('write',))
        self.control.GiveSockets(path, False)
        self.control.LoseInReply(path, 30)
        self.expect(['-p', f'ble://{BLE}', 'scan'], 8, f'The link to the adapter on ble://{BLE} broke')
        self.assertEqual(self.control.LateCalls(), 0, 'the signal of the loss was enough')
        self.control.RefuseWrite(path, 12)
        self.expect(['-p', f'ble://{BLE}', 'scan'], 8, f'The link to the adapter on ble://{BLE} broke')
        self.control.BeDeaf('WriteValue')
        start = time.monotonic()
        self.expect(['-p', f'ble://{BLE}', 'scan'], 8, environment={'SYSTEMD_BUS_TIMEOUT': '1'})
        self.assertLess(time.monotonic() - start, 8)

    def test_the_service_of_the_device_itself_is_chosen(self):
        somebody = socket.create_server(('127.0.0.1', 0))
        self.addCleanup(somebody.close)
        other = self.add_ble(address=OTHER, name='Lamp', port=somebody.getsockname()[1])
        self.control.ConnectForAnother(other)
        time.sleep(0.3)
        self.add_ble(service=UART.replace('fff0', 'ffe0'))
        self.expect(['-p', f'ble://{BLE}', 'info'], 0)
        self.assertEqual(self.control.Writes(other)[0], 0, 'though that of the other one is the more usual')

    def test_a_classic_link_that_comes_late_is_waited_for(self):
        self.control.DelayConnection(self.add_classic(), 300)
        self.expect(['-p', f'bt://{CLASSIC}', 'info'], 0, 'VIN')

    def test_a_paired_device_that_says_nothing_is_told(self):
        somebody = socket.create_server(('127.0.0.1', 0))
        self.addCleanup(somebody.close)
        self.control.SetPaired(self.add_ble(port=somebody.getsockname()[1]), True)
        self.expect(['-p', 'auto', 'info'], 3, f'ble://{BLE} does not answer as an adapter does')

    def test_a_device_that_is_not_known_is_listened_for(self):
        self.control.Listen()
        self.control.Hide(self.add_ble())
        self.expect(['-p', f'ble://{BLE}', 'info'], 0)
        self.assertEqual(self.calls('SetDiscoveryFilter', 'StartDiscovery', 'StopDiscovery'), [1, 1, 1])
        self.assertLess(self.calls('GetManagedObjects')[0], 20, 'it looks twice a second')

    def test_ports_listens_and_an_absent_device_is_told(self):
        self.control.Listen()
        self.control.SetPaired(self.add_classic(), True)
        listing = subprocess.Popen(command('ports', '--known'), stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)
        known, _ = listing.communicate(timeout=20)
        self.assertIn(f'bt://{CLASSIC}  OBDII, paired\n', known)
        self.assertEqual(self.calls('StartDiscovery'), [0], 'what is known needs no listening')
        self.control.Hide(self.add_ble())
        listing = subprocess.Popen(command('ports'), stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)
        before = resource.getrusage(resource.RUSAGE_CHILDREN)
        absent = subprocess.Popen(command('-p', f'ble://{OTHER}', 'info'), stderr=subprocess.PIPE, text=True)
        start = time.monotonic()
        self.expect(['ports', 'pair', OTHER], 3, f'No Bluetooth device {OTHER} is in reach', f'Looking for {OTHER} ...')
        self.assertGreater(time.monotonic() - start, 11)
        _, told = absent.communicate(timeout=20)
        self.assertEqual(absent.returncode, 3, told)
        self.assertIn(f'No Bluetooth device {OTHER} is in reach\n  - is the ignition on', told)
        found, said = listing.communicate(timeout=20)
        after = resource.getrusage(resource.RUSAGE_CHILDREN)
        self.assertLess(after.ru_utime + after.ru_stime - before.ru_utime - before.ru_stime, 3, 'seconds of the processor')
        self.assertIn('Listening for Bluetooth adapters nearby, 11 s ...', said)
        self.assertLess(found.index(f'bt://{CLASSIC}  OBDII, paired\n'),
                        found.index(f'ble://{BLE}  OBDBLE, nearby, not paired\n'), 'the paired one first')
        self.assertEqual(self.calls('StartDiscovery', 'StopDiscovery'), [3, 3])

    def test_ports_knows_adapters_by_name_or_service(self):
        rows = [('01', 'Thermometer', [UART]), ('02', 'V-LINK', []), ('03', 'My Vgate', [UART, SERIAL]), ('04', 'GPS', [SERIAL]),
                ('05', 'Lamp', ['0000180f-0000-1000-8000-00805f9b34fb']), ('06', 'Phone', [])]
        for end, name, services in rows:
            self.control.SetServices(self.control.AddDevice('hci0', f'AA:BB:CC:DD:EE:{end}', name), services or ['x'])
        self.control.SetPaired(self.control.AddDevice('hci0', 'AA:BB:CC:DD:EE:07', 'OBDII'), True)
        _, out, _ = self.expect(['ports', '--known'], 0)
        lines = [line for line in out.splitlines() if 'AA:BB' in line]
        odd = "; its service could be an adapter's, or a printer's"
        self.assertEqual(lines, ['bt://AA:BB:CC:DD:EE:07  OBDII, paired',
                                 'ble://AA:BB:CC:DD:EE:01  Thermometer, nearby, not paired' + odd,
                                 'bt://AA:BB:CC:DD:EE:02  V-LINK, nearby, not paired',
                                 'bt://AA:BB:CC:DD:EE:03  My Vgate, nearby, not paired',
                                 'bt://AA:BB:CC:DD:EE:04  GPS, nearby, not paired' + odd])

    def test_a_controller_that_is_off_or_none_is_told(self):
        self.control.SetPowered(False)
        self.expect(['ports', '--known'], 0, 'No Bluetooth: Bluetooth adapters can\'t be listed: Bluetooth is off')
        self.expect(['-p', f'ble://{BLE}', 'info'], 3, f'Could not connect to {BLE} by Bluetooth Low Energy: Bluetooth is off')
        self.control.RemoveAdapter('hci0')
        self.expect(['-p', f'ble://{BLE}', 'info'], 3, 'this computer has no Bluetooth controller')

    def test_pairing_tells_its_steps_and_trusts(self):
        path = self.add_classic()
        self.control.WantPasskey(path, 0)
        _, _, said = self.expect(['ports', 'pair', f'bt://{CLASSIC}'], 0)
        self.assertEqual(said, f'Looking for {CLASSIC} ...\n'
                               'Pairing with OBDII; if it asks for a PIN, it is told 1234 ...\n'
                               'Pairing with OBDII; if it asks for a PIN, it is told 0000 ...\n'
                               f'Paired with {CLASSIC}\n')
        self.assertTrue(self.control.IsTrusted(path))
        ble = self.add_ble()
        self.control.WantPasskey(ble, 1234)
        self.control.Fail(ble, 'ConnectionAttemptFailed:Page Timeout')
        self.expect(['ports', 'pair', BLE], 3, f'Could not pair with {BLE}: ', 'Page Timeout')
        self.assertFalse(self.control.IsTrusted(ble))
        _, _, said = self.expect(['ports', 'pair', BLE], 0)
        self.assertNotIn('0000', said)
        self.assertTrue(self.control.IsTrusted(ble))

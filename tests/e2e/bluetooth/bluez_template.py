"""A dbusmock template: the system's Bluetooth service with adapters in reach, as strict as the real one.

Each adapter is a bridge to a simulated ELM327 on a TCP port of this machine. Low Energy ones offer a serial service whose
characteristics hand out sockets or speak by messages; classic ones are connected through a Profile1 object of the caller.
"""
import os
import socket
import sys
import time

import dbus
import dbus.lowlevel
from gi.repository import GLib

from dbusmock import OBJECT_MANAGER_IFACE, mockobject
from dbusmock.templates import bluez5
from dbusmock.templates.bluez5 import *  # noqa: F401,F403  (its control methods become this object's)

sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))
from bluez_habits import *  # noqa: E402,F401,F403  (likewise)
import bluez_habits  # noqa: E402

BUS_NAME = 'org.bluez'
MAIN_OBJ = '/'
SYSTEM_BUS = True
IS_OBJECT_MANAGER = True

SERVICE = 'org.bluez.GattService1'
CHRC = 'org.bluez.GattCharacteristic1'
DEVICE = 'org.bluez.Device1'
MOCK = 'org.bluez.Mock'
SERIAL_PORT = '00001101-0000-1000-8000-00805f9b34fb'

state = {'profiles': {}, 'agents': {}, 'pins': []}


def load(mock, parameters):
    bluez5.load(mock, parameters)
    mock.connection.add_message_filter(_note_sender)
    manager = mockobject.objects['/org/bluez']
    manager.AddMethods('org.bluez.ProfileManager1', [('RegisterProfile', 'osa{sv}', '', RegisterProfile),
                                                     ('UnregisterProfile', 'o', '', UnregisterProfile)])
    manager.AddMethods('org.bluez.AgentManager1', [('RegisterAgent', 'os', '', RegisterAgent)])


def _note_sender(connection, message):
    """Who is calling, which the mock does not tell its methods."""
    state['sender'] = message.get_sender()
    if bluez_habits.passes_over(message):
        return dbus.lowlevel.HANDLER_RESULT_HANDLED
    return dbus.lowlevel.HANDLER_RESULT_NOT_YET_HANDLED


def _error(name, text):
    return dbus.exceptions.DBusException(text, name='org.bluez.Error.' + name)


def _simulator(device):
    bridge = socket.create_connection(('127.0.0.1', device.simulator))
    bridge.setblocking(False)
    return bridge


def _forward(device, source, deliver):
    """Calls deliver with what arrives at source; with nothing at its end."""
    def ready(_, condition):
        if source.fileno() < 0:
            return False
        try:
            data = source.recv(4096)
        except BlockingIOError:
            return True
        except OSError:
            data = b''
        deliver(data)
        return bool(data) and source.fileno() >= 0
    device.watches.append(GLib.io_add_watch(source.fileno(), GLib.IO_IN | GLib.IO_HUP, ready))


# ---- Low Energy

def _notify(device, data):
    chrc = mockobject.objects[device.notify_path]
    if not data:
        lose(device)
        return
    for start in range(0, len(data), device.mtu - 3):
        piece = data[start:start + device.mtu - 3]
        if device.loses_in_reply:
            device.loses_in_reply -= 1
            if device.loses_in_reply == 0:
                GLib.idle_add(lose, device)
                piece = piece[:1]  # the link goes behind the first byte of it
        if device.notify_socket is not None:
            device.notify_socket.send(piece)
        elif chrc.props[CHRC]['Notifying']:
            chrc.EmitSignal(dbus.PROPERTIES_IFACE, 'PropertiesChanged', 'sa{sv}as', [
                CHRC, {'Value': dbus.Array([dbus.Byte(b) for b in piece], signature='y', variant_level=1)}, []])
        if len(piece) == 1 and len(data) - start > 1:
            return


def _written(device, data):
    # A datagram longer than the unit allows is dropped without a word, as the real service does.
    if len(data) > device.mtu - 3:
        device.dropped += 1
        return
    device.sizes.append(len(data))
    device.times.append(time.monotonic())
    if device.loses_after and len(device.sizes) >= device.loses_after:
        device.loses_after = 0
        lose(device)
        return
    device.bridge.sendall(data)


def lose(device):
    """The link is gone: sockets close, and the properties say so."""
    for watch in device.watches:
        if GLib.main_context_default().find_source_by_id(watch):
            GLib.source_remove(watch)
    device.watches = []
    for name in ('write_socket', 'notify_socket', 'bridge', 'classic_socket'):
        if getattr(device, name, None) is not None:
            if name == 'classic_socket':
                getattr(device, name).shutdown(socket.SHUT_RDWR)
            getattr(device, name).close()
            setattr(device, name, None)
    if device.connected:
        device.connected = False
        device.UpdateProperties(DEVICE, {'Connected': dbus.Boolean(False), 'ServicesResolved': dbus.Boolean(False)})


def _device_of(chrc):
    return mockobject.objects[chrc.device_path]


def _need_connected(chrc):
    if not _device_of(chrc).connected:
        bluez_habits.habits['late'] += 1
        raise _error('Failed', 'Not connected')
    return _device_of(chrc)


@dbus.service.method(CHRC, in_signature='aya{sv}', out_signature='')
def WriteValue(chrc, value, options):
    device = _need_connected(chrc)
    if device.write_socket is not None:
        raise _error('NotPermitted', 'Write acquired')
    if 'write' not in chrc.props[CHRC]['Flags']:
        raise _error('NotSupported', 'Operation is not supported')
    if options.get('type') != 'request':
        raise _error('InvalidArguments', 'a request was wanted')
    if device.refuses_writes:
        device.refuses_writes -= 1
        if device.refuses_writes == 0:
            raise _error('Failed', 'not this one')
    _written(device, bytes(value))


@dbus.service.method(CHRC, in_signature='', out_signature='')
def StartNotify(chrc):
    _need_connected(chrc)
    chrc.UpdateProperties(CHRC, {'Notifying': dbus.Boolean(True)})


def _socket_pair(device, on_data):
    ours, theirs = socket.socketpair(socket.AF_UNIX, socket.SOCK_SEQPACKET | socket.SOCK_NONBLOCK)
    if on_data:
        _forward(device, ours, lambda data: _written(device, data) if data else None)
    fd = dbus.types.UnixFd(theirs.fileno())
    theirs.close()
    return ours, fd


@dbus.service.method(CHRC, in_signature='a{sv}', out_signature='hq')
def AcquireWrite(chrc, options):
    device = _need_connected(chrc)
    if device.write_socket is not None:
        raise _error('NotPermitted', 'Write acquired')
    if 'write-without-response' not in chrc.props[CHRC]['Flags']:
        raise _error('NotSupported', 'Operation is not supported')
    device.write_socket, fd = _socket_pair(device, True)
    return fd, dbus.UInt16(device.mtu)


@dbus.service.method(CHRC, in_signature='a{sv}', out_signature='hq')
def AcquireNotify(chrc, options):
    device = _need_connected(chrc)
    if not device.gives_sockets:
        raise dbus.exceptions.DBusException('Notify acquired', name=device.socket_error)
    device.notify_socket, fd = _socket_pair(device, False)
    return fd, dbus.UInt16(device.mtu)


def _added(path, interface):
    mockobject.objects['/'].EmitSignal(OBJECT_MANAGER_IFACE, 'InterfacesAdded', 'oa{sa{sv}}', [
        dbus.ObjectPath(path), {interface: mockobject.objects[path].props[interface]}])


def _add_services(device):
    mock = mockobject.objects['/']
    service = str(device.path) + '/service0010'
    if service in mockobject.objects:
        return
    # A standard service first, whose characteristics tell and take as well.
    decoy = str(device.path) + '/service0001'
    for path, uuid in ((decoy, '0000180a-0000-1000-8000-00805f9b34fb'), (service, device.gatt['service'])):
        mock.AddObject(path, SERVICE, {'UUID': dbus.String(uuid), 'Primary': dbus.Boolean(True),
                                       'Device': dbus.ObjectPath(device.path)}, [])
        _added(path, SERVICE)
    rows = [(decoy, '00002a29-0000-1000-8000-00805f9b34fb', ['notify', 'write'])]
    if device.gatt['notify'] == device.gatt['write']:
        rows.append((service, device.gatt['write'], ['notify'] + device.gatt['flags']))
    else:
        rows += [(service, device.gatt['notify'], ['notify']), (service, device.gatt['write'], device.gatt['flags'])]
    for index, (parent, uuid, flags) in enumerate(rows):
        path = f'{parent}/char{0x11 + 3 * index:04x}'
        mock.AddObject(path, CHRC, {
            'UUID': dbus.String(uuid), 'Service': dbus.ObjectPath(parent), 'Value': dbus.Array([], signature='y'),
            'Notifying': dbus.Boolean(False), 'Flags': dbus.Array(flags, signature='s'),
            'MTU': dbus.UInt16(device.mtu)},
            [('WriteValue', 'aya{sv}', '', WriteValue), ('StartNotify', '', '', StartNotify),
             ('AcquireWrite', 'a{sv}', 'hq', AcquireWrite), ('AcquireNotify', 'a{sv}', 'hq', AcquireNotify)])
        mockobject.objects[path].device_path = str(device.path)
        if parent == service and 'notify' in flags:
            device.notify_path = path
        _added(path, CHRC)


@dbus.service.method(DEVICE, in_signature='', out_signature='')
def ConnectLowEnergy(device):
    if device.failures:
        raise _error(*device.failures.pop(0))
    if device.connected:
        raise _error('AlreadyConnected', 'Already Connected')
    device.connected = True
    device.bridge = _simulator(device)
    _forward(device, device.bridge, lambda data: _notify(device, data))
    device.UpdateProperties(DEVICE, {'Connected': dbus.Boolean(True)})

    def resolved():
        _add_services(device)
        device.UpdateProperties(DEVICE, {'ServicesResolved': dbus.Boolean(True)})
        return False
    GLib.timeout_add(100, resolved)


@dbus.service.method(DEVICE, in_signature='', out_signature='')
def DisconnectDevice(device):
    lose(device)


def _prepare(device, port):
    device.simulator = int(port)
    device.connected = False
    device.bridge = device.write_socket = device.notify_socket = device.classic_socket = None
    device.gives_sockets = True
    device.socket_error = 'org.bluez.Error.NotPermitted'
    device.refuses_writes = device.delay = 0
    device.times = []
    device.wanted_passkey = -1
    device.loses_after = device.loses_in_reply = device.dropped = 0
    device.failures = []
    device.sizes = []
    device.watches = []
    device.wanted_pin = ''
    device.UpdateProperties(DEVICE, {'ServicesResolved': dbus.Boolean(False)})
    device.AddMethods(DEVICE, [('Disconnect', '', '', DisconnectDevice), ('Pair', '', '', Pair)])


@dbus.service.method(MOCK, in_signature='ssssssasqi', out_signature='s')
def AddLowEnergy(self, adapter, address, name, service, notify, write, flags, mtu, port):
    path = self.AddDevice(adapter, address, name)
    device = mockobject.objects[path]
    _prepare(device, port)
    device.mtu = int(mtu)
    device.gatt = {'service': str(service), 'notify': str(notify), 'write': str(write), 'flags': [str(f) for f in flags]}
    device.AddMethods(DEVICE, [('Connect', '', '', ConnectLowEnergy)])
    device.UpdateProperties(DEVICE, {'UUIDs': dbus.Array([service], signature='s')})
    return path


# ---- classic

def RegisterProfile(self, path, uuid, options):
    wanted = {'Name': 'Velmora', 'Role': 'client', 'RequireAuthentication': False, 'AutoConnect': False}
    if dict(options) != wanted:
        raise _error('InvalidArguments', f'{options}')
    known = state['profiles'].get(str(uuid))
    if known and dbus.SystemBus().name_has_owner(known[0]):
        raise _error('AlreadyExists', 'Already Exists')
    state['profiles'][str(uuid)] = (state['sender'], str(path))


def UnregisterProfile(self, path):
    state['profiles'].clear()


def _caller(name, path, interface):
    return dbus.Interface(dbus.SystemBus().get_object(name, path, introspect=False), interface)


@dbus.service.method(DEVICE, in_signature='s', out_signature='')
def ConnectProfileSerial(device, uuid):
    if device.failures:
        raise _error(*device.failures.pop(0))
    ours, theirs = socket.socketpair()
    ours.setblocking(False)
    device.classic_socket = ours
    device.bridge = _simulator(device)

    def received(data):
        if not data:
            lose(device)
        elif device.loses_in_reply:
            device.loses_in_reply -= 1
            ours.sendall(data if device.loses_in_reply else data[:1])
            if not device.loses_in_reply:
                GLib.idle_add(lose, device)
        else:
            ours.sendall(data)
    _forward(device, device.bridge, received)

    def sent(data):
        device.sizes.append(len(data))
        if not data or (device.loses_after and len(device.sizes) >= device.loses_after):
            device.loses_after = 0
            lose(device)
        else:
            device.bridge.sendall(data)
    _forward(device, ours, sent)

    def hand_over():
        profile = _caller(*state['profiles'][str(uuid)], 'org.bluez.Profile1')
        profile.NewConnection(dbus.ObjectPath(device.path), dbus.types.UnixFd(theirs.fileno()),
                              dbus.Dictionary({}, signature='sv'), reply_handler=lambda: None,
                              error_handler=lambda error: None)
        theirs.close()
        return False
    if device.delay:
        GLib.timeout_add(device.delay, hand_over)
    else:
        hand_over()


@dbus.service.method(MOCK, in_signature='sssi', out_signature='s')
def AddClassic(self, adapter, address, name, port):
    path = self.AddDevice(adapter, address, name)
    device = mockobject.objects[path]
    _prepare(device, port)
    device.AddMethods(DEVICE, [('ConnectProfile', 's', '', ConnectProfileSerial), ('Connect', '', '', ConnectForbidden)])
    device.UpdateProperties(DEVICE, {'UUIDs': dbus.Array([SERIAL_PORT], signature='s')})
    return path


def ConnectForbidden(device):
    raise _error('NotAvailable', 'br-connection-profile-unavailable')


# ---- pairing

def RegisterAgent(self, path, capability):
    state['agents'][state['sender']] = str(path)


def Pair(device):
    if device.failures:
        raise _error(*device.failures.pop(0))
    if device.props[DEVICE]['Paired']:
        raise _error('AlreadyExists', 'Already Exists')
    if state['sender'] not in state['agents']:
        raise _error('AuthenticationRejected', 'no agent')
    agent = _caller(state['sender'], state['agents'][state['sender']], 'org.bluez.Agent1')
    if device.wanted_passkey >= 0:
        if agent.RequestPasskey(dbus.ObjectPath(device.path), signature='o') != device.wanted_passkey:
            raise _error('AuthenticationFailed', 'Authentication Failed')
    elif device.wanted_pin:
        if agent.RequestPinCode(dbus.ObjectPath(device.path), signature='o') != device.wanted_pin:
            raise _error('AuthenticationFailed', 'Authentication Failed')
    else:
        agent.RequestConfirmation(dbus.ObjectPath(device.path), dbus.UInt32(123456), signature='ou')
    device.UpdateProperties(DEVICE, {'Paired': dbus.Boolean(True)})


@dbus.service.method(MOCK, in_signature='os', out_signature='')
def WantPin(self, path, pin):
    mockobject.objects[path].wanted_pin = str(pin)


# ---- control by the test

@dbus.service.method(MOCK, in_signature='os', out_signature='')
def Fail(self, path, errors):
    """The next connections of a device fail: "Name:text" each, with | between."""
    mockobject.objects[path].failures = [tuple(each.split(':', 1)) for each in str(errors).split('|') if each]


@dbus.service.method(MOCK, in_signature='o', out_signature='')
def ConnectForAnother(self, path):
    """Another program has connected the device."""
    ConnectLowEnergy(mockobject.objects[path])


@dbus.service.method(MOCK, in_signature='oi', out_signature='')
def LoseAfter(self, path, writes):
    mockobject.objects[path].loses_after = int(writes)
    mockobject.objects[path].sizes = []


@dbus.service.method(MOCK, in_signature='oi', out_signature='')
def LoseInReply(self, path, pieces):
    """The link goes in the midst of a reply: behind the first byte of its so-many-th piece."""
    mockobject.objects[path].loses_in_reply = int(pieces)


@dbus.service.method(MOCK, in_signature='ob', out_signature='')
def GiveSockets(self, path, give):
    mockobject.objects[path].gives_sockets = bool(give)


@dbus.service.method(MOCK, in_signature='ob', out_signature='')
def SetPaired(self, path, paired):
    mockobject.objects[path].UpdateProperties(DEVICE, {'Paired': dbus.Boolean(paired)})


@dbus.service.method(MOCK, in_signature='o', out_signature='iii')
def Writes(self, path):
    """How many writes came, the longest of them, and how many were dropped for their length."""
    device = mockobject.objects[path]
    return len(device.sizes), max(device.sizes, default=0), device.dropped

"""How the played service is while it listens, what it refuses, and how often it was asked."""
import dbus
from gi.repository import GLib

from dbusmock import mockobject

ADAPTER = 'org.bluez.Adapter1'
DEVICE = 'org.bluez.Device1'
MOCK = 'org.bluez.Mock'

habits = {'calls': {}, 'hidden': {}, 'deaf': '', 'late': 0}


def passes_over(message):
    """Counts the calls that come; whether this one gets no answer."""
    member = message.get_member()
    habits['calls'][member] = habits['calls'].get(member, 0) + 1
    return member == habits['deaf']


def SetStrictFilter(adapter, given):
    if dict(given) != {'Transport': 'auto', 'DuplicateData': False}:
        raise dbus.exceptions.DBusException(f'{given}', name='org.bluez.Error.InvalidArguments')
    adapter.filtered = True


def StartListening(adapter):
    if not adapter.filtered:
        raise dbus.exceptions.DBusException('no filter', name='org.bluez.Error.InvalidArguments')

    def appear():
        mockobject.objects.update(habits['hidden'])
        habits['hidden'].clear()
        return False
    GLib.timeout_add(300, appear)


def StopListening(adapter):
    adapter.filtered = False


@dbus.service.method(MOCK, in_signature='', out_signature='')
def Listen(self):
    """The controller is as strict as the real one."""
    adapter = mockobject.objects['/org/bluez/hci0']
    adapter.filtered = False
    adapter.AddMethods(ADAPTER, [('SetDiscoveryFilter', 'a{sv}', '', SetStrictFilter),
                                 ('StartDiscovery', '', '', StartListening), ('StopDiscovery', '', '', StopListening)])


@dbus.service.method(MOCK, in_signature='o', out_signature='')
def Hide(self, path):
    """The device is heard once somebody listens."""
    habits['hidden'][path] = mockobject.objects.pop(path)


@dbus.service.method(MOCK, in_signature='b', out_signature='')
def SetPowered(self, powered):
    mockobject.objects['/org/bluez/hci0'].props[ADAPTER]['Powered'] = dbus.Boolean(powered, variant_level=1)


@dbus.service.method(MOCK, in_signature='s', out_signature='i')
def Calls(self, member):
    """How often that was called since the last time."""
    return habits['calls'].pop(member, 0)


@dbus.service.method(MOCK, in_signature='', out_signature='i')
def LateCalls(self):
    """How often something was asked of a device that was gone."""
    return habits['late']


@dbus.service.method(MOCK, in_signature='s', out_signature='')
def BeDeaf(self, member):
    habits['deaf'] = str(member)


@dbus.service.method(MOCK, in_signature='os', out_signature='')
def RefuseSockets(self, path, error):
    device = mockobject.objects[path]
    device.gives_sockets = False
    device.socket_error = str(error)


@dbus.service.method(MOCK, in_signature='oi', out_signature='')
def RefuseWrite(self, path, number):
    """The so-many-th write by a message fails."""
    mockobject.objects[path].refuses_writes = int(number)


@dbus.service.method(MOCK, in_signature='oi', out_signature='')
def DelayConnection(self, path, millis):
    """A classic link is handed over so long behind the answer to who asked for it."""
    mockobject.objects[path].delay = int(millis)


@dbus.service.method(MOCK, in_signature='oi', out_signature='')
def WantPasskey(self, path, passkey):
    mockobject.objects[path].wanted_passkey = int(passkey)


@dbus.service.method(MOCK, in_signature='o', out_signature='b')
def IsTrusted(self, path):
    return mockobject.objects[path].props[DEVICE]['Trusted']


@dbus.service.method(MOCK, in_signature='oas', out_signature='')
def SetServices(self, path, services):
    mockobject.objects[path].props[DEVICE]['UUIDs'] = dbus.Array(services, signature='s', variant_level=1)


@dbus.service.method(MOCK, in_signature='o', out_signature='ai')
def Pieces(self, path):
    """The sizes of what was written."""
    return dbus.Array(mockobject.objects[path].sizes, signature='i')


@dbus.service.method(MOCK, in_signature='oi', out_signature='d')
def ShortestPause(self, path, size):
    """Behind a piece of that size, up to the next one; in seconds."""
    device = mockobject.objects[path]
    pauses = [later - time for time, later, each in zip(device.times, device.times[1:], device.sizes) if each == size]
    return min(pauses, default=-1.0)

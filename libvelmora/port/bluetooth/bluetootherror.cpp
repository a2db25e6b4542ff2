#include "libvelmora/port/bluetooth/bluetootherror.h"

#include <fmt/format.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <initializer_list>
#include <string_view>

namespace velmora {

namespace {

struct Meaning
{
    int error;
    std::string_view text;
    std::string_view hint;
};

constexpr std::string_view pairHint =
    "remove and pair it again: velmora ports pair MAC; the PIN is usually 1234 or 0000";

constexpr Meaning meanings[] = {
    {EAFNOSUPPORT, "this system has no Bluetooth support",
     "in a container? containers don't see Bluetooth: use the host's network"},
    {EPROTONOSUPPORT, "the kernel's module for serial links over Bluetooth is not loaded",
     "load it: modprobe rfcomm, as root"},
    {EHOSTUNREACH, "Bluetooth is off, or there is no controller",
     "switch it on: bluetoothctl power on, rfkill unblock"},
    {EHOSTDOWN, "no answer: out of reach, without power, or connected to another phone or computer",
     "is the ignition on, and is the adapter plugged in?"},
    {ECONNREFUSED, "the adapter refused the connection", "pair it first: velmora ports pair MAC"},
    {EBADE, "the pairing is stale: the adapter or this computer has forgotten the other", pairHint},
    {EACCES, "the pairing failed", pairHint},
    {EBUSY, "in use by another program on this computer", "close it, or undo `rfcomm bind`: rfcomm release"},
    {ETIMEDOUT, "the connection timed out", "is the adapter near, and does it have power?"},
    {ECONNRESET, "the adapter closed the connection", "unplug the adapter and plug it in again"},
    {ECONNABORTED, "this computer ended the connection", "is another program managing Bluetooth?"},
};

std::string hintFor(std::string_view hint, std::string const& mac)
{
    std::string text(hint);
    if (std::size_t const at = text.find("MAC"); at != std::string::npos) {
        text.replace(at, 3, mac);
    }
    return text;
}

bool holds(std::string const& text, std::initializer_list<std::string_view> words)
{
    return std::any_of(words.begin(), words.end(),
                       [&text](std::string_view word) { return text.find(word) != std::string::npos; });
}

} // namespace

Error rfcommError(std::string const& mac, int error)
{
    std::string const what = "Could not connect to " + mac + " by Bluetooth: ";
    auto const* const known = std::find_if(std::begin(meanings), std::end(meanings),
                                           [error](Meaning const& each) { return each.error == error; });
    if (known == std::end(meanings)) {
        return Error(ErrorKind::PortFailed, fmt::format("{}{} (error {})", what, std::strerror(error), error),
                     {"`velmora ports` lists Bluetooth adapters"});
    }
    return Error(ErrorKind::PortFailed, what + std::string(known->text), {hintFor(known->hint, mac)});
}

Error bluezError(std::string const& doing, std::string const& name, std::string const& text)
{
    std::string const what = doing + ": ";
    if (holds(name, {"ServiceUnknown", "NameHasNoOwner"})) {
        return Error(ErrorKind::PortFailed, what + "the Bluetooth service (bluetoothd) is not running",
                     {"start it: systemctl start bluetooth", "is the package bluez installed?"});
    }
    if (holds(text, {"no controller"})) {
        return Error(ErrorKind::PortFailed, what + "this computer has no Bluetooth controller",
                     {"plug one in; is it blocked? rfkill list", "`bluetoothctl list` shows those that are there"});
    }
    if (holds(name, {"NotReady"}) || holds(text, {"not-powered", "Not Ready", "Not Powered"})) {
        return Error(ErrorKind::PortFailed, what + "Bluetooth is off",
                     {"switch it on: bluetoothctl power on, rfkill unblock"});
    }
    if (holds(name, {"AccessDenied"})) {
        return Error(ErrorKind::PortFailed, what + "this user may not use Bluetooth",
                     {"add your user to the group bluetooth and log in again"});
    }
    if (holds(name, {"Authentication", "NotPermitted", "NotAuthorized"})) {
        return Error(ErrorKind::PortFailed, what + "the adapter demands pairing, or the pairing failed (" + text + ")",
                     {"pair it: velmora ports pair MAC; the PIN is usually 1234 or 0000"});
    }
    if (holds(name, {"NoReply", "Timeout", "TimedOut"}) || holds(text, {"timeout", "abort"})) {
        return Error(ErrorKind::PortFailed,
                     what + "no answer: out of reach, without power, or connected to another phone",
                     {"is the ignition on, and is the adapter plugged in?"});
    }
    if (holds(name, {"InProgress"}) || holds(text, {"busy"})) {
        return Error(ErrorKind::PortFailed, what + "another program is using the adapter", {"close the other program"});
    }
    return Error(ErrorKind::PortFailed, fmt::format("{}{} ({})", what, text, name),
                 {"`velmora ports` lists Bluetooth adapters"});
}

Error noBusError(std::string const& what, std::string const& why)
{
    return Error(ErrorKind::PortFailed, what + ": " + why,
                 {"a classic adapter on a known channel needs no Bluetooth service: bt://MAC?channel=1"});
}

} // namespace velmora

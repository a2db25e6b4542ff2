#pragma once

#include "libvelmora/port/openingstop.h"

#include <systemd/sd-bus.h>

#include <chrono>
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>

namespace velmora {

// What a call on the bus was answered in place of a result.
class BusError : public std::runtime_error
{
public:
    BusError(std::string name, std::string const& text) : std::runtime_error(text), m_name(std::move(name)) {}
    std::string const& name() const { return m_name; }

private:
    std::string m_name; // "org.bluez.Error.NotReady"
};

struct BusRelease
{
    void operator()(sd_bus* bus) const { sd_bus_flush_close_unref(bus); }
    void operator()(sd_bus_message* message) const { sd_bus_message_unref(message); }
    void operator()(sd_bus_slot* slot) const { sd_bus_slot_unref(slot); }
};
using BusMessage = std::unique_ptr<sd_bus_message, BusRelease>;
using BusSlot = std::unique_ptr<sd_bus_slot, BusRelease>;

// A connection to the system's message bus, on which the Bluetooth service is spoken to. Of one thread at a time.
class SystemBus
{
public:
    // Throws Error where there is no bus. stop is asked while calls and waits last.
    explicit SystemBus(OpeningStop stop = {});

    sd_bus* raw() const { return m_bus.get(); }

    // A call of the Bluetooth service, to be filled with arguments.
    BusMessage makeCall(std::string const& path, char const* interface, char const* method) const;
    // Sends it, and handles whatever else comes until the answer is there. Throws BusError, or Error (interrupted).
    BusMessage call(BusMessage const& request, std::chrono::seconds limit = std::chrono::seconds(25));
    BusMessage call(std::string const& path, char const* interface, char const* method,
                    std::chrono::seconds limit = std::chrono::seconds(25));

    // Handles what comes until done says so; false when the time is over. Throws Error (interrupted).
    bool waitUntil(std::function<bool()> const& done, std::chrono::milliseconds limit);

    // No longer asks the stop that opening was given: that lives only as long.
    void forgetStop() { m_stop = {}; }

private:
    std::unique_ptr<sd_bus, BusRelease> m_bus;
    OpeningStop m_stop;
};

// The descriptor that a message carries, as the caller's own.
int takeDescriptor(int ofMessage);

// Reads or skips as sd-bus does, with its failures as BusError.
int checked(int result);

} // namespace velmora

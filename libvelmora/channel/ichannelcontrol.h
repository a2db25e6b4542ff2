#pragma once

#include "libvelmora/channel/habit.h"
#include "libvelmora/channel/requestaddress.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// What a channel has seen so far.
struct ChannelStatistics
{
    HabitCounts habits{};
    unsigned int exchanges = 0;         // commands and requests that were sent
    unsigned int counted = 0;           // of them with a count behind them
    unsigned int fromMemory = 0;        // requests that the channel answered while a connection was brought up
    bool adapterSilent = false;         // it has said nothing for seconds, though it was woken in between
    bool unanswered = false;            // the last command or request has had no prompt so far
    std::string trouble;                // the adapter's word for why the last request brought nothing: "CAN ERROR";
                                        // empty if it brought something, or nothing came in time
    bool countingWorks = false;         // a counted reply was taken
    bool countingOff = false;           // the adapter made three mistakes by it, or refuses it
    std::optional<unsigned int> waitMs; // how long the adapter waits, where the channel has shortened it
    unsigned int waitsCut = 0;          // waits that the adapter would not shorten, and the channel ended
    unsigned int slowestReplyMs = 0;    // of the vehicle
};

// What the last request to an address brought, beyond what the library tells of it.
struct AddressedReply
{
    bool answered = false;          // the adapter's prompt came
    std::vector<std::string> lines; // healed, headers shown, address bytes left out
    std::string error;              // the adapter's first word of trouble, without blanks: "NODATA"
    bool broken = false;            // something of it was not fit to be handed on
};

// What the companion tells its channel beside the bytes. Any thread.
class IChannelControl
{
public:
    virtual ~IChannelControl() = default;

    // Requests of the calling thread go to this module alone from now on, until it is given nothing: it saves the time
    // of the other modules' replies. The address is set and restored around each of them, inside the exchange. On
    // legacy buses, for modules without a known address of their own and with adapters that refuse it, requests stay
    // broadcasts.
    virtual void addressModule(std::optional<unsigned int> module) = 0;

    // The same for any address. A request that can't be sent there is not sent at all: it gets no answer, and
    // refusedAddress says why.
    virtual void address(std::optional<RequestAddress> const& address) = 0;

    // The command of the calling thread's last address that the adapter refused; empty if it took all of them. "bus"
    // for an address that is none of the bus.
    virtual std::string refusedAddress() const = 0;

    // Of the calling thread's last request to an address; once.
    virtual AddressedReply takeReply() = 0;

    // The connection stands: from now on nothing is answered from memory.
    virtual void onConnected() = 0;

    virtual ChannelStatistics statistics() const = 0;
};

// Addresses one module, or whatever an address means, for a scope of the calling thread.
class AddressedModule
{
public:
    AddressedModule(IChannelControl& control, unsigned int module) : m_control(control)
    {
        m_control.addressModule(module);
    }
    AddressedModule(IChannelControl& control, RequestAddress const& address) : m_control(control)
    {
        m_control.address(address);
    }
    ~AddressedModule() { m_control.addressModule(std::nullopt); }
    AddressedModule(AddressedModule const&) = delete;
    AddressedModule& operator=(AddressedModule const&) = delete;

private:
    IChannelControl& m_control;
};

} // namespace velmora

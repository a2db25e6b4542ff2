#pragma once

#include "libvelmora/channel/habit.h"

#include <optional>

namespace velmora {

// What a channel has seen so far.
struct ChannelStatistics
{
    HabitCounts habits{};
    unsigned int exchanges = 0;         // commands and requests that were sent
    unsigned int counted = 0;           // of them with a count behind them
    unsigned int fromMemory = 0;        // requests that the channel answered while a connection was brought up
    bool adapterSilent = false;         // it did not answer when it was woken last
    bool countingWorks = false;         // a counted reply was taken
    bool countingOff = false;           // the adapter made three mistakes by it, or refuses it
    std::optional<unsigned int> waitMs; // how long the adapter waits, where the channel has shortened it
    unsigned int slowestReplyMs = 0;    // of the vehicle
};

// What the companion tells its channel beside the bytes. Any thread.
class IChannelControl
{
public:
    virtual ~IChannelControl() = default;

    // Requests of the calling thread go to this module alone from now on, until it is given nothing. The address is
    // set and restored around each of them, inside the exchange. Of the legacy buses, and for modules without a known
    // address of their own, requests stay broadcasts.
    virtual void addressModule(std::optional<unsigned int> module) = 0;

    // The connection stands: from now on nothing is answered from memory.
    virtual void onConnected() = 0;

    virtual ChannelStatistics statistics() const = 0;
};

// Addresses one module for a scope of the calling thread.
class AddressedModule
{
public:
    AddressedModule(IChannelControl& control, unsigned int module) : m_control(control)
    {
        m_control.addressModule(module);
    }
    ~AddressedModule() { m_control.addressModule(std::nullopt); }
    AddressedModule(AddressedModule const&) = delete;
    AddressedModule& operator=(AddressedModule const&) = delete;

private:
    IChannelControl& m_control;
};

} // namespace velmora

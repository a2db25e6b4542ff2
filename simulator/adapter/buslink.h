#pragma once

#include "simulator/adapter/buswire.h"

#include <algorithm>

namespace obdsim {

/// The bus side of an adapter: the chosen protocol, the search, the wake-up of the
/// K line, and the requests.
class BusLink
{
public:
    /// `vehicle` may be null: a socket without a car. `profile` must outlive this.
    BusLink(std::shared_ptr<Vehicle> vehicle, AdapterProfile const& profile);

    /// ATSP and ATTP: 0 for automatic. `automatic`: search if it fails.
    void select(int number, bool automatic);

    /// Keeps the chosen protocol for restore().
    void store();

    /// Back to the stored protocol, as after a reset.
    void restore();

    /// ATPC: the next request starts the bus anew.
    void close();

    int number() const;
    bool automatic() const;

    /// ATDPN: "A6", "6".
    std::string numberText() const;

    /// ATDP.
    std::string description() const;

    /// The protocol whose formats are in use; null before a search has found it.
    Protocol const* protocol() const;

    /// `now`: when the adapter begins to work on it.
    BusReply request(BusRequest const& request, Settings const& settings, Time now);

    /// ATSI and ATFI: wakes the bus.
    BusReply wake(BusInit init);

    /// A protocol found by other means than a search of this link.
    void assume(int number);

    /// The bus has been started and found alive.
    bool isOpen() const;

    double volts(Time now) const;

    /// How long nothing has been said on the bus.
    Time quietFor(Time now) const { return std::max(now - m_lastTraffic, Time(0)); }

    /// The byte of ATSD, which outlasts a reset.
    std::uint8_t savedByte() const { return m_savedByte; }
    void saveByte(std::uint8_t byte) { m_savedByte = byte; }

    /// What the ignition pin tells; on without a car.
    bool ignition() const;

private:
    bool establish(BusReply& reply);
    bool search(BusReply& reply);
    bool start(BusReply& reply);
    bool reaches(Protocol const& protocol) const;
    void fail(BusReply& reply) const;

    std::shared_ptr<Vehicle> m_vehicle;
    Quirks const& m_quirks;
    BusWire m_wire;
    int m_number = 0;
    bool m_automatic = true;
    int m_storedNumber = 0;
    bool m_storedAutomatic = true;
    std::uint8_t m_savedByte = 0;
    Time m_lastTraffic{};
    bool m_open = false;
    bool m_asked = false; ///< a request has been sent since the protocol was chosen
};

} // namespace obdsim

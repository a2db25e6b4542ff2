#include "simulator/bus/protocol.h"

#include <algorithm>
#include <iterator>

namespace obdsim {

namespace {

using std::chrono::microseconds;

// Probe times: a CAN or J1850 probe is one request and its time-out; a 5 baud
// address takes two seconds to send, the fast wake-up pattern 50 ms. A byte is 8 bits at 41.6 or 10.4 kbit/s on SAE
// J1850, 10 bits at 10.4 kbit/s on a K line.
constexpr Protocol protocols[] = {
    {1, "SAE J1850 PWM", BusFamily::J1850Pwm, 42, BusInit::None, Ms(120), Ms(10), microseconds(192)},
    {2, "SAE J1850 VPW", BusFamily::J1850Vpw, 10, BusInit::None, Ms(120), Ms(20), microseconds(769)},
    {3, "ISO 9141-2", BusFamily::Iso9141, 10, BusInit::FiveBaud, Ms(2500), Ms(30), microseconds(962)},
    {4, "ISO 14230-4 (KWP 5BAUD)", BusFamily::Kwp, 10, BusInit::FiveBaud, Ms(2500), Ms(30), microseconds(962)},
    {5, "ISO 14230-4 (KWP FAST)", BusFamily::Kwp, 10, BusInit::Fast, Ms(400), Ms(30), microseconds(962)},
    {6, "ISO 15765-4 (CAN 11/500)", BusFamily::Can11, 500, BusInit::None, Ms(150), Ms(2), microseconds(0)},
    {7, "ISO 15765-4 (CAN 29/500)", BusFamily::Can29, 500, BusInit::None, Ms(150), Ms(2), microseconds(0)},
    {8, "ISO 15765-4 (CAN 11/250)", BusFamily::Can11, 250, BusInit::None, Ms(150), Ms(3), microseconds(0)},
    {9, "ISO 15765-4 (CAN 29/250)", BusFamily::Can29, 250, BusInit::None, Ms(150), Ms(3), microseconds(0)},
};

} // namespace

Protocol const* findProtocol(int number)
{
    auto const row = std::find_if(std::begin(protocols), std::end(protocols),
                                  [number](Protocol const& p) { return p.number == number; });
    return row == std::end(protocols) ? nullptr : &*row;
}

bool isCan(Protocol const& protocol)
{
    return protocol.family == BusFamily::Can11 || protocol.family == BusFamily::Can29;
}

bool isKLine(Protocol const& protocol)
{
    return protocol.family == BusFamily::Iso9141 || protocol.family == BusFamily::Kwp;
}

Time sendingTime(Protocol const& protocol, std::size_t bytes)
{
    constexpr microseconds p4{5200}; // of an ELM327 (data sheet v2.1, page 71, programmable parameter 14)
    auto const gaps = static_cast<Time::rep>(isKLine(protocol) && bytes > 0 ? bytes - 1 : 0);
    return receivingTime(protocol, bytes) + gaps * p4;
}

Time receivingTime(Protocol const& protocol, std::size_t bytes)
{
    return static_cast<Time::rep>(bytes) * protocol.byteTime;
}

Time canFrameTime(Protocol const& protocol, std::size_t dataBytes)
{
    // ISO 11898-1: all but the data, with the three bits between two frames.
    std::size_t const frameBits = protocol.family == BusFamily::Can11 ? 47 : 67;
    auto const bits = static_cast<Time::rep>(frameBits + dataBytes * 8);
    return microseconds(bits * 1000 / protocol.kilobaud);
}

} // namespace obdsim

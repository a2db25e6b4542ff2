#include "simulator/bus/protocol.h"

#include <algorithm>
#include <iterator>

namespace obdsim {

namespace {

using std::chrono::milliseconds;

// Probe times: a CAN or J1850 probe is one request and its time-out; a 5 baud
// address takes two seconds to send, the fast wake-up pattern 50 ms.
constexpr Protocol protocols[] = {
    {1, "SAE J1850 PWM", BusFamily::J1850Pwm, 42, BusInit::None, milliseconds(120), milliseconds(10)},
    {2, "SAE J1850 VPW", BusFamily::J1850Vpw, 10, BusInit::None, milliseconds(120), milliseconds(20)},
    {3, "ISO 9141-2", BusFamily::Iso9141, 10, BusInit::FiveBaud, milliseconds(2500), milliseconds(30)},
    {4, "ISO 14230-4 (KWP 5BAUD)", BusFamily::Kwp, 10, BusInit::FiveBaud, milliseconds(2500), milliseconds(30)},
    {5, "ISO 14230-4 (KWP FAST)", BusFamily::Kwp, 10, BusInit::Fast, milliseconds(400), milliseconds(30)},
    {6, "ISO 15765-4 (CAN 11/500)", BusFamily::Can11, 500, BusInit::None, milliseconds(150), milliseconds(2)},
    {7, "ISO 15765-4 (CAN 29/500)", BusFamily::Can29, 500, BusInit::None, milliseconds(150), milliseconds(2)},
    {8, "ISO 15765-4 (CAN 11/250)", BusFamily::Can11, 250, BusInit::None, milliseconds(150), milliseconds(3)},
    {9, "ISO 15765-4 (CAN 29/250)", BusFamily::Can29, 250, BusInit::None, milliseconds(150), milliseconds(3)},
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

} // namespace obdsim

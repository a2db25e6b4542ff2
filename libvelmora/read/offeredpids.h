#pragma once

#include <obd/iobdproxy.h>
#include <obd/responsemap.h>

#include <map>
#include <vector>

namespace velmora {

// The PIDs of service 01 above 80 that the control modules say they offer, by their own replies to the masks 80, A0, C0
// and E0. The library's supported sets hold derived values in this range, which no module offers.
class OfferedPids
{
public:
    // Asks for the masks, each as long as a module says that there is more. Blocks.
    explicit OfferedPids(obd::IObdProxy& proxy);

    // In rising order, without the masks themselves.
    std::vector<unsigned char> of(unsigned int ecu) const;

private:
    // Whether any module says that the next mask holds more.
    bool take(unsigned char mask, obd::ResponseMap const& replies);

    std::map<unsigned int, std::vector<unsigned char>> m_pids;
};

} // namespace velmora

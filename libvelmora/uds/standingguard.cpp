#include "libvelmora/uds/standingguard.h"

#include <common/clock.h>
#include <velmora/error.h>

#include <fmt/format.h>

namespace velmora {

namespace {

constexpr std::uint32_t checkPeriodMs = 10000;
constexpr unsigned int guardLimitMs = 2000;
constexpr int mostTroubles = 3;

} // namespace

// A vehicle that tells no speed, as some do, has to answer the request that all know.
void StandingGuard::check()
{
    std::uint32_t const now = tervex::currentMillis();
    if (m_checked && now - *m_checked < checkPeriodMs) {
        return;
    }
    m_checked = now;
    obd::ResponseMap replies;
    m_proxy.execute(std::vector<unsigned char>{0x01, 0x0D}, replies, guardLimitMs);
    bool told = false;
    for (auto const& [module, bytes] : replies) {
        if (bytes.size() < 3 || bytes[0] != 0x41 || bytes[1] != 0x0D) {
            continue;
        }
        told = true;
        if (bytes[2] != 0) {
            throw Error(ErrorKind::Failed, fmt::format("The vehicle moves ({} km/h)", static_cast<int>(bytes[2])),
                        {"such requests are for a vehicle that stands: try again then"});
        }
    }
    if (told) {
        return;
    }
    replies.clear();
    m_proxy.execute(std::vector<unsigned char>{0x01, 0x00}, replies, guardLimitMs);
    if (replies.empty()) {
        m_checkLink();
        throw Error(ErrorKind::VehicleSilent, "The vehicle no longer answers its standard requests",
                    {"is the ignition still on?"});
    }
}

void StandingGuard::countTrouble(bool trouble, char const* what)
{
    m_troubles = trouble ? m_troubles + 1 : 0;
    if (trouble) {
        m_checkLink();
    }
    if (m_troubles >= mostTroubles) {
        throw Error(ErrorKind::Failed, fmt::format("The adapter tells trouble on the bus, again and again: {}", what),
                    {"`velmora doctor` looks for the reason"});
    }
}

} // namespace velmora

#include "libvelmora/read/offeredpids.h"

namespace velmora {

namespace {

constexpr unsigned char liveService = 0x01;
constexpr unsigned char positive = 0x40;
constexpr unsigned int maskLimitMs = 1500;
constexpr int pidsOfMask = 32;

} // namespace

OfferedPids::OfferedPids(obd::IObdProxy& proxy)
{
    constexpr unsigned char masks[] = {0x80, 0xA0, 0xC0, 0xE0};
    for (unsigned char const mask : masks) {
        obd::ResponseMap replies;
        bool const answered = proxy.execute(std::vector<unsigned char>{liveService, mask}, replies, maskLimitMs) ==
                              obd::IDevice::Status::Ok;
        if (!answered || !take(mask, replies)) {
            return;
        }
    }
}

bool OfferedPids::take(unsigned char mask, obd::ResponseMap const& replies)
{
    bool more = false;
    for (auto const& [ecu, bytes] : replies) {
        if (bytes.size() < 6 || bytes[0] != liveService + positive || bytes[1] != mask) {
            continue;
        }
        for (int bit = 1; bit <= pidsOfMask; ++bit) {
            auto const byte = static_cast<std::size_t>(2 + (bit - 1) / 8);
            bool const offered = (bytes[byte] & (0x80 >> ((bit - 1) % 8))) != 0;
            if (offered && bit == pidsOfMask) {
                more = true;
            } else if (offered) {
                m_pids[ecu].push_back(static_cast<unsigned char>(mask + bit));
            }
        }
    }
    return more;
}

std::vector<unsigned char> OfferedPids::of(unsigned int ecu) const
{
    auto const found = m_pids.find(ecu);
    return found != m_pids.end() ? found->second : std::vector<unsigned char>();
}

} // namespace velmora

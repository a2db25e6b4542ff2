#pragma once

#include <obd/iobdproxy.h>

#include <cstdint>
#include <optional>

namespace velmora {

// Watches over long runs of requests that no driver expects: they go on only while the vehicle stands and answers its
// standard requests.
class StandingGuard
{
public:
    // proxy must outlive it.
    explicit StandingGuard(obd::IObdProxy& proxy) : m_proxy(proxy) {}

    // Asks for the speed once each 10 s, and at the first call. Throws Error if the vehicle moves, or does not answer.
    void check();
    // A request met trouble on the bus; throws Error at the third in a row.
    void countTrouble(bool trouble, char const* what);

private:
    obd::IObdProxy& m_proxy;
    std::optional<std::uint32_t> m_checked; // by the library's clock
    int m_troubles = 0;
};

} // namespace velmora

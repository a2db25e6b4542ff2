#pragma once

#include <obd/iobdproxy.h>

#include <cstdint>
#include <functional>
#include <optional>
#include <utility>

namespace velmora {

// Watches over long runs of requests that no driver expects: they go on only while the vehicle stands and answers its
// standard requests.
class StandingGuard
{
public:
    // proxy must outlive it. checkLink throws where adapter or link are the reason that nobody answers.
    StandingGuard(obd::IObdProxy& proxy, std::function<void()> checkLink)
        : m_proxy(proxy), m_checkLink(std::move(checkLink))
    {}

    // Asks for the speed once each 10 s, and at the first call. Throws Error if the vehicle moves, or does not answer.
    void check();
    // A request met trouble on the bus; throws Error at the third in a row.
    void countTrouble(bool trouble, char const* what);

private:
    obd::IObdProxy& m_proxy;
    std::function<void()> m_checkLink;
    std::optional<std::uint32_t> m_checked; // by the library's clock
    int m_troubles = 0;
};

} // namespace velmora

#pragma once

#include <chrono>

namespace velmora {

// Finds out whether a request is sooner answered at its module's own address, where two commands to the adapter go
// round it, or by all modules, whose replies are waited for: some requests each way, then the quicker one for good.
// Reads no clock.
class AddressTrial
{
public:
    // How the next request is to go.
    bool isAddressed() const { return m_addressed; }

    void answered(std::chrono::milliseconds took);
    // Where the module answers broadcasts only, its own address is not tried for long.
    void missed();

private:
    // The first ones are those by which the channel learns how many frames come.
    static constexpr int warmUps = 3;
    static constexpr int measured = 3;
    static constexpr int patience = 2;

    void next();

    bool m_addressed = false;
    bool m_decided = false;
    int m_asked = 0; // this way
    int m_missed = 0;
    std::chrono::milliseconds m_sum{0};
    std::chrono::milliseconds m_broadcast{0}; // the sum of those
};

} // namespace velmora

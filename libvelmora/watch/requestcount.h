#pragma once

#include <obd/idataconnection.h>

#include <atomic>
#include <cstdint>

namespace velmora {

// Counts what goes to control modules, by the dialogue with the adapter. Any thread.
class RequestCount : public obd::IConnectionLogger
{
public:
    std::uint64_t requests() const { return m_requests; }
    std::uint64_t errors() const { return m_errors; } // without an answer

    void onDataSent(std::vector<unsigned char> const& data) override;
    void onDataReceived(std::vector<unsigned char> const& data) override;

private:
    std::atomic<std::uint64_t> m_requests{0};
    std::atomic<std::uint64_t> m_errors{0};
};

} // namespace velmora

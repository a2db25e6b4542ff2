#pragma once

#include <obd/idataconnection.h>

#include <atomic>
#include <cstdint>
#include <functional>
#include <string_view>
#include <utility>

namespace velmora {

// Counts what goes to control modules, by the dialogue with the adapter, and passes the dialogue on. Any thread.
class RequestCount : public obd::IConnectionLogger
{
public:
    using Tap = std::function<void(bool sent, std::string_view text)>;

    explicit RequestCount(Tap tap = nullptr) : m_tap(std::move(tap)) {}

    std::uint64_t requests() const { return m_requests; }
    std::uint64_t errors() const { return m_errors; } // without an answer

    void onDataSent(std::vector<unsigned char> const& data) override;
    void onDataReceived(std::vector<unsigned char> const& data) override;

private:
    Tap const m_tap; // may be empty
    std::atomic<std::uint64_t> m_requests{0};
    std::atomic<std::uint64_t> m_errors{0};
};

} // namespace velmora

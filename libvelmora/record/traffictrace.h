#pragma once

#include <obd/idataconnection.h>

#include <atomic>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <mutex>
#include <string_view>

namespace velmora {

// Writes the traffic with the adapter to a file, a line each way, with the time to the millisecond.
class TrafficTrace : public obd::IConnectionLogger
{
public:
    // Throws Error if the file can't be written.
    explicit TrafficTrace(std::filesystem::path const& file);

    // Whether something could not be written, on a full disk. Any thread.
    bool failed() const { return m_failed; }

    void onDataSent(std::vector<unsigned char> const& data) override;
    void onDataReceived(std::vector<unsigned char> const& data) override;

private:
    void write(std::string_view arrow, std::vector<unsigned char> const& data);

    std::atomic<bool> m_failed{false};
    std::mutex m_mutex;
    std::unique_ptr<std::FILE, void (*)(std::FILE*)> m_out; // protected by m_mutex
};

} // namespace velmora
